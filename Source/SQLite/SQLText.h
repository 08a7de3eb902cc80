#pragma once

#include "SQLite/SQLFormat.h"

#include <memory>
#include <string_view>

namespace SQLite {

/// A text in the memory of sqlite3's printf, or none. Throws `std::bad_alloc` where there is no
/// memory for one.
class SQLText {
 public:
    SQLText() = default;
    /// A copy of a whole text, which is not looked at as a format.
    explicit SQLText(std::string_view whole);
    SQLText(const SQLText& other);
    SQLText(SQLText&&) noexcept = default;
    SQLText& operator=(SQLText&&) noexcept = default;
    SQLText& operator=(const SQLText&) = delete;

    /// The text that `format` gives with sqlite3's printf.
    template <class... Args>
    static SQLText format(SQLFormatString<Args...> format, const Args&... arguments) {
        if constexpr (sizeof...(Args) == 0) {
            return render(format.text(), {});
        } else {
            const SQLArgument list[] = {SQLArgument(arguments)...};
            return render(format.text(), list);
        }
    }

    /// Null if there is none.
    const char* c_str() const { return mText.get(); }

 private:
    struct Free {
        void operator()(char* text) const;
    };

    struct Owned {
        char* text;
    };

    static SQLText render(std::string_view format, std::span<const SQLArgument> arguments);
    explicit SQLText(Owned owned) : mText(owned.text) {}

    std::unique_ptr<char, Free> mText;
};

}  // namespace SQLite
