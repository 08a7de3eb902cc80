#include "SQLite/Exception.h"

#include "Foundation/Logger.h"

#include <sqlite3.h>

namespace SQLite {

namespace {

struct ErrorName {
    int code;
    const char* name;
};

constexpr ErrorName kErrorNames[] = {
    {0, "SQLITE_OK"},
    {1, "SQLITE_ERROR"},
    {2, "SQLITE_INTERNAL"},
    {3, "SQLITE_PERM"},
    {4, "SQLITE_ABORT"},
    {5, "SQLITE_BUSY"},
    {6, "SQLITE_LOCKED"},
    {7, "SQLITE_NOMEM"},
    {8, "SQLITE_READONLY"},
    {9, "SQLITE_INTERRUPT"},
    {10, "SQLITE_IOERR"},
    {11, "SQLITE_CORRUPT"},
    {12, "SQLITE_NOTFOUND"},
    {13, "SQLITE_FULL"},
    {14, "SQLITE_CANTOPEN"},
    {15, "SQLITE_PROTOCOL"},
    {16, "SQLITE_EMPTY"},
    {17, "SQLITE_SCHEMA"},
    {18, "SQLITE_TOOBIG"},
    {19, "SQLITE_CONSTRAINT"},
    {20, "SQLITE_MISMATCH"},
    {21, "SQLITE_MISUSE"},
    {22, "SQLITE_NOLFS"},
    {23, "SQLITE_AUTH"},
    {24, "SQLITE_FORMAT"},
    {25, "SQLITE_RANGE"},
    {26, "SQLITE_NOTADB"},
    {100, "SQLITE_ROW"},
    {101, "SQLITE_DONE"},
    {266, "SQLITE_IOERR_READ"},
    {522, "SQLITE_IOERR_SHORT_READ"},
    {778, "SQLITE_IOERR_WRITE"},
    {1034, "SQLITE_IOERR_FSYNC"},
    {1290, "SQLITE_IOERR_DIR_FSYNC"},
    {1546, "SQLITE_IOERR_TRUNCATE"},
    {1802, "SQLITE_IOERR_FSTAT"},
    {2058, "SQLITE_IOERR_UNLOCK"},
    {2314, "SQLITE_IOERR_RDLOCK"},
};

const char* findName(int code) {
    for (const ErrorName& entry : kErrorNames) {
        if (entry.code == code) return entry.name;
    }
    return nullptr;
}

}  // namespace

Exception::Exception(int code, const char* message, const char* sql)
    : mCode(code),
      mMessage(SQLText::format("%s[%d.%d]: %s in \"%s\"", errorCodeAsString(code), code & 127,
                               code >> 8, message, sql)) {
    Foundation::gWarn.log("SQL Error: %s", mMessage.c_str());
}

Exception::Exception(int code, const char* message)
    : mCode(code),
      mMessage(SQLText::format("%s[%d.%d]: %s", errorCodeAsString(code), code & 127, code >> 8,
                               message)) {
    Foundation::gWarn.log("SQL Error: %s", mMessage.c_str());
}

bool Exception::isFatal() const {
    switch (mCode & 0xFF) {
        case SQLITE_PERM:
        case SQLITE_BUSY:
        case SQLITE_CORRUPT:
        case SQLITE_NOTADB:
            return true;
        case SQLITE_IOERR:
            return mCode == SQLITE_IOERR_SHORT_READ;
        default:
            return false;
    }
}

bool Exception::isTransient(int code) {
    return code == SQLITE_CANTOPEN;
}

const char* Exception::errorCodeAsString(int code) {
    const char* name = findName(code);
    if (!name && code >= 256) name = findName(code & 0xFF);
    return name ? name : "Unknown error code";
}

}  // namespace SQLite
