// Which entries go because they are old, and what goes with them.

#include "Agent/Work/HygieneTest.h"
#include "Model/EntryCore.h"
#include "SQLite/Exception.h"
#include "SQLite/TableOf.h"

#include <gmock/gmock.h>

using namespace Foundation;
using namespace Orvane;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using Strings = std::vector<std::string>;

namespace {

class ExpiredEntriesTest : public AgentHygieneTest {};

}  // namespace

TEST_F(ExpiredEntriesTest, KeepsEntriesOfTheDocumentAndFlaggedOnes) {
    start();
    const long long feed = feedExpiring({1000.0});
    entry(feed, "old", 999);
    entry(feed, "current", 999, true);
    entry(feed, "flagged", 999, false, true);
    entry(feed, "new", 1000);
    EXPECT_EQ(task->expungeOldArticles(), 5);
    EXPECT_THAT(titles(), ElementsAre("current", "flagged", "new"));
}

TEST_F(ExpiredEntriesTest, KeepsWhatTheMostPatientSubscriberKeeps) {
    start();
    const long long feed = feedExpiring({2000.0, 1000.0});
    entry(feed, "older", 999);
    entry(feed, "between", 1500);
    entry(feed, "newer", 2500);
    task->expungeOldArticles();
    EXPECT_THAT(titles(), ElementsAre("between", "newer"));
}

TEST_F(ExpiredEntriesTest, LeavesSubscriptionsWithoutADateOut) {
    start();
    const long long feed = feedExpiring({std::nullopt, 1000.0});
    entry(feed, "old", 999);
    task->expungeOldArticles();
    EXPECT_THAT(titles(), IsEmpty());
}

TEST_F(ExpiredEntriesTest, KeepsAllForASubscriptionThatNeverLetsGo) {
    start();
    // How a row without a date is stored.
    const long long feed = feedExpiring({0.0, 1000.0});
    entry(feed, "old", 999);
    EXPECT_EQ(task->expungeOldArticles(), 0);
    EXPECT_THAT(titles(), ElementsAre("old"));
}

TEST_F(ExpiredEntriesTest, KeepsEntriesOfFeedsThatNobodySubscribesTo) {
    start();
    entry(feedExpiring({}), "old", 999);
    EXPECT_EQ(task->expungeOldArticles(), 0);
}

TEST_F(ExpiredEntriesTest, DeletesEnclosuresContentsAndFiles) {
    start();
    const long long feed = feedExpiring({1000.0});
    const long long other = feedExpiring({1000.0});
    entry(feed, "old1", 999);
    entry(other, "old2", 999);
    entry(feed, "new", 1001);
    writeFile("Downloads/old.mp3", "sound");
    writeFile("Downloads/new.mp3", "sound");
    const auto download = [&](const char* file, const char* name) {
        const Ref<String> location = urlOf(file)->getString();
        db().execute("update Enclosures set downloadedPath='%s' where url='http://e.org/%s'",
                     location->utf8(), name);
    };
    download("Downloads/old.mp3", "old1");
    download("Downloads/new.mp3", "new");
    for (const char* name : {"feed1/old1", "feed1/new", "feed2/old2"})
        writeFile(std::string("Feeds/") + name + ".xml", "<item/>");

    EXPECT_EQ(task->expungeOldArticles(), 2 + 2 + 6);
    EXPECT_FALSE(has("Downloads/old.mp3"));
    EXPECT_TRUE(has("Downloads/new.mp3"));
    waitForDeletions();
    EXPECT_FALSE(has("Feeds/feed1/old1.xml"));
    EXPECT_FALSE(has("Feeds/feed2/old2.xml"));
    EXPECT_TRUE(has("Feeds/feed1/new.xml"));
    EXPECT_EQ(rows("select url from Enclosures"), (Strings{"http://e.org/new"}));
    EXPECT_EQ(rows("select rowID from Contents"), (Strings{"9", "10", "11"}));
    EXPECT_TRUE(log.contains("[Agent] Deleted 2 entries, 6 contents, 2 enclosures"));
}

TEST_F(ExpiredEntriesTest, MakesNoDirectoryForFilesThatAreNotThere) {
    start();
    entry(feedExpiring({1000.0}), "old", 999);
    log.clear();
    task->expungeOldArticles();
    waitForDeletions();
    EXPECT_FALSE(has("Feeds/feed1"));
    EXPECT_FALSE(log.contains("WARNING")) << testing::PrintToString(log.lines());
}

TEST_F(ExpiredEntriesTest, IsNotStoppedByAnIdentifierThatIsNoFilesName) {
    start();
    const long long feed = feedExpiring({1000.0});
    entry(feed, "../odd", 999);
    entry(feed, "old", 999);
    writeFile("Feeds/feed1/old.xml", "<item/>");
    EXPECT_EQ(task->expungeOldArticles(), 10);
    waitForDeletions();
    EXPECT_FALSE(has("Feeds/feed1/old.xml"));
    EXPECT_TRUE(log.contains("int Orvane::AgentTask::expungeOldArticles()"));
    EXPECT_THAT(titles(), IsEmpty());
}

TEST_F(ExpiredEntriesTest, PassesOverEntriesWithoutAnIdentifier) {
    start();
    entry(feedExpiring({1000.0}), "old", 999);
    db().execute("update Entries set identifier=null");
    writeFile("Feeds/feed1/other.xml", "<item/>");
    EXPECT_EQ(task->expungeOldArticles(), 5);
    EXPECT_FALSE(log.contains("WARNING")) << testing::PrintToString(log.lines());
}

TEST_F(ExpiredEntriesTest, BustsGhostsOfMoreThanTwoDaysEvenWhereNothingExpires) {
    start();
    entry(0, "old ghost", clock.now() - 172801);
    entry(0, "new ghost", clock.now() - 172800);
    EXPECT_EQ(task->expungeOldArticles(), 1);
    EXPECT_THAT(titles(), ElementsAre("new ghost"));
    // Nothing has expired, and so nothing else is looked for.
    EXPECT_FALSE(log.contains("Deleted "));
    EXPECT_EQ(count("Enclosures"), 2);
    EXPECT_EQ(count("Contents"), 6);
}

TEST_F(ExpiredEntriesTest, CountsGhostsWithTheRest) {
    start();
    entry(feedExpiring({1000.0}), "old", 999);
    entry(0, "ghost", 999);
    EXPECT_EQ(task->expungeOldArticles(), 6);
}

TEST_F(ExpiredEntriesTest, ForgetsTheRowsInMemory) {
    start();
    entry(feedExpiring({1000.0}), "old", 999);
    const auto query = SQLite::TableOf<EntryCore>::instance()->allRows();
    const Ref<EntryCore> held = query->firstRow();
    ASSERT_TRUE(held->isCached());
    task->expungeOldArticles();
    EXPECT_FALSE(held->isCached());
    EXPECT_EQ(SQLite::TableOf<EntryCore>::instance()->getCachedRowCount(), 0u);
}

TEST_F(ExpiredEntriesTest, LeavesNothingHalfDoneBehindAFailure) {
    start();
    entry(feedExpiring({1000.0}), "old", 999);
    db().execute("alter table Contents rename to Hidden");
    EXPECT_THROW(task->expungeOldArticles(), SQLite::Exception);
    EXPECT_THAT(titles(), ElementsAre("old"));
    EXPECT_EQ(count("Enclosures"), 1);
    db().execute("alter table Hidden rename to Contents");
    EXPECT_EQ(task->expungeOldArticles(), 5);
    EXPECT_EQ(count("sqlite_temp_master"), 0);
}

TEST_F(ExpiredEntriesTest, TellsClientsOnlyOfTablesThatTheyHave) {
    start();
    entry(feedExpiring({1000.0}), "old", 999);
    platform.posts.clear();
    task->expungeOldArticles();
    ASSERT_EQ(platform.posts.size(), 1u);
    const std::string changes = describeForFormat(platform.posts[0].info.get());
    EXPECT_THAT(changes, HasSubstr("Entries"));
    EXPECT_THAT(changes, testing::Not(HasSubstr("ExpiredEntries")));
}
