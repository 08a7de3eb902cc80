#include "SQLite/SQLFunctionPort.h"

#include "Foundation/Guard.h"
#include "Foundation/Logger.h"

#include <sqlite3.h>

namespace SQLite {

namespace {

SQLFunctionPort* sCurrent = nullptr;

void callFunction(sqlite3_context* context, int count, sqlite3_value** values) {
    const auto function =
        reinterpret_cast<SQLFunctionInstaller::Function>(sqlite3_user_data(context));
    Foundation::callGuarded("void SQLite::callFunction(sqlite3_context *, int, sqlite3_value **)",
                            [&] {
                                SQLFunctionCall call(context, count, values);
                                function(call);
                            });
}

}  // namespace

const char* SQLFunctionCall::getText(int argument) const {
    return reinterpret_cast<const char*>(sqlite3_value_text(mValues[argument]));
}

long long SQLFunctionCall::getInteger(int argument) const {
    return sqlite3_value_int64(mValues[argument]);
}

SQLFunctionCall::Kept* SQLFunctionCall::getKept(int argument) const {
    return static_cast<Kept*>(sqlite3_get_auxdata(mContext, argument));
}

void SQLFunctionCall::keep(int argument, Kept* kept) {
    sqlite3_set_auxdata(mContext, argument, kept,
                        [](void* old) { delete static_cast<Kept*>(old); });
}

void SQLFunctionCall::setResult(long long value) {
    sqlite3_result_int64(mContext, value);
}

void SQLFunctionCall::setNullResult() {
    sqlite3_result_null(mContext);
}

bool SQLFunctionInstaller::add(const char* name, int argumentCount, Function function) {
    const int result =
        sqlite3_create_function(mConnection, name, argumentCount, SQLITE_UTF8 | SQLITE_DIRECTONLY,
                                reinterpret_cast<void*>(function), callFunction, nullptr, nullptr);
    if (result == SQLITE_OK) return true;
    Foundation::gLog.log("Database: sqlite3_create_function returned error %i", result);
    return false;
}

SQLFunctionPort* SQLFunctionPort::current() {
    return sCurrent;
}

void SQLFunctionPort::setCurrent(SQLFunctionPort* port) {
    sCurrent = port;
}

}  // namespace SQLite
