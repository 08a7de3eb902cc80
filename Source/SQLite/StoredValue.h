#pragma once

#include "Foundation/Data.h"
#include "Foundation/Date.h"
#include "Foundation/Ref.h"
#include "Foundation/String.h"
#include "Foundation/TimeZone.h"
#include "Foundation/URL.h"
#include "SQLite/Cursor.h"

#include <string>
#include <string_view>
#include <type_traits>
#include <utility>

namespace SQLite {

/// The value of a column of value objects: kept as the file has it until it is asked for, as most
/// that are read never are, and making the objects costs more than reading the row.
template <class T>
class StoredValue {
    static constexpr bool kIsDate = std::is_same_v<T, Foundation::Date>;
    using Raw = std::conditional_t<kIsDate, double, std::string>;

 public:
    /// Null for a null, and for what stands for no T.
    T* get() const {
        if (mIsRaw) makeObject();
        return mObject.get();
    }
    /// The old object is left to the current pool.
    StoredValue& operator=(T* object) {
        mIsRaw = false;
        mObject = object;
        return *this;
    }
    /// Takes over what a cursor has in a column.
    void read(const Cursor& cursor, int column) {
        if (mObject.get()) mObject = nullptr;
        if constexpr (kIsDate) {
            mRaw = cursor.doubleColumn(column);
            mIsRaw = true;
        } else {
            const std::string_view bytes = bytesIn(cursor, column);
            mIsRaw = bytes.data() != nullptr;
            if (mIsRaw) mRaw.assign(bytes);
        }
    }

 private:
    static std::string_view bytesIn(const Cursor& cursor, int column) {
        if constexpr (std::is_same_v<T, Foundation::String> || std::is_same_v<T, Foundation::URL>) {
            return cursor.textColumn(column);
        } else {
            return cursor.blobColumn(column);
        }
    }
    static Foundation::Returner<T> make(Raw raw) {
        if constexpr (kIsDate) {
            return Foundation::Date::date(raw);
        } else if constexpr (std::is_same_v<T, Foundation::Data>) {
            return Foundation::Data::adopt(std::move(raw));
        } else if constexpr (std::is_same_v<T, Foundation::TimeZone>) {
            return Foundation::TimeZone::timeZoneWithData(raw);
        } else if constexpr (std::is_same_v<T, Foundation::String>) {
            return Foundation::String::stringOfUTF8(std::move(raw));
        } else {
            static_assert(std::is_same_v<T, Foundation::URL>);
            const Foundation::Ref<Foundation::String> text =
                Foundation::String::stringOfUTF8(std::move(raw));
            return Foundation::URL::url(text.get());
        }
    }
    void makeObject() const {
        mIsRaw = false;
        mObject = make(std::exchange(mRaw, {}));
    }

    mutable Raw mRaw = {};
    mutable Foundation::Ref<T> mObject;
    mutable bool mIsRaw = false;  ///< whether mRaw is the value
};

}  // namespace SQLite
