#include "Model/MinistryOfTruth.h"

#include "Foundation/Clock.h"
#include "Foundation/Data.h"
#include "Foundation/Dictionary.h"
#include "Foundation/Guard.h"
#include "Foundation/Logger.h"
#include "Foundation/Switches.h"
#include "Model/ClientsPlist.h"
#include "Model/FeedCore.h"
#include "Model/Migrations.h"
#include "Model/OlderDatabase.h"
#include "Model/Schema.h"
#include "Model/TruthRemoval.h"
#include "Model/TruthRestore.h"
#include "SQLite/Database.h"
#include "SQLite/Exception.h"
#include "Utilities/FileSystem.h"
#include "Utilities/FileUtils.h"

#include <cstdlib>

namespace Orvane {

using namespace Foundation;
using Compatibility::FileSystem;
using SQLite::gDatabase;
using SQLite::gLogTruth;

namespace {

/// Throws if the directory is not there and cannot be made.
void createDirectory(URLReturner location) {
    const Ref<URL> url = std::move(location);
    NetError error;
    if (FileUtils::createDirectory(url, error)) return;
    gWarn.log("*** Could not create %@ : %@", url, error);
    error.throwException();
}

URLReturner inStorage(const char* name, bool isDirectory) {
    const Ref<URL> storage = FileSystem::getStorageURL();
    const Ref<String> component = String::string(name);
    return storage->byAppending(component, isDirectory);
}

/// Moves what is at `name` in the storage, if it is there, to `location`.
void moveIfThere(const char* name, bool isDirectory, URL* location) {
    const Ref<URL> from = inStorage(name, isDirectory);
    NetError error;
    if (FileUtils::exists(from) && !FileUtils::move(from, location, error)) {
        gWarn.log("Could not move <%@> to <%@>: %@", from, location, error);
    }
}

/// An empty file that is there while the file of clients is behind the database, so that whoever
/// starts next knows if this process ends before it has saved it.
URLReturner markOfPListBehind() {
    return inStorage(".clients-changed", false);
}

bool isPListBehind() {
    const Ref<URL> mark = markOfPListBehind();
    return FileUtils::exists(mark);
}

void markPListBehind() {
    if (isPListBehind()) return;
    const Ref<URL> mark = markOfPListBehind();
    const Ref<Data> nothing = Data::adopt(std::string());
    NetError error;
    if (nothing->writeToResource(mark, error)) return;
    gWarn.log("Could not write %@ : %@", mark, error);
}

void unmarkPListBehind() {
    if (!isPListBehind()) return;
    const Ref<URL> mark = markOfPListBehind();
    NetError error;
    // The next start then saves once more.
    if (!FileUtils::deleteFile(mark, error)) gWarn.log("Unable to delete <%@>: %@", mark, error);
}

URLReturner withSuffix(const URL& url, const char* suffix) {
    const std::string path = url.getFileSystemRepresentation() + suffix;
    return URL::urlWithFileSystemPath(path.c_str(), false);
}

/// Whether a database of that version can be used, perhaps once it has been migrated.
bool canUse(int version, int major, int minor) {
    if (major != Schema::kMajorVersion) {
        gWarn.log(
            "Database is too old (v%i on disk) vs. (v%i in framework): have to delete & recreate "
            "database",
            version, Schema::kVersion);
        return false;
    }
    if (minor < Migrations::kOldestMinorVersion) {
        gWarn.log("No migration path from Orvane database v%i to v%i.", version, Schema::kVersion);
        return false;
    }
    if (minor > Schema::kMinorVersion) {
        gWarn.log(
            "Database on disk (v%i) is newer than what I know (v%i), but I think I can still use "
            "it.",
            version, Schema::kVersion);
    }
    return true;
}

void migrate(int minor) {
    const double start = Clock::current().now();
    Migrations::run(minor);
    gLog.log("Migrating database schema from %d.%d to %d.%d took %.3f seconds.",
             Schema::kMajorVersion, minor, Schema::kMajorVersion, Schema::kMinorVersion,
             Clock::current().now() - start);
}

/// Drops what somebody's ANALYZE has left. The planner believes it, and walks a table that has
/// grown since instead of using its index. Where there is no room for that it does without.
void forgetStatistics() {
    try {
        const int tables = gDatabase->execScalar(
            "SELECT count(*) FROM sqlite_master WHERE name IN ('sqlite_stat1', 'sqlite_stat4')");
        if (tables == 0) return;
        gLogAgent.log("Dropping the statistics of the database");
        gDatabase->execute("DROP TABLE IF EXISTS sqlite_stat1; DROP TABLE IF EXISTS sqlite_stat4");
        // The connection has read them with the schema, and now reads that anew.
        gDatabase->execute("PRAGMA writable_schema = RESET");
    } catch (const SQLite::Exception& exception) {
        if (exception.isFatal()) throw;
        doWarnAboutException(&exception, "void Orvane::forgetStatistics()");
    }
}

/// True while it lives.
class Flag : Uncopyable {
 public:
    explicit Flag(bool& flag) : mFlag(flag) { mFlag = true; }
    ~Flag() { mFlag = false; }

 private:
    bool& mFlag;
};

}  // namespace

MinistryOfTruth* MinistryOfTruth::instance() {
    static MinistryOfTruth sInstance;
    return &sInstance;
}

MinistryOfTruth::MinistryOfTruth() : mSaveTimer(this, &MinistryOfTruth::saveSubscriptions) {}

void MinistryOfTruth::openDatabase() {
    const AutoreleasePool pool;
    gLogAgentVerbose.log("MinistryOfTruth::openDatabase beginning...");
    const Ref<URL> file = FileSystem::getStorageDatabaseFile();
    const bool exists = FileUtils::exists(file) || convertOldSeedDatabase();
    createDirectories();
    if (exists) {
        openExistingDatabase();
    } else {
        openNewDatabase();
    }
    callGuarded("void Orvane::MinistryOfTruth::openDatabase()", [] { TruthRemoval::finish(); });
    // What migrated or restored it is not announced.
    gDatabase->setPostsNotifications(true);
    mPostsNotifications = true;
    if (OlderDatabase* older = OlderDatabase::current()) older->checkIn(!exists);
    gLogAgentVerbose.log("MinistryOfTruth::openDatabase finished.");
}

void MinistryOfTruth::openExistingDatabase() {
    Ref<String> reason;
    try {
        openDBFile();
        if (checkDatabaseSchema()) {
            // Not before: it fixes the mode of auto_vacuum.
            gDatabase->useWriteAheadLog();
            forgetStatistics();
        } else {
            reason = String::string("Database schema way out of date");
        }
    } catch (const SQLite::Exception& exception) {
        doWarnAboutException(&exception, "void Orvane::MinistryOfTruth::openDatabase()");
        reason = String::string(exception.what());
    }
    const Ref<URL> plist = getClientPListURL();
    if (reason) {
        recoverBrokenDatabase(reason);
    } else if (!FileUtils::exists(plist) || isPListBehind()) {
        saveSubscriptionsSoon();
    }
}

void MinistryOfTruth::openNewDatabase() {
    gLogAgent.log("No database exists -- opening and initializing a new one");
    openDBFile();
    initializeDatabase();
}

void MinistryOfTruth::openDBFile() {
    SQLite::Database::initialize();
    const Ref<URL> file = FileSystem::getStorageDatabaseFile();
    gDatabase->open(file.get(), true);
}

void MinistryOfTruth::initializeDatabase() {
    gLogAgent.log("Initializing new database...");
    Schema::createDatabase([this] { restore(); });
    if (GetBoolEnv("OVAgentQuitAfterRecovery")) {
        gWarn.log("Agent exiting (OVAgentQuitAfterRecovery is set)");
        std::exit(1);
    }
}

void MinistryOfTruth::restore() {
    const Flag restoring(mRestoring);
    restoreSubscriptions();
    TruthRestore::restoreEntries();
}

bool MinistryOfTruth::restoreSubscriptions() {
    const Ref<URL> url = getClientPListURL();
    if (!FileUtils::exists(url)) return false;
    gLogTruth.log("Restoring Client/Subscription/Feed tables from plist...");
    Ref<Dictionary> root;
    callGuarded("bool Orvane::MinistryOfTruth::restoreSubscriptions()",
                [&] { root = ClientsPlist::read(url); });
    if (!root) return false;
    TruthRestore::insertSubscriptions(root);
    return true;
}

bool MinistryOfTruth::checkDatabaseSchema() {
    int version = gDatabase->getUserVersion();
    int major = version / 10000;
    const int minor = version % 10000;
    if (major == 0) {
        major = 1;
        version = 10000 + minor;
        gDatabase->setUserVersion(version);
    }
    gLogAgentVerbose.log("Database userVersion=%i; that's %i/%i", version, major, minor);
    if (!canUse(version, major, minor)) return false;
    if (minor < Schema::kMinorVersion) migrate(minor);
    return true;
}

void MinistryOfTruth::createDirectories() {
    createDirectory(FileSystem::getStorageBaseURL());
    createDirectory(FileSystem::getStorageURL());
    createDirectory(FileSystem::getStorageDatabaseURL());
    createDirectory(FileSystem::getStorageTruthURL());
}

/// The database goes last, so that one that was cut short is taken up again; and not before its
/// journal, without which it may be half of something.
bool MinistryOfTruth::convertOldSeedDatabase() {
    const Ref<URL> old = inStorage("Database.sqlite3", false);
    if (!FileUtils::exists(old)) return false;
    createDirectory(FileSystem::getStorageDatabaseURL());
    const Ref<URL> truth = FileSystem::getStorageTruthURL();
    moveIfThere("RawFeeds", true, truth);
    const Ref<URL> file = FileSystem::getStorageDatabaseFile();
    const Ref<URL> journal = withSuffix(*file, "-journal");
    moveIfThere("Database.sqlite3-journal", false, journal);
    moveIfThere("Database.sqlite3", false, file);
    return FileUtils::exists(file);
}

void MinistryOfTruth::recoverBrokenDatabase(String*) {
    const AutoreleasePool pool;
    gWarn.log("*** DATABASE IS BROKEN/STUCK: Moving aside and rebuilding ***");
    deleteDatabase();
    openDBFile();
    initializeDatabase();
    // It is another connection than before.
    if (mPostsNotifications) gDatabase->setPostsNotifications(true);
    gDatabase->postReplacedNotification();
}

void MinistryOfTruth::deleteDatabase() {
    gDatabase->close(false);
    const Ref<URL> directory = FileSystem::getStorageDatabaseURL();
    NetError error;
    if (FileUtils::exists(directory) && !FileUtils::moveToTrash(directory, error)) {
        gWarn.log("Unable to move <%@> to trash: %@", directory, error);
        error.throwException();
    }
    createDirectory(FileSystem::getStorageDatabaseURL());
}

void MinistryOfTruth::saveSubscriptionsSoon() {
    if (mSaveTimer.isRunning()) return;
    gLogTruth.log("Will save client/subscription info plist in 5 sec...");
    markPListBehind();
    mSaveTimer.start(kSaveDelaySeconds, false);
}

void MinistryOfTruth::saveSubscriptions() {
    gLogTruth.log("Saving client/subscription info plist");
    mSaveTimer.stop();
    const Ref<URL> url = getClientPListURL();
    const Ref<Dictionary> root = ClientsPlist::describeDatabase();
    if (ClientsPlist::write(root, url)) unmarkPListBehind();
}

URLReturner MinistryOfTruth::getClientPListURL() {
    return FileSystem::getClientPListURL();
}

void MinistryOfTruth::deleteTruthDirectoryForFeed(FeedCore* feed, URL* directory) {
    if (directory) TruthRemoval::remove(feed, directory);
}

}  // namespace Orvane
