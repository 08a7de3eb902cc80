#include "SQLite/StoreTest.h"

#include <sqlite3.h>

Locker::Locker(const std::string& path, const char* sql) {
    EXPECT_EQ(sqlite3_open(path.c_str(), &mDB), SQLITE_OK);
    EXPECT_EQ(sqlite3_exec(mDB, sql, nullptr, nullptr, nullptr), SQLITE_OK) << sqlite3_errmsg(mDB);
}

Locker::~Locker() {
    sqlite3_close(mDB);
}

void StoreTest::executeElsewhere(const char* sql) const {
    sqlite3* other = nullptr;
    ASSERT_EQ(sqlite3_open(path.c_str(), &other), SQLITE_OK);
    EXPECT_EQ(sqlite3_exec(other, sql, nullptr, nullptr, nullptr), SQLITE_OK)
        << sqlite3_errmsg(other);
    sqlite3_close(other);
}
