#pragma once

#include "Foundation/Data.h"
#include "Foundation/Date.h"
#include "Foundation/Ref.h"
#include "Foundation/String.h"
#include "Foundation/TimeZone.h"
#include "SQLite/Column.h"
#include "SQLite/ColumnList.h"
#include "SQLite/Cursor.h"
#include "SQLite/Query.h"
#include "SQLite/Row.h"
#include "SQLite/StoredURL.h"

#include <type_traits>

namespace SQLite {

/// How a column keeps and reads a T: numbers as they are, value classes by reference.
template <class T>
struct ScalarValue {
    using Stored = Foundation::Ref<T>;
    using Argument = T*;
    static T* get(const Stored& stored) { return stored.get(); }
    static bool isEqual(const Stored& stored, T* value) {
        return Foundation::IsEqual(stored.get(), value);
    }
    static Stored read(const Cursor& cursor, int column) {
        if constexpr (std::is_same_v<T, Foundation::String>) {
            return cursor.stringColumn(column);
        } else if constexpr (std::is_same_v<T, Foundation::Date>) {
            return cursor.dateColumn(column);
        } else if constexpr (std::is_same_v<T, Foundation::Data>) {
            return cursor.dataColumn(column);
        } else {
            return cursor.timeZoneColumn(column);
        }
    }
};

template <>
struct ScalarValue<Foundation::URL> {
    using Stored = StoredURL;
    using Argument = Foundation::URL*;
    static Foundation::URL* get(const Stored& stored) { return stored.get(); }
    static bool isEqual(const Stored& stored, Foundation::URL* value) {
        return Foundation::IsEqual(stored.get(), value);
    }
    static Stored read(const Cursor& cursor, int column) {
        return Stored(cursor.stringColumn(column));
    }
};

template <class T>
requires std::is_arithmetic_v<T>
struct ScalarValue<T> {
    using Stored = T;
    using Argument = T;
    static T get(T stored) { return stored; }
    static bool isEqual(T stored, T value) { return stored == value; }
    static T read(const Cursor& cursor, int column) {
        if constexpr (std::is_same_v<T, bool>) {
            return cursor.intColumn(column) != 0;
        } else if constexpr (std::is_same_v<T, int>) {
            return cursor.intColumn(column);
        } else if constexpr (std::is_same_v<T, long long>) {
            return cursor.int64Column(column);
        } else {
            static_assert(std::is_same_v<T, double>);
            return cursor.doubleColumn(column);
        }
    }
};

/// A column of a bool, int, long long, double, String, URL, Date, Data or TimeZone. A value class
/// may be null.
template <class T>
class ScalarColumn : public Column {
    using Value = ScalarValue<T>;

 public:
    using Argument = typename Value::Argument;
    static const ColumnKind kKind;

    explicit ScalarColumn(Row* row) : Column(row) {}

    /// The value, which is read if it has not been. What is pointed to lives until the current pool
    /// drains, at least.
    Argument getValue() const {
        if (!mLoaded) mRow->loadColumn(this);
        return Value::get(mValue);
    }
    operator Argument() const { return getValue(); }
    /// Changes the row, unless the column was read, is unchanged and has this value.
    void setValue(Argument value) {
        if (mLoaded && !mChanged && Value::isEqual(mValue, value)) return;
        // First, as it throws where the row may not be changed.
        Column::setChanged();
        mValue = value;
        mLoaded = true;
    }

    /// Takes over what a cursor has, unless the column is changed or the result lacks it.
    void loadValue(const Cursor::Column& column) {
        if (column.getIndex() < 0) return;
        loadValue(column.getCursor(), column.getIndex());
    }
    void loadValue(const Cursor& cursor, int index) {
        if (!mChanged) mValue = Value::read(cursor, index);
        mLoaded = true;
    }

    /// Binds the value in memory.
    void bindTo(Query& query, int index) const {
        if constexpr (std::is_same_v<T, bool>) {
            query.bind(index, mValue ? 1 : 0);
        } else {
            query.bind(index, Value::get(mValue));
        }
    }

 protected:
    typename Value::Stored mValue = {};
};

template <class T>
const ColumnKind ScalarColumn<T>::kKind = {
    [](const Column& column, Query& query, int index) {
        static_cast<const ScalarColumn&>(column).bindTo(query, index);
    },
    [](Column& column, const Cursor& cursor, int index) {
        static_cast<ScalarColumn&>(column).loadValue(cursor, index);
    },
    nullptr, nullptr};

}  // namespace SQLite
