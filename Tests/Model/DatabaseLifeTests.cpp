// How the database is opened, brought up to date and made anew.

#include "Foundation/NetException.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/NotificationRecorder.h"
#include "Model/OldSchema.h"
#include "Model/OlderDatabase.h"
#include "Model/StorageTest.h"
#include "SQLite/Exception.h"
#include "SQLite/Transaction.h"
#include "Support/FileAccess.h"

#include <gmock/gmock.h>

#include <algorithm>
#include <fstream>

using namespace Foundation;
using namespace Orvane;
namespace fs = std::filesystem;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::StartsWith;
using Strings = std::vector<std::string>;

namespace {

class FakeOlderDatabase : public OlderDatabase {
 public:
    FakeOlderDatabase() { setCurrent(this); }
    ~FakeOlderDatabase() override { setCurrent(nullptr); }
    void checkIn(bool createdNew) override {
        // It may write.
        EXPECT_TRUE(SQLite::gDatabase->isOpen());
        calls.push_back(createdNew);
    }

    std::vector<bool> calls;
};

class DatabaseLifeTest : public StorageTest {
 protected:
    DatabaseLifeTest() { fs::remove_all(mTrash); }
    ~DatabaseLifeTest() override { fs::remove_all(mTrash); }

    /// Opens the database as the agent does when it starts.
    static void start() { ministry().openDatabase(); }
    /// Makes a file of an old version.
    void makeOld(int version) {
        openPlainFile();
        OldSchema::make(version);
        endOfFile();
    }
    /// Makes a file with a table and a version.
    void makeOther(int version) {
        openPlainFile();
        db().execute("create table Other (name text)");
        db().setUserVersion(version);
        endOfFile();
    }
    /// Makes a database that is up to date, with a client and its settings.
    void makeCurrent() {
        openPlainFile();
        Schema::createDatabase();
        db().execute("insert into Clients values (3, 'com.example.reader', 0, 700000000)");
        db().execute("insert into Subscriptions (rowID, client) values (7, 3)");
        endOfFile();
    }
    void restart() {
        db().close(true);
        log.clear();
        platform.posts.clear();
        start();
    }
    /// The names in the trash.
    Strings trash() const {
        Strings result;
        if (!fs::exists(mTrash / "files")) return result;
        for (const auto& entry : fs::directory_iterator(mTrash / "files")) {
            result.push_back(entry.path().filename());
        }
        std::sort(result.begin(), result.end());
        return result;
    }
    /// Column 0 of the first row of what is in the trash.
    std::string valueInTrash(const char* sql) const {
        SQLite::Database other;
        other.open((mTrash / "files/Database/Database.sqlite3").c_str(), false);
        const SQLite::Cursor cursor(&other, "%s", sql);
        return cursor.cStringColumn(0);
    }
    void breakTrash() const { std::ofstream(mTrash).put('x'); }
    Strings postNames() const {
        Strings result;
        for (const auto& post : platform.posts) {
            result.push_back(post.name);
        }
        return result;
    }
    void expectNewDatabase() const {
        EXPECT_EQ(db().getUserVersion(), 10022);
        EXPECT_EQ(count("sqlite_master where type='table'"), 7);
        EXPECT_EQ(db().execScalar("PRAGMA auto_vacuum"), 2);
        EXPECT_EQ(rows("PRAGMA journal_mode"), Strings{"wal"});
    }

    Support::LoggingOn logging{{&gLogAgent, &gLogAgentVerbose, &SQLite::gLogTruth}};
    FakeOlderDatabase older;

 private:
    void openPlainFile() {
        fs::create_directories(storage() / "Database");
        db().open((storage() / "Database/Database.sqlite3").c_str(), true);
    }
    void endOfFile() {
        db().close(true);
        log.clear();
    }

    const fs::path mTrash = fs::path(std::getenv("XDG_DATA_HOME")) / "Trash";
};

constexpr const char* kPlist = R"(<plist version="1.0"><dict>
<key>Clients</key><dict>
  <key>30</key><dict><key>Signature</key><string>com.example.b</string>
    <key>DateUsed</key><date>2023-03-08T20:26:40Z</date></dict>
  <key>4</key><dict><key>Signature</key><string>com.example.a</string>
    <key>Private</key><true/></dict>
</dict>
<key>Feeds</key><dict>
  <key>17</key><dict><key>URL</key><string>http://example.com/%C3%A4</string>
    <key>Login</key><string>anna</string></dict>
  <key>5</key><dict><key>URL</key><string>http://example.com/</string></dict>
</dict>
<key>Subscriptions</key><dict>
  <key>100</key><dict><key>Client</key><integer>30</integer></dict>
  <key>8</key><dict><key>Client</key><integer>4</integer><key>Feed</key><integer>17</integer>
    <key>RefreshInterval</key><real>-1</real><key>ExpirationInterval</key><integer>86400</integer>
    <key>RefreshesInBackground</key><true/><key>DownloadsEnclosures</key><true/>
    <key>MaxEnclosureSize</key><real>1000000</real>
    <key>EnclosureTypes</key><string>audio/mpeg&#9;video/mp4</string></dict>
</dict></dict></plist>)";

}  // namespace

TEST_F(DatabaseLifeTest, BeginsWithANewDatabase) {
    start();
    expectNewDatabase();
    EXPECT_TRUE(has("Feeds"));
    EXPECT_FALSE(has("Downloads"));
    EXPECT_EQ(older.calls, std::vector<bool>{true});
    EXPECT_THAT(log.lines().front(), "[Agent.Verbose] MinistryOfTruth::openDatabase beginning...");
    EXPECT_THAT(log.lines().back(), "[Agent.Verbose] MinistryOfTruth::openDatabase finished.");
    EXPECT_TRUE(log.contains("[Agent] No database exists -- opening and initializing a new one"));
    EXPECT_TRUE(log.contains("[Agent] Initializing new database..."));
    EXPECT_TRUE(log.contains("----BEGIN restoreEntries"));
    EXPECT_TRUE(log.contains("----END restoreEntries"));
    EXPECT_EQ(trash(), Strings{});
}

TEST_F(DatabaseLifeTest, AnnouncesChangesFromThenOn) {
    start();
    EXPECT_EQ(postNames(), Strings{});
    {
        const SQLite::Transaction transaction(true);
        db().execute("insert into Authors (name) values ('A')");
    }
    EXPECT_EQ(postNames(), Strings{"com.tarnwick.orvane.DBChanged"});
}

TEST_F(DatabaseLifeTest, OpensOneThatIsUpToDate) {
    makeCurrent();
    writeFile("Clients.plist", kPlist);
    start();
    EXPECT_EQ(rows("select rowID, signature from Clients"), Strings{"3|com.example.reader"});
    EXPECT_EQ(older.calls, std::vector<bool>{false});
    EXPECT_TRUE(log.contains("[Agent.Verbose] Database userVersion=10022; that's 1/22"));
    EXPECT_FALSE(log.contains("Migrating"));
    EXPECT_EQ(rows("PRAGMA journal_mode"), Strings{"wal"});
    clock.advanceBy(60);
    EXPECT_EQ(readFile("Clients.plist"), kPlist);
    EXPECT_EQ(trash(), Strings{});
    EXPECT_EQ(postNames(), Strings{});
}

TEST_F(DatabaseLifeTest, DropsStatisticsAndPlansWithoutThem) {
    const auto plan = [] {
        return rows("explain query plan select * from Subscriptions where feed=1");
    };
    start();
    const Strings before = plan();
    EXPECT_THAT(before[0], HasSubstr("USING INDEX Subscriptions_feedandclient (feed=?)"));
    db().execute("insert into Clients (signature) values ('a')");
    db().execute("insert into Subscriptions (client, feed) values (1, 1)");
    db().execute("analyze");
    EXPECT_NE(plan(), before);
    restart();
    EXPECT_EQ(plan(), before);
    EXPECT_EQ(count("sqlite_master where name like 'sqlite_stat%'"), 0);
    EXPECT_TRUE(log.contains("Dropping the statistics of the database"));
    restart();
    EXPECT_FALSE(log.contains("Dropping the statistics"));
}

TEST_F(DatabaseLifeTest, SavesTheClientsOfOneThatHasNoFileOfThem) {
    makeCurrent();
    start();
    EXPECT_FALSE(has("Clients.plist"));
    clock.advanceBy(5);
    EXPECT_THAT(readFile("Clients.plist"), HasSubstr("com.example.reader"));
    EXPECT_EQ(log.count("Will save client/subscription info plist"), 1);
}

TEST_F(DatabaseLifeTest, SavesTheClientsThatAnEarlierProcessDidNotComeTo) {
    makeCurrent();
    writeFile("Clients.plist", kPlist);
    writeFile(".clients-changed", "");
    start();
    EXPECT_EQ(log.count("Will save client/subscription info plist"), 1);
    clock.advanceBy(5);
    EXPECT_THAT(readFile("Clients.plist"), HasSubstr("com.example.reader"));
    EXPECT_FALSE(has(".clients-changed"));
    restart();
    EXPECT_FALSE(log.contains("Will save"));
}

TEST_F(DatabaseLifeTest, DoesNotSaveTheClientsOfANewOne) {
    start();
    clock.advanceBy(60);
    EXPECT_FALSE(has("Clients.plist"));
}

TEST_F(DatabaseLifeTest, MigratesAnOldOne) {
    makeOld(10005);
    start();
    EXPECT_EQ(db().getUserVersion(), 10022);
    EXPECT_EQ(count("Entries"), 3);
    EXPECT_EQ(log.count("Migrating database schema from 1.5 to 1.22 took 0.000 seconds."), 1);
    EXPECT_EQ(older.calls, std::vector<bool>{false});
    EXPECT_EQ(trash(), Strings{});
    EXPECT_EQ(postNames(), Strings{});
    EXPECT_EQ(db().execScalar("PRAGMA auto_vacuum"), 2);
    EXPECT_EQ(rows("PRAGMA journal_mode"), Strings{"wal"});
    db().execute("insert into Authors (name) values ('A')");
    clock.advanceBy(0);
    EXPECT_EQ(postNames(), Strings{"com.tarnwick.orvane.DBChanged"});
    restart();
    EXPECT_FALSE(log.contains("Migrating"));
    EXPECT_EQ(count("Authors"), 1);
}

TEST_F(DatabaseLifeTest, TakesTheMajorVersion0For1) {
    makeOld(10015);
    db().open((storage() / "Database/Database.sqlite3").c_str(), true);
    db().setUserVersion(15);
    db().close(true);
    start();
    EXPECT_TRUE(log.contains("Database userVersion=10015; that's 1/15"));
    EXPECT_TRUE(log.contains("Migrating database schema from 1.15 to 1.22"));
    EXPECT_EQ(count("Entries"), 3);
}

TEST_F(DatabaseLifeTest, KeepsANewerOneAsItIs) {
    makeCurrent();
    db().open((storage() / "Database/Database.sqlite3").c_str(), true);
    db().setUserVersion(10030);
    db().close(true);
    start();
    EXPECT_EQ(log.count("Database on disk (v10030) is newer than what I know (v10022), but I think "
                        "I can still use it."),
              1);
    EXPECT_EQ(db().getUserVersion(), 10030);
    EXPECT_EQ(count("Clients"), 1);
    EXPECT_EQ(trash(), Strings{});
}

struct Unusable {
    int version;
    int versionInTrash;
    const char* text;
};
class UnusableVersionTest : public DatabaseLifeTest,
                            public testing::WithParamInterface<Unusable> {};

TEST_P(UnusableVersionTest, IsMovedToTheTrashAndMadeAnew) {
    makeOther(GetParam().version);
    start();
    EXPECT_EQ(log.count(GetParam().text), 1);
    EXPECT_EQ(log.count("*** DATABASE IS BROKEN/STUCK: Moving aside and rebuilding ***"), 1);
    EXPECT_TRUE(log.contains("[Agent] Initializing new database..."));
    EXPECT_FALSE(log.contains("No database exists"));
    expectNewDatabase();
    EXPECT_EQ(trash(), Strings{"Database"});
    EXPECT_EQ(valueInTrash("select name from sqlite_master"), "Other");
    EXPECT_EQ(valueInTrash("pragma user_version"), std::to_string(GetParam().versionInTrash));
    EXPECT_EQ(postNames(), Strings{"com.tarnwick.orvane.DBReplaced"});
    EXPECT_EQ(older.calls, std::vector<bool>{false});
}

INSTANTIATE_TEST_SUITE_P(
    Versions, UnusableVersionTest,
    testing::Values(
        Unusable{0, 10000, "No migration path from Orvane database v10000 to v10022."},
        Unusable{4, 10004, "No migration path from Orvane database v10004 to v10022."},
        Unusable{-7, 9993, "No migration path from Orvane database v9993 to v10022."},
        Unusable{10004, 10004, "No migration path from Orvane database v10004 to v10022."},
        Unusable{20000, 20000,
                 "Database is too old (v20000 on disk) vs. (v10022 in framework): have to delete & "
                 "recreate database"},
        Unusable{-10022, -10022,
                 "Database is too old (v-10022 on disk) vs. (v10022 in framework): have to delete "
                 "& recreate database"}));

TEST_F(DatabaseLifeTest, MakesABrokenOneAnew) {
    writeFile("Database/Database.sqlite3", std::string(5000, 'x'));
    start();
    EXPECT_EQ(log.count("caught in void Orvane::MinistryOfTruth::openDatabase()"), 1);
    EXPECT_EQ(log.count("*** DATABASE IS BROKEN/STUCK: Moving aside and rebuilding ***"), 1);
    expectNewDatabase();
    EXPECT_EQ(trash(), Strings{"Database"});
    EXPECT_EQ(older.calls, std::vector<bool>{false});
    // The failure has been dealt with and is not announced any more.
    NotificationRecorder fatal;
    auto* const center = NotificationCenter::getLocal();
    center->addObserver(fatal, SQLite::Database::kDatabaseFatalErrorNotification, &db());
    clock.advanceBy(1);
    center->removeObserver(fatal);
    EXPECT_TRUE(fatal.notes.empty());
}

TEST_F(DatabaseLifeTest, MakesOneAnewWhoseMigrationFails) {
    makeOld(10017);
    db().open((storage() / "Database/Database.sqlite3").c_str(), true);
    db().execute("alter table Feeds add column foafUrl text");
    db().close(true);
    start();
    expectNewDatabase();
    EXPECT_EQ(valueInTrash("pragma user_version"), "10018");
}

TEST_F(DatabaseLifeTest, RestoresClientsFeedsAndSubscriptionsUnderTheirIDs) {
    writeFile("Clients.plist", kPlist);
    writeFile("Database/Database.sqlite3", std::string(5000, 'x'));
    start();
    EXPECT_EQ(rows("select rowID, signature, private, dateUsed from Clients order by rowID"),
              (Strings{"4|com.example.a|1|788918400.0", "30|com.example.b|0|700000000.0"}));
    EXPECT_EQ(rows("select rowID, url, login from Feeds order by rowID"),
              (Strings{"5|http://example.com/|null", "17|http://example.com/%C3%A4|anna"}));
    EXPECT_EQ(
        rows("select rowID, client, feed, refreshInterval, expirationInterval, "
             "refreshesInBackground, downloadsEnclosures, maxEnclosureSize, enclosureTypesString, "
             "unreadCount from Subscriptions order by rowID"),
        (Strings{"8|4|17|-1.0|86400.0|1|1|1000000.0|audio/mpeg\tvideo/mp4|0",
                 "100|30|0|0.0|0.0|0|0|0.0|null|0"}));
    EXPECT_EQ(log.count("[Truth] Restoring Client/Subscription/Feed tables from plist..."), 1);
    EXPECT_TRUE(log.contains("[Truth]     Client \"com.example.a\""));
    EXPECT_TRUE(log.contains("[Truth]     feed \"http://example.com/\""));
    EXPECT_TRUE(log.contains("[Truth]     subscription #100"));
    EXPECT_TRUE(log.contains("Restoring entries of <http://example.com/> from saved XML files..."));
    EXPECT_EQ(log.count("...Finished restoring entries in 0.00 sec"), 2);
    EXPECT_EQ(readFile("Clients.plist"), kPlist);
}

TEST_F(DatabaseLifeTest, RestoresWhatItHasSaved) {
    writeFile("Clients.plist", kPlist);
    start();
    const char* all[] = {"select * from Clients order by rowID",
                         "select rowID, url, login from Feeds order by rowID",
                         "select * from Subscriptions order by rowID"};
    std::vector<Strings> before;
    for (const char* sql : all) {
        before.push_back(rows(sql));
    }
    ministry().saveSubscriptions();
    ministry().recoverBrokenDatabase(nullptr);
    // The feed that nobody subscribes to is not saved.
    before[1].erase(before[1].begin());
    for (std::size_t i = 0; i < before.size(); ++i) {
        EXPECT_EQ(rows(all[i]), before[i]);
    }
}

TEST_F(DatabaseLifeTest, StartsEmptyFromAFileOfClientsThatCannotBeRead) {
    writeFile("Clients.plist", "<plist><dict>");
    writeFile("Database/Database.sqlite3", std::string(5000, 'x'));
    start();
    expectNewDatabase();
    EXPECT_EQ(count("Clients"), 0);
    EXPECT_EQ(log.count("Could not read file://"), 1);
    // What can still be made of it by hand is not lost when the next one is saved.
    ministry().saveSubscriptions();
    EXPECT_EQ(readFile("Clients-unreadable.plist"), "<plist><dict>");
}

TEST_F(DatabaseLifeTest, LeavesOutWhatTheTablesRefuse) {
    writeFile("Clients.plist", R"(<plist version="1.0"><dict>
        <key>Clients</key><dict>
          <key>1</key><dict><key>Private</key><true/></dict>
          <key>2</key><dict><key>Signature</key><string>same</string></dict>
          <key>3</key><dict><key>Signature</key><string>same</string></dict>
          <key>4</key><string>no dictionary</string></dict>
        <key>Feeds</key><array/>
        <key>Subscriptions</key><dict>
          <key>9</key><dict><key>Client</key><integer>2</integer></dict></dict>
        </dict></plist>)");
    const unsigned hits = getExceptionHits();
    start();
    EXPECT_EQ(getExceptionHits(), hits + 2);
    EXPECT_EQ(rows("select rowID, signature from Clients"), Strings{"2|same"});
    EXPECT_EQ(rows("select rowID, client from Subscriptions"), Strings{"9|2"});
}

TEST_F(DatabaseLifeTest, MovesDownloadsToTheTrashWhenItIsMadeAnew) {
    start();
    writeFile("Downloads/Incomplete/file", "x");
    ministry().recoverBrokenDatabase(nullptr);
    EXPECT_FALSE(has("Downloads"));
    EXPECT_EQ(trash(), (Strings{"Database", "Downloads"}));
}

TEST_F(DatabaseLifeTest, GoesOnAfterItWasMadeAnew) {
    start();
    db().execute("insert into Authors (name) values ('A')");
    clock.advanceBy(1);
    platform.posts.clear();
    const Ref<String> reason = String::string("broken");
    ministry().recoverBrokenDatabase(reason);
    EXPECT_EQ(postNames(), Strings{"com.tarnwick.orvane.DBReplaced"});
    EXPECT_EQ(platform.posts[0].object, "Orvane Agent");
    EXPECT_EQ(count("Authors"), 0);
    EXPECT_FALSE(ministry().isRestoring());
    {
        const SQLite::Transaction transaction(true);
        db().execute("insert into Authors (name) values ('B')");
    }
    EXPECT_EQ(postNames().back(), "com.tarnwick.orvane.DBChanged");
    EXPECT_EQ(older.calls, std::vector<bool>{true});
    restart();
    EXPECT_EQ(count("Authors"), 1);
}

TEST_F(DatabaseLifeTest, RenamesABrokenOneWhereThereIsNoTrash) {
    breakTrash();
    makeOther(20000);
    start();
    expectNewDatabase();
    EXPECT_TRUE(has("Database.aside.1/Database.sqlite3"));
}

TEST_F(DatabaseLifeTest, DoesNotTouchABrokenOneThatCannotBeMoved) {
    makeOther(20000);
    breakTrash();
    for (const fs::path& path :
         {base.path(), storage(), storage() / "Database", storage() / "Feeds"}) {
        fs::create_directories(path);
        fs::permissions(path, fs::perms::all);
    }
    fs::permissions(storage() / "Database/Database.sqlite3", fs::perms::all);
    fs::permissions(storage(), fs::perms::owner_write, fs::perm_options::remove);
    fs::permissions(storage(), static_cast<fs::perms>(0555));
    {
        const Support::OrdinaryFileAccess ordinary;
        EXPECT_THROW(start(), NetException);
    }
    fs::permissions(storage(), fs::perms::all);
    EXPECT_EQ(log.count("Unable to move <file://"), 1);
    EXPECT_FALSE(db().isOpen());
    EXPECT_TRUE(has("Database/Database.sqlite3"));
    EXPECT_FALSE(has("Database.aside.1"));
}

TEST_F(DatabaseLifeTest, NeedsItsDirectories) {
    writeFile("Feeds", "in the way");
    EXPECT_THROW(start(), NetException);
    EXPECT_EQ(log.count("*** Could not create file://"), 1);
    EXPECT_THAT(log.lines().back(), HasSubstr("/Orvane/Feeds/ : "));
    EXPECT_TRUE(has("Database"));
    EXPECT_FALSE(has("Database/Database.sqlite3"));
}

TEST_F(DatabaseLifeTest, TakesOverTheOldLayout) {
    makeOld(10010);
    fs::rename(storage() / "Database/Database.sqlite3", storage() / "Database.sqlite3");
    fs::remove(storage() / "Database");
    writeFile("RawFeeds/abc.xml", "<rss/>");
    start();
    EXPECT_EQ(count("Entries"), 3);
    EXPECT_EQ(readFile("Feeds/abc.xml"), "<rss/>");
    EXPECT_FALSE(has("RawFeeds"));
    EXPECT_FALSE(has("Database.sqlite3"));
    EXPECT_EQ(older.calls, std::vector<bool>{false});
}

TEST_F(DatabaseLifeTest, TakesTheOldLayoutsJournalWithIt) {
    makeOther(10022);
    fs::rename(storage() / "Database/Database.sqlite3", storage() / "Database.sqlite3");
    writeFile("Database.sqlite3-journal", "");
    start();
    EXPECT_FALSE(has("Database.sqlite3-journal"));
    EXPECT_EQ(count("Other"), 0);
}

TEST_F(DatabaseLifeTest, LeavesTheOldLayoutAloneWhereThereIsANewOne) {
    makeCurrent();
    writeFile("Database.sqlite3", "old");
    writeFile("RawFeeds/abc.xml", "<rss/>");
    start();
    EXPECT_EQ(count("Clients"), 1);
    EXPECT_TRUE(has("RawFeeds/abc.xml"));
    EXPECT_EQ(readFile("Database.sqlite3"), "old");
}
