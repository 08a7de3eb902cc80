#pragma once

#include "SQLite/Column.h"
#include "SQLite/ColumnList.h"
#include "SQLite/Cursor.h"
#include "SQLite/Query.h"
#include "SQLite/Row.h"
#include "SQLite/StoredValue.h"

#include <type_traits>

namespace SQLite {

/// How a column keeps and reads a T: numbers as they are, value classes as `StoredValue`s.
template <class T>
struct ScalarValue {
    using Stored = StoredValue<T>;
    using Argument = T*;
    static T* get(const Stored& stored) { return stored.get(); }
    static bool isEqual(const Stored& stored, T* value) {
        return Foundation::IsEqual(stored.get(), value);
    }
    static void read(Stored& stored, const Cursor& cursor, int column) {
        stored.read(cursor, column);
    }
};

template <class T>
requires std::is_arithmetic_v<T>
struct ScalarValue<T> {
    using Stored = T;
    using Argument = T;
    static T get(T stored) { return stored; }
    static bool isEqual(T stored, T value) { return stored == value; }
    static void read(T& stored, const Cursor& cursor, int column) {
        if constexpr (std::is_same_v<T, bool>) {
            stored = cursor.intColumn(column) != 0;
        } else if constexpr (std::is_same_v<T, int>) {
            stored = cursor.intColumn(column);
        } else if constexpr (std::is_same_v<T, long long>) {
            stored = cursor.int64Column(column);
        } else {
            static_assert(std::is_same_v<T, double>);
            stored = cursor.doubleColumn(column);
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
        if (!mChanged) Value::read(mValue, cursor, index);
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
const ColumnKind ScalarColumn<T>::kKind = {[](const Column& column, Query& query, int index) {
                                               static_cast<const ScalarColumn&>(column).bindTo(
                                                   query, index);
                                           },
                                           nullptr, nullptr};

}  // namespace SQLite
