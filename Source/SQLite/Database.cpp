#include "SQLite/Database.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Guard.h"
#include "Foundation/Logger.h"
#include "Foundation/URL.h"
#include "SQLite/Cursor.h"
#include "SQLite/Exception.h"
#include "SQLite/Statement.h"
#include "SQLite/Table.h"
#include "SQLite/Transaction.h"

#include <sqlite3.h>

#include <algorithm>
#include <cmath>
#include <cstring>
#include <utility>

namespace SQLite {

using Foundation::AssertionFailure;
using Foundation::AutoreleasePool;
using Foundation::gLog;

Database* gDatabase = nullptr;

void Database::initialize() {
    static Database database;
    if (!gDatabase) gDatabase = &database;
}

Database::Database()
    : mSaveTimer(this, &Database::saveRows),
      mPostTimer(this, &Database::_postChangeNotification),
      mFatalTimer(this, &Database::_postFatalErrorNotification) {}

Database::~Database() {
    constexpr const char* kWhere = "virtual SQLite::Database::~Database()";
    Foundation::callGuarded(kWhere, [this] { close(true); });
    // Changes that cannot be saved are lost. The connection must not stay open for them.
    if (mDB) Foundation::callGuarded(kWhere, [this] { closeConnection(); });
    if (gDatabase == this) gDatabase = nullptr;
}

sqlite3* Database::db() const {
    if (!mDB) {
        AssertionFailure::failed("sqlite3 *SQLite::Database::db() const", "mDB",
                                 "Database not open");
    }
    _checkThread();
    return mDB;
}

void Database::_checkThread() const {
#ifndef NDEBUG
    if (mThread != 0 && mThread != Foundation::ThreadUtil::IDCurrent()) {
        AssertionFailure::failed("void SQLite::Database::_checkThread() const",
                                 "mThread==ThreadUtil::IDCurrent()",
                                 "Database used on another thread than the one that opened it");
    }
#endif
}

void Database::check(int result) {
    if (result != SQLITE_OK) throw Exception(result, sqlite3_errmsg(db()));
}

std::unique_ptr<Statement> Database::compile(const char* sql) {
    OV_ASSERT_MESSAGE_AS(sql != nullptr, "sql!=NULL", "NULL SQL string");
    sqlite3_stmt* pVM = nullptr;
    const char* tail = nullptr;
    const int result = sqlite3_prepare_v2(db(), sql, -1, &pVM, &tail);
    if (gLogSQL.willLog()) {
        ++mCompiled;
        gLogSQL.log("Prepare #%04d: \"%s\" --> %p", mCompiled, sql, static_cast<const void*>(pVM));
    }
    if (result != SQLITE_OK) {
        _throwQueryException(Exception(result, sqlite3_errmsg(db()), sql));
    }
    OV_ASSERT_MESSAGE_AS(pVM != nullptr, "pVM!=NULL", "Empty SQL statement");
    auto statement = std::make_unique<Statement>(this, pVM);
    OV_ASSERT_MESSAGE_AS(*tail == '\0', "*tail=='\\0'",
                         "Excess characters past end of SQL statement");
    return statement;
}

RowID Database::lastInsertedRowID() {
    return sqlite3_last_insert_rowid(db());
}

int Database::execScalarText(SQLText text) {
    Cursor cursor(new Query(this, std::move(text)), true);
    return cursor.intColumn(0);
}

int Database::getUserVersion() {
    return execScalar("PRAGMA user_version");
}

void Database::setUserVersion(int version) {
    execute("PRAGMA user_version = %d", version);
}

void Database::dropIndex(const char* name) {
    execute("DROP INDEX IF EXISTS %s", name);
}

Table* Database::getRegisteredTable(const char* name) const {
    const auto found = std::find_if(mTables.begin(), mTables.end(), [&](const Table* table) {
        return std::strcmp(table->getName(), name) == 0;
    });
    return found == mTables.end() ? nullptr : *found;
}

void Database::_addTable(Table* table) {
    mTables.push_back(table);
}

void Database::_removeTable(Table* table) {
    std::erase(mTables, table);
}

void Database::_addStatement(Statement* statement) {
    statement->mNext = mStatements;
    if (mStatements) mStatements->mPrevious = statement;
    mStatements = statement;
}

void Database::_removeStatement(Statement* statement) {
    Statement*& before = statement->mPrevious ? statement->mPrevious->mNext : mStatements;
    before = statement->mNext;
    if (statement->mNext) statement->mNext->mPrevious = statement->mPrevious;
    statement->mPrevious = statement->mNext = nullptr;
}

void Database::saveRows() {
    mSaveTimer.stop();
    const auto isChanged = [](Table* table) { return table->isChanged(); };
    if (std::none_of(mTables.begin(), mTables.end(), isChanged)) return;
    gLog.log("*** Saving all database changes");
    const Transaction transaction(this, true);
    // A row's save may be the first use of a further table.
    for (std::size_t i = 0; i < mTables.size(); ++i) {
        mTables[i]->saveRows();
    }
}

void Database::saveRowsSoon() {
    gLog.log("(Will save database changes in 5 sec)");
    if (!mSaveTimer.isRunning()) mSaveTimer.start(kSaveDelaySeconds, false);
}

}  // namespace SQLite
