// The documents of a feed, one after the other, from their bytes to the rows and files.

#include "FeedParser/ReplayTest.h"
#include "Foundation/ArrayOf.h"

using namespace Foundation;
using namespace Orvane;
using namespace SQLite;

namespace {

class Replay : public ReplayTest {};

}  // namespace

TEST_F(Replay, OfAFeedThatGrows) {
    EXPECT_EQ(read({{"b", "Two"}, {"a", "One"}}), "changed 0 2 0");
    EXPECT_EQ(titles(), "One Two ");
    EXPECT_EQ(text(feed->mTitle), "News");
    EXPECT_EQ(feed->mFeedFormat.getValue(), 1);
    EXPECT_EQ(read({{"b", "Two"}, {"a", "One"}}), "same 0 0 0");
    EXPECT_EQ(read({{"c", "Three"}, {"b", "Two"}, {"a", "One"}}), "changed 0 1 0");
    EXPECT_EQ(titles(), "One Two Three ");
    EXPECT_EQ(subscription->mUnreadCount.getValue(), 3);
}

TEST_F(Replay, OfAnEntryThatLeavesAndReturns) {
    read({{"b", "Two"}, {"a", "One"}});
    entry("a")->setRead(true);
    EXPECT_EQ(read({{"b", "Two"}}), "changed 0 0 1");
    EXPECT_EQ(stateOf("a"), "archived read file");
    EXPECT_EQ(readFileOf("a"), text(entry("a")->getXMLRepresentation()->mData));
    EXPECT_EQ(read({{"b", "Two"}, {"a", "One"}}), "changed 1 0 0");
    EXPECT_EQ(stateOf("a"), "current read");
}

TEST_F(Replay, OfGUIDsThatChangeTheirScheme) {
    read({{"http://example.org/1", "One"}});
    EXPECT_EQ(read({{"https://example.org/1", "One"}}), "changed 0 1 1");
    EXPECT_EQ(stateOf("http://example.org/1"), "archived file");
    EXPECT_EQ(stateOf("https://example.org/1"), "current");
}

TEST_F(Replay, OfADateThatMoves) {
    read({{"a"}});
    EXPECT_EQ(read({{"a", "Title", "Wed, 07 Jun 2006 10:00:00 GMT"}}), "changed 1 0 0");
    EXPECT_EQ(Date::getAbsoluteTime(entry("a")->mDatePublished), 171367200);
    EXPECT_EQ(count("Entries"), 1);
}

TEST_F(Replay, OfAnEnclosureWhoseLengthChanges) {
    read({{"a", "Title", "Tue, 06 Jun 2006 10:00:00 GMT", 100}});
    db().execute("update Enclosures set downloadState=3");
    TableOf<EnclosureCore>::instance()->uncacheRows();
    EXPECT_EQ(read({{"a", "Title", "Tue, 06 Jun 2006 10:00:00 GMT", 200}}), "changed 1 0 0");
    EXPECT_EQ(count("Enclosures where length=200 and downloadState=3"), 1);
    EXPECT_EQ(count("Enclosures"), 1);
    EXPECT_EQ(read({{"a"}}), "changed 1 0 0");
    EXPECT_EQ(count("Enclosures"), 0);
}

TEST_F(Replay, OfAGhostThatItsFeedBrings) {
    EntryCore* ghost = EntryCore::createGhostEntry(string(identifierOf("a")));
    ghost->mRead.setValue(true);
    ghost->saveChanges();
    EXPECT_EQ(read({{"a", "One"}}), "changed 0 1 0");
    EXPECT_EQ(stateOf("a"), "current read");
    EXPECT_EQ(titles(), "One ");
}

TEST_F(Replay, OfOneGUIDForTwoEntries) {
    EXPECT_EQ(read({{"a", "One"}, {"a", "Two"}}), "changed 0 1 0");
    EXPECT_EQ(titles(), "One ");
}

TEST_F(Replay, OfTheSameSourceUnderTwoGUIDs) {
    EXPECT_EQ(read({{"a", "One"}}), "changed 0 1 0");
    FeedCore* parsed = parse({{"a", "One"}, {"b", "Two"}});
    const auto& rows = parsed->mEntries.getNewRows();
    static_cast<EntryCore&>(*rows[1]).setXMLRepresentation(
        static_cast<EntryCore&>(*rows[0]).getXMLRepresentation());
    EXPECT_EQ(merge(parsed), "same 0 0 0");
    EXPECT_EQ(stateOf("b"), "none");
    // It comes once it has a source of its own.
    EXPECT_EQ(read({{"a", "One"}, {"b", "Two"}}), "changed 0 1 0");
    EXPECT_EQ(stateOf("b"), "current");
}

TEST_F(Replay, BringsArchivedEntriesBackFromTheirFiles) {
    read({{"b", "Two"}, {"a", "One"}});
    read({{"b", "Two"}});
    db().execute("delete from Entries where current=0");
    TableOf<EntryCore>::instance()->uncacheRows();
    feed->mRecoverOldEntries.setValue(true);
    EXPECT_EQ(feed->getEntries(nullptr).allRows()->count(), 2U);
    EXPECT_EQ(stateOf("a"), "archived read file");
    EXPECT_EQ(text(entry("a")->mTitle), "One");
    EXPECT_EQ(text(entry("a")->getContent()->mData), "Text of a");
    EXPECT_EQ(log.count("Unable to recover"), 0);
}
