// How the database is opened and brought up to date.

#include "Foundation/NetException.h"
#include "Model/DatabaseLifeTest.h"
#include "SQLite/Transaction.h"

#include <gmock/gmock.h>

using namespace Foundation;
using namespace Orvane;
namespace fs = std::filesystem;
using testing::HasSubstr;

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
