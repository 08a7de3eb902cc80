#include "SQLite/SQLText.h"

#include <sqlite3.h>

#include <new>
#include <string>

namespace SQLite {

namespace {

char* finish(sqlite3_str* buffer) {
    const bool isWhole = sqlite3_str_errcode(buffer) == SQLITE_OK;
    char* text = sqlite3_str_finish(buffer);
    // Null stands for an empty text too.
    if (!text && isWhole) text = sqlite3_mprintf("");
    if (!text) throw std::bad_alloc();
    return text;
}

void append(sqlite3_str* buffer, std::string_view text) {
    sqlite3_str_append(buffer, text.data(), static_cast<int>(text.size()));
}

/// Hands one conversion to sqlite3. The argument's own type tells its size, so the length modifier
/// of the format is replaced.
void append(sqlite3_str* buffer, const SQLFormatChecks::Conversion& c, const SQLArgument& value) {
    const std::string start = "%" + std::string(c.flags);
    switch (value.kind()) {
        case SQLArgument::Kind::Integer:
            sqlite3_str_appendf(buffer, (start + "lld").c_str(), value.integer());
            break;
        case SQLArgument::Kind::Real:
            sqlite3_str_appendf(buffer, (start + c.letter).c_str(), value.real());
            break;
        case SQLArgument::Kind::Text:
            sqlite3_str_appendf(buffer, (start + c.letter).c_str(), value.text());
            break;
    }
}

}  // namespace

void SQLText::Free::operator()(char* text) const {
    sqlite3_free(text);
}

SQLText::SQLText(std::string_view whole) {
    sqlite3_str* buffer = sqlite3_str_new(nullptr);
    append(buffer, whole);
    mText.reset(finish(buffer));
}

SQLText::SQLText(const SQLText& other)
    : SQLText(other.mText ? SQLText(std::string_view(other.c_str())) : SQLText()) {}

SQLText SQLText::render(std::string_view format, std::span<const SQLArgument> arguments) {
    sqlite3_str* buffer = sqlite3_str_new(nullptr);
    std::size_t used = 0;
    std::size_t done = 0;
    for (std::size_t i = format.find('%'); i != std::string_view::npos;
         i = format.find('%', done)) {
        append(buffer, format.substr(done, i - done));
        if (format[i + 1] == '%') {
            append(buffer, "%");
            done = i + 2;
            continue;
        }
        const SQLFormatChecks::Conversion c = SQLFormatChecks::readConversion(format, i);
        append(buffer, c, arguments[used++]);
        done = c.end;
    }
    append(buffer, format.substr(done));
    return SQLText(Owned{finish(buffer)});
}

}  // namespace SQLite
