#pragma once

#include "Benchmarks/Measure.h"

#include <fmt/format.h>
#include <sqlite3.h>

#include <map>
#include <stdexcept>
#include <string>
#include <vector>

/// The rows of a merge, to be inserted with nothing around sqlite3.
namespace Benchmarks {

/// Settings: what survives a power cut is not looked at.
inline constexpr const char* kDoNotWait = "PRAGMA synchronous = OFF";

inline void require(bool condition, const char* what) {
    if (!condition) throw std::runtime_error(what);
}

/// A connection with nothing around sqlite3.
class Plain {
 public:
    /// `settings` is SQL.
    Plain(const std::string& path, const char* settings) {
        check(sqlite3_open_v2(path.c_str(), &mDB, SQLITE_OPEN_READWRITE | SQLITE_OPEN_NOMUTEX,
                              nullptr));
        run(settings);
    }
    ~Plain() {
        for (const auto& [sql, statement] : mStatements) {
            sqlite3_finalize(statement);
        }
        sqlite3_close(mDB);
    }
    Plain(const Plain&) = delete;
    Plain& operator=(const Plain&) = delete;

    void run(const char* sql) { check(sqlite3_exec(mDB, sql, nullptr, nullptr, nullptr)); }
    /// Compiles and runs a query, and counts its rows.
    int count(const std::string& sql) {
        sqlite3_stmt* statement = nullptr;
        check(sqlite3_prepare_v2(mDB, sql.c_str(), -1, &statement, nullptr));
        int rows = 0;
        for (; sqlite3_step(statement) == SQLITE_ROW; ++rows)
            keep(sqlite3_column_text(statement, 0));
        check(sqlite3_finalize(statement));
        return rows;
    }
    /// A statement that is compiled once.
    sqlite3_stmt* statement(const std::string& sql) {
        sqlite3_stmt*& found = mStatements[sql];
        if (!found) check(sqlite3_prepare_v2(mDB, sql.c_str(), -1, &found, nullptr));
        return found;
    }
    void insert(sqlite3_stmt* statement, const std::vector<sqlite3_value*>& values) {
        for (std::size_t i = 0; i < values.size(); ++i) {
            check(sqlite3_bind_value(statement, static_cast<int>(i) + 1, values[i]));
        }
        require(sqlite3_step(statement) == SQLITE_DONE, sqlite3_errmsg(mDB));
        check(sqlite3_reset(statement));
    }
    void check(int result) const { require(result == SQLITE_OK, sqlite3_errmsg(mDB)); }

 private:
    sqlite3* mDB = nullptr;
    std::map<std::string, sqlite3_stmt*> mStatements;
};

/// The rows of one table.
struct Rows {
    std::string insertSQL;
    std::vector<std::vector<sqlite3_value*>> rows;
};

/// Takes copies of the rows of a table that meet a condition.
inline Rows take(Plain& file, const char* table, const std::string& condition) {
    sqlite3_stmt* statement =
        file.statement(fmt::format("SELECT * FROM {} WHERE {}", table, condition));
    const int columns = sqlite3_column_count(statement);
    Rows taken;
    taken.insertSQL = fmt::format("INSERT INTO {} VALUES (?", table);
    for (int i = 1; i < columns; ++i)
        taken.insertSQL += ",?";
    taken.insertSQL += ")";
    while (sqlite3_step(statement) == SQLITE_ROW) {
        std::vector<sqlite3_value*>& row = taken.rows.emplace_back();
        for (int i = 0; i < columns; ++i)
            row.push_back(sqlite3_value_dup(sqlite3_column_value(statement, i)));
    }
    file.check(sqlite3_reset(statement));
    return taken;
}

/// The rows that the merge of a feed's first document has made.
class ImportedRows {
 public:
    /// `contents` is the condition for those of the feed.
    ImportedRows(Plain& file, long long feed, const std::string& contents, int entries)
        : mFeed(feed),
          mEntries(entries),
          mTables{take(file, "Contents", contents),
                  take(file, "Entries", fmt::format("feed={}", feed))} {}
    ~ImportedRows() {
        for (const Rows& table : mTables)
            for (const auto& row : table.rows)
                for (sqlite3_value* value : row)
                    sqlite3_value_free(value);
    }
    ImportedRows(const ImportedRows&) = delete;
    ImportedRows& operator=(const ImportedRows&) = delete;

    void insertInto(Plain& file) const {
        file.run("begin immediate transaction");
        for (const Rows& table : mTables) {
            sqlite3_stmt* statement = file.statement(table.insertSQL);
            for (const auto& row : table.rows)
                file.insert(statement, row);
        }
        file.run(
            fmt::format("update Feeds set title='News', localDateUpdated=1.0 where rowID={}", mFeed)
                .c_str());
        file.run(
            fmt::format("update Subscriptions set unreadCount={} where feed={}", mEntries, mFeed)
                .c_str());
        file.run("commit");
    }
    std::size_t count() const { return mTables[0].rows.size() + mTables[1].rows.size(); }

 private:
    long long mFeed;
    int mEntries;
    std::vector<Rows> mTables;
};

}  // namespace Benchmarks
