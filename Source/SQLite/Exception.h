#pragma once

#include "SQLite/SQLText.h"

#include <exception>

namespace SQLite {

/// A failure of the database: a result code of sqlite3, extended ones included, and a text that
/// names it. Every one that is made is logged once, as a warning; copies are not.
class Exception : public std::exception {
 public:
    /// `message` and `sql` may be null.
    Exception(int code, const char* message, const char* sql);
    Exception(int code, const char* message);

    /// "NAME[low.high]: message in "sql"".
    const char* what() const noexcept override { return mMessage.c_str(); }
    int getCode() const { return mCode; }

    /// Whether the database cannot go on being used: it is broken, locked for good or forbidden.
    bool isFatal() const;
    /// Whether trying again may help.
    bool isTransient() const { return isTransient(mCode); }
    static bool isTransient(int code);

    /// The name of a result code; that of its low byte for an extended one without a name.
    static const char* errorCodeAsString(int code);

 private:
    int mCode;
    SQLText mMessage;
};

}  // namespace SQLite
