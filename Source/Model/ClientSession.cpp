#include "Model/ClientSession.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Dictionary.h"
#include "Foundation/DistributedNotificationCenter.h"
#include "Foundation/Logger.h"
#include "Foundation/Number.h"
#include "Foundation/RunLoop.h"
#include "Foundation/String.h"
#include "Foundation/URL.h"
#include "Model/AgentLink.h"
#include "Model/ClientCore.h"
#include "Model/Schema.h"
#include "SQLite/Database.h"
#include "SQLite/Exception.h"
#include "Utilities/FileSystem.h"
#include "Utilities/FileUtils.h"

#include <exception>

namespace Orvane {

using Compatibility::FileSystem;
using Foundation::gLog;
using Foundation::gWarn;
using Foundation::Notification;
using Foundation::NotificationCenter;
using Foundation::Number;
using Foundation::Ref;
using Foundation::String;
using SQLite::Database;
using SQLite::gDatabase;

namespace {

// Why the agent is asked, as codes of sqlite3.
constexpr int kNotFound = 12;
constexpr int kSchema = 17;

void openReadOnly() {
    const Ref<Foundation::URL> file = FileSystem::getStorageDatabaseFile();
    gDatabase->open(file, false);
}

void reopen() {
    gDatabase->close(true);
    openReadOnly();
}

/// The process's own; never destroyed.
ClientSession* sSession = nullptr;

/// Has the agent check the database or make it anew, and opens it again.
void fixDatabase(int code) {
    // What reads a file stands in the way of its repair.
    gDatabase->close(true);
    AgentLink::current().fixDatabase(code);
    openReadOnly();
}

}  // namespace

void ClientSession::open() {
    ClientCore::removeOldSvcdPlist();
    Database::initialize();
    if (gDatabase->isOpen()) return;
    const Foundation::AutoreleasePool pool;
    gLog.log("***** Opening client Orvane session *****");
    if (!sSession) sSession = new ClientSession;
    try {
        sSession->openDatabase();
        sSession->observe();
    } catch (...) {
        Foundation::warnAboutCurrentException(
            "static void Orvane::ClientCore::openClientSession()");
        gDatabase->close(true);
        throw std::exception();
    }
    gLog.log("Client session is open for business!");
}

void ClientSession::openDatabase() {
    const Ref<Foundation::URL> file = FileSystem::getStorageDatabaseFile();
    if (!FileUtils::exists(file)) {
        gLog.log("***** Database file doesn't exist ... starting agent ...");
        AgentLink::current().fixDatabase(kNotFound);
    }
    try {
        openReadOnly();
        if (gDatabase->getUserVersion() < Schema::kVersion) {
            gLog.log("***** Database schema is outdated ... starting agent ...");
            fixDatabase(kSchema);
        }
    } catch (const SQLite::Exception& exception) {
        gWarn.log("***** SQL error opening database: %s", exception.what());
        fixDatabase(exception.getCode());
    }
}

void ClientSession::observe() {
    NotificationCenter* local = NotificationCenter::getLocal();
    NotificationCenter* distributed = NotificationCenter::getDistributed();
    // A session that is opened once more must not hear everything twice.
    local->removeObserver(&mBroke);
    distributed->removeObserver(&mReplaced);
    local->addObserver(&mBroke, Database::kDatabaseFatalErrorNotification, gDatabase);
    distributed->addObserver(&mReplaced, Database::kDatabaseReplacedNotification, nullptr);
}

void ClientSession::catchUpIfUnturned() {
    if (!gDatabase || Foundation::RunLoop::isInsideCallback()) return;
    if (sSession) sSession->follow();
    gDatabase->refreshIfUnturned();
}

void ClientSession::follow() {
    if (gDatabase->isInTransaction()) return;
    gDatabase->announceFatalError();
    if (!gDatabase->isOpen()) return open();
    if (!gDatabase->isReplaced()) return;
    gLog.log("***** Database was replaced, and nobody turns the run loop ...");
    gDatabase->close(true);
    // It may be about to be made still, which the agent is waited for.
    openDatabase();
}

void ClientSession::databaseBroke(Notification* notification) {
    int error = -1;
    String* message = nullptr;
    if (const Foundation::Dictionary* info = notification->info) {
        const auto* number = info->getAs<Number>("error");
        if (number) error = static_cast<int>(number->getInteger());
        message = info->getAs<String>("message");
    }
    gWarn.log("***** Asking agent to rebuild database: err=%i, %@", error, message);
    fixDatabase(error);
}

void ClientSession::databaseWasReplaced(Notification*) {
    gLog.log("***** Database was replaced by agent ...");
    reopen();
}

}  // namespace Orvane
