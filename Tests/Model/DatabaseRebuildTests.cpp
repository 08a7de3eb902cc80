// How the database is made anew where it is broken or of no use.

#include "Foundation/NetException.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/NotificationRecorder.h"
#include "Model/DatabaseLifeTest.h"
#include "SQLite/Transaction.h"
#include "Support/FileAccess.h"

using namespace Foundation;
using namespace Orvane;
namespace fs = std::filesystem;

namespace {

class DatabaseRebuildTest : public DatabaseLifeTest {};

struct Unusable {
    int version;
    int versionInTrash;
    const char* text;
};
class UnusableVersionTest : public DatabaseRebuildTest,
                            public testing::WithParamInterface<Unusable> {};

}  // namespace

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

TEST_F(DatabaseRebuildTest, MakesABrokenOneAnew) {
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

TEST_F(DatabaseRebuildTest, MakesOneAnewWhoseMigrationFails) {
    makeOld(10017);
    db().open((storage() / "Database/Database.sqlite3").c_str(), true);
    db().execute("alter table Feeds add column foafUrl text");
    db().close(true);
    start();
    expectNewDatabase();
    EXPECT_EQ(valueInTrash("pragma user_version"), "10018");
}

TEST_F(DatabaseRebuildTest, RestoresClientsFeedsAndSubscriptionsUnderTheirIDs) {
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

TEST_F(DatabaseRebuildTest, RestoresWhatItHasSaved) {
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

TEST_F(DatabaseRebuildTest, StartsEmptyFromAFileOfClientsThatCannotBeRead) {
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

TEST_F(DatabaseRebuildTest, LeavesOutWhatTheTablesRefuse) {
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

TEST_F(DatabaseRebuildTest, MovesDownloadsToTheTrashWhenItIsMadeAnew) {
    start();
    writeFile("Downloads/Incomplete/file", "x");
    ministry().recoverBrokenDatabase(nullptr);
    EXPECT_FALSE(has("Downloads"));
    EXPECT_EQ(trash(), (Strings{"Database", "Downloads"}));
}

TEST_F(DatabaseRebuildTest, GoesOnAfterItWasMadeAnew) {
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

TEST_F(DatabaseRebuildTest, RenamesABrokenOneWhereThereIsNoTrash) {
    breakTrash();
    makeOther(20000);
    start();
    expectNewDatabase();
    EXPECT_TRUE(has("Database.aside.1/Database.sqlite3"));
}

TEST_F(DatabaseRebuildTest, DoesNotTouchABrokenOneThatCannotBeMoved) {
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
