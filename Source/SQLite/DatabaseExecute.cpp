#include "Foundation/AutoreleasePool.h"
#include "Foundation/Clock.h"
#include "Foundation/Logger.h"
#include "SQLite/Cursor.h"
#include "SQLite/Database.h"
#include "SQLite/Exception.h"

#include <sqlite3.h>

#include <cmath>
#include <cstring>
#include <exception>

namespace SQLite {

using Foundation::Clock;
using Foundation::gLog;
using Foundation::gWarn;

namespace {

void logRun(const Database& database, const SQLText& text, int result, double seconds) {
    if (database.isInTransaction()) {
        gLogSQL.log("Exec ( %s  -->%i ) [%.3lf sec]", text.c_str(), result, seconds);
    } else {
        gLogSQL.log("Exec %s  -->%i [%.3lf sec]", text.c_str(), result, seconds);
    }
}

int runOnce(const Database& database, const SQLText& text, char** error) {
    *error = nullptr;
    if (!gLogSQL.willLog())
        return sqlite3_exec(database.db(), text.c_str(), nullptr, nullptr, error);
    const double start = Clock::current().now();
    const int result = sqlite3_exec(database.db(), text.c_str(), nullptr, nullptr, error);
    logRun(database, text, result, Clock::current().now() - start);
    return result;
}

bool passesIntegrityCheck(Database& database) {
    bool passes = false;
    for (Cursor cursor(&database, "pragma integrity_check"); cursor.hasRow(); cursor.nextRow()) {
        const char* text = cursor.cStringColumn(0);
        passes = text && std::strcmp(text, "ok") == 0;
    }
    return passes;
}

void reportIntegrity(Database& database) {
    gWarn.log("*** SQLite integrity check failed! Details:");
    for (Cursor cursor(&database, "pragma integrity_check"); cursor.hasRow(); cursor.nextRow()) {
        gWarn.log("    %s", cursor.cStringColumn(0));
    }
    database._throwQueryException(Exception(SQLITE_CORRUPT, "integrity check failed"));
}

}  // namespace

int Database::executeText(const SQLText& text) {
    _requireTransaction();
    return runWithRetry(text);
}

int Database::runWithRetry(const SQLText& text) {
    char* error = nullptr;
    int result = runOnce(*this, text, &error);
    for (int run = 2; run <= kMaxRuns && Exception::isTransient(result); ++run) {
        if (error) {
            Clock::current().sleep(0.1 * run * run);
            sqlite3_free(error);
        }
        result = runOnce(*this, text, &error);
    }
    if (result != SQLITE_OK) {
        const Exception exception(result, error, text.c_str());
        sqlite3_free(error);
        _throwQueryException(exception);
    }
    return sqlite3_changes(db());
}

void Database::_throwQueryException(const Exception& exception) {
    if (exception.isFatal() && !mFatalTimer.isRunning()) {
        mFatalTimer.start(0.0, false);
        using Foundation::Number;
        using Foundation::Ref;
        using Foundation::String;
        Ref<Foundation::MutableDictionary> report{Foundation::MutableDictionary::dictionary()};
        report->set("error", Number::number(exception.getCode()));
        report->set("message", String::string(exception.what()));
        mFatalError = Foundation::Returner<Foundation::Dictionary>::retained(report.get());
    }
    throw Exception(exception);
}

void Database::_requireTransaction() {
    // Out of space, out of memory, a broken file: some errors end the transaction in sqlite3.
    if (mTransactionDepth == 0 || sqlite3_get_autocommit(db()) == 0) return;
    throw Exception(SQLITE_ABORT, "The transaction has been rolled back");
}

void Database::beginTransaction(bool immediate) {
    if (++mTransactionDepth > 1) return;
    try {
        mTransactionStart = Clock::current().now();
        gLogSQL.log(">>>> BEGIN %s TRANSACTION", immediate ? "IMMEDIATE" : "DEFERRED");
        runWithRetry(immediate ? SQLText("begin immediate transaction")
                               : SQLText("begin deferred transaction"));
    } catch (...) {
        // The depth counts transactions that are open.
        --mTransactionDepth;
        throw;
    }
}

void Database::endTransaction() {
    if (mTransactionDepth < 1) {
        gWarn.log("Too many calls to endTransaction");
        return;
    }
    if (--mTransactionDepth > 0) return;
    if (std::uncaught_exceptions() == 0) {
        commit();
        return;
    }
    rollBack();
    gWarn.log("<<<< ABORTED TRANSACTION");
    mPostTimer.stop();
    mChanges.reset();
    mDeletedRows.forgetAllUndone();
}

void Database::commit() {
    try {
        runWithRetry(SQLText("commit"));
    } catch (...) {
        // A commit that meets a lock leaves the transaction open. Its changes stay pending.
        mDeletedRows.failCommit();
        rollBack();
        throw;
    }
    mJournal.clear();
    mDeletedRows.endTransaction();
    gLogSQL.log("<<<< END TRANSACTION (%.3f sec)", Clock::current().now() - mTransactionStart);
    _postChangeNotification();
}

void Database::rollBack() {
    const Foundation::AutoreleasePool pool;
    sqlite3_exec(mDB, "rollback", nullptr, nullptr, nullptr);
    mDeletedRows.endTransaction();
    mJournal.rollBack(mTables);
}

void Database::integrityCheck() {
    gLog.log("*** Performing integrity_check on database");
    try {
        if (!passesIntegrityCheck(*this)) reportIntegrity(*this);
        gLog.log("*** Passed integrity_check on database");
    } catch (const Exception& exception) {
        gLog.log("*** SQLite integrity check failed -- exception %s", exception.what());
        throw;
    }
}

void Database::vacuumIncrementally() {
    const int pages = execScalar("PRAGMA freelist_count");
    if (pages <= kMaxFreePages) return;
    const double start = Clock::current().now();
    execute("PRAGMA incremental_vacuum");
    const double seconds = Clock::current().now() - start;
    gLog.log("Incremental vacuum reclaimed %d free pages in %dms.", pages,
             static_cast<int>(std::lround(seconds * 1000)));
}

}  // namespace SQLite
