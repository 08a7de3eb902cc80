#include "Foundation/AssertionFailure.h"
#include "Foundation/DistributedNotificationCenter.h"
#include "Foundation/Guard.h"
#include "Foundation/Logger.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/RunLoop.h"
#include "Foundation/URL.h"
#include "SQLite/Cursor.h"
#include "SQLite/Database.h"
#include "SQLite/Table.h"

#include <sqlite3.h>
#include <unistd.h>

#include <utility>

namespace SQLite {

using Foundation::AutoreleasePool;
using Foundation::Dictionary;
using Foundation::gLog;
using Foundation::kNotificationDeliverImmediately;
using Foundation::Notification;
using Foundation::NotificationCenter;
using Foundation::Ref;
using Foundation::String;

namespace {

void updateHook(void* self, int action, const char*, const char* table, sqlite3_int64 rowID) {
    Foundation::callGuarded(
        "static void SQLite::Database::_updateHook(void *, int, const char *, const char *, "
        "sqlite_int64)",
        [&] { static_cast<Database*>(self)->_databaseUpdated(action, table, rowID); });
}

/// Tells each table what another process has changed of it.
void tellTables(Database& database, const Dictionary* changes) {
    for (const auto& entry : *changes) {
        Foundation::callGuarded(
            "void SQLite::Database::_receiveChangeNotification(Foundation::Notification *)", [&] {
                const auto& [name, value] = entry;
                auto* text = dynamic_cast<String*>(name);
                auto* rows = dynamic_cast<Dictionary*>(value);
                Table* table =
                    text && rows ? database.getRegisteredTable(text->utf8().c_str()) : nullptr;
                if (table) table->_receiveChangeNotification(rows);
            });
    }
}

}  // namespace

void Database::setPostsNotifications(bool posts) {
    OV_ASSERT_AS(mLocation.get() != nullptr, "mLocation");
    sqlite3_update_hook(db(), posts ? updateHook : nullptr, this);
}

void Database::_databaseUpdated(int action, const char* table, RowID rowID) {
    gLogPersist.log("~~~~Database changed: #%i '%s' %lli", action, table, rowID);
    OV_ASSERT(mWriteable);
    if (!mChanges) mChanges = std::make_unique<ChangeSet>();
    mChanges->note(action, table, rowID);
    if (action == SQLITE_DELETE) mDeletedRows.forgetUndone(table, rowID);
    if (mTransactionDepth == 0 && !mPostTimer.isRunning()) mPostTimer.start(0.0, false);
}

void Database::_postChangeNotification() {
    if (!mChanges) return;
    const AutoreleasePool pool;
    mPostTimer.stop();
    const std::unique_ptr<ChangeSet> pending = std::move(mChanges);
    const Ref<ChangeDict> changes = pending->dictionary();
    if (gLog.willLog()) {
        const Ref<String> text = describeChanges(changes.get());
        gLog.log("===== Database posting distributed change notification:%@", text);
    }
    const Ref<String> path = getPathString();
    NotificationCenter::getDistributed()->post(kDatabaseChangedNotification, path.get(),
                                               changes.get(), kNotificationDeliverImmediately);
    _postLocalChangeNotifications(changes.get());
    mDeletedRows.forgetAllUndone();
}

void Database::_postLocalChangeNotifications(const Dictionary* changes) {
    gLogPersist.log("===== Posting local table-changed notifications");
    for (const auto& [name, value] : *changes) {
        auto* text = dynamic_cast<String*>(name);
        auto* rows = dynamic_cast<Dictionary*>(value);
        Table* table = text && rows ? getRegisteredTable(text->utf8().c_str()) : nullptr;
        if (table) table->_postLocalChangeNotification(rows);
    }
}

void Database::_receiveChangeNotification(Notification* notification) {
    const Ref<Dictionary> changes = notification->info;
    if (gLog.willLog()) {
        const Ref<String> text = describeChanges(changes.get());
        gLog.log("===== Received distributed database-changed notification:%@", text);
    }
    if (!changes.get()) return;
    // Every table lets go of what is out of date before anybody is told.
    tellTables(*this, changes.get());
    _postLocalChangeNotifications(changes.get());
}

void Database::_postFatalErrorNotification() {
    const Ref<Dictionary> report = std::move(mFatalError);
    mFatalError = nullptr;
    NotificationCenter::getLocal()->post(kDatabaseFatalErrorNotification, this, report.get());
}

void Database::refreshIfUnturned() {
    if (!mOpen || mWriteable || Foundation::RunLoop::isInsideCallback()) return;
    if (!mVersionQuery) {
        mVersionQuery = std::make_unique<Query>(this, SQLText("PRAGMA data_version"));
    }
    const int version = Cursor(*mVersionQuery).intColumn(0);
    if (version == std::exchange(mDataVersion, version)) return;
    gLogPersist.log("===== The file has changed, and nobody turns the run loop");
    for (Table* table : mTables) {
        table->_rolledBack();
    }
}

bool Database::isReplaced() const {
    if (!mOpen || !mLocation.get()) return false;
    int hasMoved = 0;
    sqlite3_file_control(mDB, nullptr, SQLITE_FCNTL_HAS_MOVED, &hasMoved);
    return hasMoved != 0 && access(mLocation->getFileSystemRepresentation().c_str(), F_OK) == 0;
}

void Database::announceFatalError() {
    if (!mFatalTimer.isRunning()) return;
    mFatalTimer.stop();
    const AutoreleasePool pool;
    _postFatalErrorNotification();
}

void Database::postReplacedNotification() {
    gLog.log("===== Database posting distributed 'Replaced' notification");
    const Ref<String> sender = String::string("Orvane Agent");
    NotificationCenter::getDistributed()->post(kDatabaseReplacedNotification, sender.get(), nullptr,
                                               kNotificationDeliverImmediately);
}

}  // namespace SQLite
