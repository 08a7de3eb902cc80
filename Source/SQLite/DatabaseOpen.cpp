#include "Foundation/AssertionFailure.h"
#include "Foundation/Clock.h"
#include "Foundation/DistributedNotificationCenter.h"
#include "Foundation/Guard.h"
#include "Foundation/Logger.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/URL.h"
#include "SQLite/Database.h"
#include "SQLite/Exception.h"
#include "SQLite/SQLFunctionPort.h"
#include "SQLite/Statement.h"
#include "SQLite/Table.h"

#include <sqlite3.h>
#include <sys/stat.h>

#include <algorithm>
#include <cstring>
#include <iterator>
#include <utility>

namespace SQLite {

using Foundation::AutoreleasePool;
using Foundation::callGuarded;
using Foundation::Clock;
using Foundation::gLog;
using Foundation::gWarn;
using Foundation::NotificationCenter;
using Foundation::Ref;
using Foundation::String;
using Foundation::URL;

namespace {

/// How long to wait before a try: short at first, as most locks are, then ever longer.
constexpr int kBusyDelays[] = {1, 2, 5, 10, 15, 20, 25, 25, 25, 50, 50, 100};

int busyDelay(int tries) {
    const int last = static_cast<int>(std::size(kBusyDelays)) - 1;
    return kBusyDelays[std::min(tries, last)];
}

int busyTimeUntil(int tries) {
    int milliseconds = 0;
    for (int i = 0; i < tries; ++i) {
        milliseconds += busyDelay(i);
    }
    return milliseconds;
}

/// Waits for a lock on the clock of the process. Gives 0 when the time-out is used up.
int waitWhileBusy(void* database, int tries) {
    int again = 0;
    callGuarded("int SQLite::waitWhileBusy(void *, int)", [&] {
        const int used = busyTimeUntil(tries);
        const int left = static_cast<Database*>(database)->getBusyTimeout() - used;
        if (left <= 0) return;
        Clock::current().sleep(std::min(left, busyDelay(tries)) / 1000.0);
        again = 1;
    });
    return again;
}

bool isDenied(int action) {
    switch (action) {
        case SQLITE_CREATE_INDEX:
        case SQLITE_CREATE_TABLE:
        case SQLITE_CREATE_TRIGGER:
        case SQLITE_DELETE:
        case SQLITE_DROP_INDEX:
        case SQLITE_DROP_TABLE:
        case SQLITE_DROP_TRIGGER:
        case SQLITE_INSERT:
        case SQLITE_UPDATE:
        case SQLITE_ALTER_TABLE:
        case SQLITE_REINDEX:
            return true;
        default:
            // Views and temporary objects are allowed on purpose.
            return false;
    }
}

/// Making any object of the schema writes a row there, which is asked for too. What may be made is
/// told by the object's own action.
bool isSchemaTable(const char* name) {
    return name && (std::strcmp(name, "sqlite_master") == 0 ||
                    std::strcmp(name, "sqlite_temp_master") == 0);
}

bool dropsViewOrTemporary(int action) {
    return action == SQLITE_DROP_VIEW || action == SQLITE_DROP_TEMP_VIEW ||
           action == SQLITE_DROP_TEMP_TABLE;
}

/// The name in the last call, if that was for a drop that is allowed.
const char* sDropped = nullptr;

int readOnlyAuthorizer(void*, int action, const char* p1, const char* p2, const char*,
                       const char*) {
    // The next thing that is asked of a drop is whether the rows of what has this name may go.
    const char* dropped = std::exchange(sDropped, dropsViewOrTemporary(action) ? p1 : nullptr);
    if (action == SQLITE_DELETE && p1 && p1 == dropped) return SQLITE_OK;
    if (!isDenied(action) || isSchemaTable(p1)) return SQLITE_OK;
    gWarn.log("Database: Illegal operation on read-only database (action=%i, p1='%s', p2='%s')",
              action, p1, p2);
    return SQLITE_DENY;
}

}  // namespace

void Database::open(const URL* location, bool writeable) {
    const std::string filePath = location ? location->getFileSystemRepresentation() : "";
    OV_ASSERT_AS(!filePath.empty(), "filePath");
    open(filePath.c_str(), writeable);
}

void Database::open(const char* path, bool writeable) {
    const AutoreleasePool pool;
    gLog.log("*** Opening database %s", path ? path : ":memory:");
    OV_ASSERT_MESSAGE_AS(mDB == nullptr, "mDB==NULL", "Database already open!");
    struct stat info = {};
    if (path && !writeable && stat(path, &info) != 0) {
        throw Exception(SQLITE_CANTOPEN, "Database file not found");
    }
    if (path) {
        mLocation = URL::urlWithFileSystemPath(path, false);
    } else {
        mLocation = nullptr;
    }
    mWriteable = writeable;
    mThread = Foundation::ThreadUtil::IDCurrent();
    try {
        openConnection(path);
        configureConnection();
        if (!mWriteable && mLocation) observeChanges();
    } catch (...) {
        closeConnection();
        throw;
    }
}

void Database::openConnection(const char* path) {
    // A file that vanishes just now must not be made again by a reader.
    // One thread uses the connection, so it needs no lock around each of its calls.
    const int flags = SQLITE_OPEN_READWRITE | SQLITE_OPEN_NOMUTEX |
                      (mWriteable || !path ? SQLITE_OPEN_CREATE : 0);
    check(sqlite3_open_v2(path ? path : ":memory:", &mDB, flags, nullptr));
    mOpen = true;
    mTransactionDepth = 0;
    ++mGeneration;
}

void Database::configureConnection() {
    check(sqlite3_extended_result_codes(mDB, 1));
    check(sqlite3_busy_handler(mDB, waitWhileBusy, this));
    check(sqlite3_db_config(mDB, SQLITE_DBCONFIG_DEFENSIVE, 1, nullptr));
    check(sqlite3_db_config(mDB, SQLITE_DBCONFIG_TRUSTED_SCHEMA, 0, nullptr));
    execute("PRAGMA cell_size_check = ON");
    execute("PRAGMA temp_store = MEMORY");
    if (SQLFunctionPort* port = SQLFunctionPort::current()) {
        SQLFunctionInstaller installer(mDB);
        port->installFunctions(installer);
    }
    if (!mWriteable && mLocation) {
        check(sqlite3_set_authorizer(mDB, readOnlyAuthorizer, nullptr));
    }
}

bool Database::useWriteAheadLog() {
    // Not through the usual path: that the file system cannot have it is no failure.
    sqlite3_stmt* vm = nullptr;
    check(sqlite3_prepare_v2(db(), "PRAGMA journal_mode = WAL", -1, &vm, nullptr));
    const bool stepped = sqlite3_step(vm) == SQLITE_ROW;
    const auto* mode =
        stepped ? reinterpret_cast<const char*>(sqlite3_column_text(vm, 0)) : nullptr;
    const bool isOn = mode && std::strcmp(mode, "wal") == 0;
    if (!isOn) gLog.log("Database keeps the roll-back journal: %s", sqlite3_errmsg(mDB));
    sqlite3_finalize(vm);
    execute("PRAGMA synchronous = FULL");
    return isOn;
}

void Database::observeChanges() {
    const Ref<String> path = getPathString();
    mChangeObserver = std::make_unique<ChangeObserver>(this, &Database::_receiveChangeNotification);
    auto* center = NotificationCenter::getDistributed();
    center->addObserver(mChangeObserver.get(), kDatabaseChangedNotification, path.get());
}

void Database::stopObserving() {
    if (!mChangeObserver) return;
    NotificationCenter::getDistributed()->removeObserver(mChangeObserver.get());
    mChangeObserver.reset();
}

Ref<String> Database::getPathString() const {
    return mLocation ? Ref<String>(mLocation->getFileSystemPath()) : Ref<String>();
}

void Database::close(bool saveChanges) {
    if (!mDB) {
        stopTimers();
        return;
    }
    const AutoreleasePool pool;
    NotificationCenter::getLocal()->post(kDatabaseClosingNotification, this, nullptr);
    if (saveChanges) saveRows();
    gLog.log("*** Closing database");
    mOpen = false;
    try {
        for (std::size_t i = 0; i < mTables.size(); ++i) {
            mTables[i]->databaseClosing();
        }
    } catch (...) {
        Foundation::warnAboutCurrentException("void SQLite::Database::close(bool)");
    }
    closeConnection();
}

/// Also ends what an open that failed has begun.
void Database::closeConnection() {
    mOpen = false;
    // sqlite3 does not close a connection that has statements, and some are kept for good.
    while (mStatements)
        mStatements->invalidate();
    mJournal.clear();
    mDeletedRows.endTransaction();
    sqlite3_close(std::exchange(mDB, nullptr));
    mLocation = nullptr;
    mTransactionDepth = 0;
    ++mGeneration;
    stopObserving();
    stopTimers();
}

void Database::stopTimers() {
    mSaveTimer.stop();
    mPostTimer.stop();
    mFatalTimer.stop();
    mCursors.stop();
}

}  // namespace SQLite
