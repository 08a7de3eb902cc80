#include "Model/MinistryOfTruth.h"

#include "Model/StorageTest.h"
#include "SQLite/Transaction.h"
#include "Support/FileAccess.h"
#include "Support/TurnUntil.h"
#include "Utilities/FileUtils.h"

#include <gmock/gmock.h>

#include <stdexcept>

using namespace Foundation;
using namespace Orvane;

namespace {

/// With a new database in memory.
class SavingTest : public StorageTest {
 protected:
    SavingTest() { makeInMemory(); }

    Support::LoggingOn logging{{&SQLite::gLogTruth}};
};

class TruthDirectoryTest : public StorageTest {
 protected:
    static void waitUntilDeleted() {
        // The queue opens a pool for a warning, which waits for the test's.
        ASSERT_TRUE(Support::turnUntil([] { return !FileUtils::isDeletingFilesAsynchronously(); }));
    }
    /// Stores a feed with an entry, and closes the database.
    static void makeFeed(const char* identifier, bool isEntryCurrent) {
        ministry().openDatabase();
        db().execute("insert into Feeds (identifier, url) values (%Q, %Q)", identifier, identifier);
        db().execute(
            "insert into Entries (feed, current) select rowID, %d from Feeds where identifier=%Q",
            isEntryCurrent ? 1 : 0, identifier);
        db().close(true);
    }
};

}  // namespace

TEST_F(SavingTest, SavesOnceFiveSecondsAfterTheFirstRequest) {
    ministry().saveSubscriptionsSoon();
    clock.advanceBy(3);
    ministry().saveSubscriptionsSoon();
    EXPECT_FALSE(has("Clients.plist"));
    clock.advanceBy(1.9);
    EXPECT_FALSE(has("Clients.plist"));
    clock.advanceBy(0.2);
    EXPECT_TRUE(has("Clients.plist"));
    clock.advanceBy(60);
    EXPECT_EQ(log.count("[Truth] Will save client/subscription info plist in 5 sec..."), 1);
    EXPECT_EQ(log.count("[Truth] Saving client/subscription info plist"), 1);
}

TEST_F(SavingTest, ASaveTakesTheLaterOnesPlace) {
    ministry().saveSubscriptionsSoon();
    ministry().saveSubscriptions();
    clock.advanceBy(60);
    EXPECT_EQ(log.count("Saving client/subscription info plist"), 1);
    ministry().saveSubscriptionsSoon();
    clock.advanceBy(60);
    EXPECT_EQ(log.count("Saving client/subscription info plist"), 2);
}

TEST_F(SavingTest, LeavesAMarkUntilItIsDone) {
    ministry().saveSubscriptionsSoon();
    EXPECT_TRUE(has(".clients-changed"));
    ministry().saveSubscriptionsSoon();
    clock.advanceBy(5);
    EXPECT_TRUE(has("Clients.plist"));
    EXPECT_FALSE(has(".clients-changed"));
}

TEST_F(SavingTest, LeavesTheMarkIfItFails) {
    ministry().saveSubscriptionsSoon();
    {
        const Support::FileSizeLimit full(16);
        ministry().saveSubscriptions();
    }
    EXPECT_EQ(log.count("Could not write file://"), 1);
    EXPECT_TRUE(has(".clients-changed"));
    ministry().saveSubscriptions();
    EXPECT_FALSE(has(".clients-changed"));
}

TEST_F(SavingTest, GoesOnWhereItCanLeaveNoMark) {
    std::filesystem::remove(storage());
    ministry().saveSubscriptionsSoon();
    EXPECT_EQ(log.count("Could not write file://"), 1);
    std::filesystem::create_directory(storage());
    clock.advanceBy(5);
    EXPECT_TRUE(has("Clients.plist"));
    EXPECT_EQ(log.count("Unable to delete"), 0);
}

TEST_F(SavingTest, GoesOnWhereItCannotTakeTheMarkOff) {
    std::filesystem::create_directory(storage() / ".clients-changed");
    ministry().saveSubscriptionsSoon();
    clock.advanceBy(5);
    EXPECT_TRUE(has("Clients.plist"));
    EXPECT_EQ(log.count("Unable to delete <file://"), 1);
}

TEST_F(TruthDirectoryTest, IsTakenAwayAtOnceAndDeleted) {
    writeFile("Feeds/abc/1.xml", "<item/>");
    writeFile("Feeds/abcd/1.xml", "<item/>");
    URL* directory = urlOf("Feeds/abc", true);
    ministry().deleteTruthDirectoryForFeed(nullptr, directory);
    EXPECT_FALSE(has("Feeds/abc"));
    waitUntilDeleted();
    EXPECT_FALSE(has("Feeds/abc.deleted.at.788918400.000000"));
    EXPECT_TRUE(has("Feeds/abcd/1.xml"));
}

TEST_F(TruthDirectoryTest, KeepsItsFilesUntilTheDeletionOfItsFeedIsCommitted) {
    makeFeed("abc", false);
    writeFile("Feeds/abc/1.xml", "<item/>");
    ministry().openDatabase();
    {
        const SQLite::Transaction transaction(true);
        ministry().deleteTruthDirectoryForFeed(nullptr, urlOf("Feeds/abc", true));
        EXPECT_FALSE(FileUtils::isDeletingFilesAsynchronously());
        EXPECT_TRUE(has("Feeds/abc.deleted.at.788918400.000000/1.xml"));
        db().execute("delete from Entries");
        db().execute("delete from Feeds");
    }
    EXPECT_TRUE(Support::turnUntil([&] { return !has("Feeds/abc.deleted.at.788918400.000000"); }));
    EXPECT_FALSE(has("Feeds/abc"));
    waitUntilDeleted();
}

TEST_F(TruthDirectoryTest, ComesBackWhereItsEntriesWaitToBeRead) {
    makeFeed("abc", true);
    ministry().openDatabase();
    db().execute("update Feeds set recoverOldEntries=1");
    db().close(true);
    writeFile("Feeds/abc.deleted.at.5.000000/1.xml", "<item/>");
    ministry().openDatabase();
    EXPECT_EQ(readFile("Feeds/abc/1.xml"), "<item/>");
}

TEST_F(TruthDirectoryTest, ComesBackWhereTheDeletionOfItsFeedFails) {
    makeFeed("abc", false);
    writeFile("Feeds/abc/1.xml", "<item/>");
    ministry().openDatabase();
    try {
        const SQLite::Transaction transaction(true);
        ministry().deleteTruthDirectoryForFeed(nullptr, urlOf("Feeds/abc", true));
        EXPECT_FALSE(has("Feeds/abc"));
        throw std::runtime_error("no commit");
    } catch (const std::runtime_error&) {
        EXPECT_TRUE(Support::turnUntil([&] { return has("Feeds/abc"); }));
    }
    EXPECT_EQ(readFile("Feeds/abc/1.xml"), "<item/>");
}

TEST_F(TruthDirectoryTest, HasTheTimeInTheNameThatItIsDeletedUnder) {
    writeFile("Feeds/abc/1.xml", "<item/>");
    // Taken already: the rename fails, and tells by which name.
    writeFile("Feeds/abc.deleted.at.788918400.000000/1.xml", "<item/>");
    URL* directory = urlOf("Feeds/abc", true);
    ministry().deleteTruthDirectoryForFeed(nullptr, directory);
    EXPECT_TRUE(has("Feeds/abc/1.xml"));
    EXPECT_EQ(log.count("Could not take the directory file://"), 1);
    EXPECT_FALSE(FileUtils::isDeletingFilesAsynchronously());
}

TEST_F(TruthDirectoryTest, IsDeletedByTheNextStartIfItWasLeft) {
    writeFile("Feeds/abc.deleted.at.5.000000/1.xml", "<item/>");
    writeFile("Feeds/abc/2.xml", "<item/>");
    writeFile("Feeds/note.deleted.at.5.000000", "no directory");
    makeFeed("abc", false);
    makeFeed("def", true);
    writeFile("Feeds/def.deleted.at.5.000000/1.xml", "<item/>");
    ministry().openDatabase();
    waitUntilDeleted();
    EXPECT_FALSE(has("Feeds/abc.deleted.at.5.000000"));
    EXPECT_FALSE(has("Feeds/def.deleted.at.5.000000"));
    EXPECT_FALSE(has("Feeds/def"));
    EXPECT_TRUE(has("Feeds/abc/2.xml"));
    EXPECT_TRUE(has("Feeds/note.deleted.at.5.000000"));
}

TEST_F(TruthDirectoryTest, ComesBackWhereTheDeletionOfItsFeedWasNotCommitted) {
    makeFeed("abc", false);
    writeFile("Feeds/abc.deleted.at.5.000000/1.xml", "<item/>");
    writeFile("Feeds/abc.deleted.at.6.000000/2.xml", "<item/>");
    ministry().openDatabase();
    waitUntilDeleted();
    EXPECT_EQ(readFile("Feeds/abc/1.xml"), "<item/>");
    EXPECT_FALSE(has("Feeds/abc.deleted.at.5.000000"));
    EXPECT_FALSE(has("Feeds/abc.deleted.at.6.000000"));
}

TEST_F(TruthDirectoryTest, MayBeNone) {
    ministry().deleteTruthDirectoryForFeed(nullptr, nullptr);
    EXPECT_FALSE(FileUtils::isDeletingFilesAsynchronously());
    EXPECT_TRUE(log.lines().empty());
}
