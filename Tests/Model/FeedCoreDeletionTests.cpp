#include "Foundation/Logger.h"
#include "Model/ContentCore.h"
#include "Model/EnclosureCore.h"
#include "Model/FeedCore.h"
#include "Model/FeedTest.h"
#include "Utilities/FileDeletionQueue.h"

using namespace Foundation;
using namespace Orvane;
using namespace SQLite;
using Support::LoggingOn;

namespace {

class FeedCoreDeletion : public FeedTest {
 protected:
    /// A stored entry with a content, a source and an enclosure.
    static EntryCore* storedEntry(FeedCore* feed, const char* id) {
        EntryCore* entry = row<EntryCore>();
        entry->mID.setValue(string(id));
        feed->addToEntries(entry);
        entry->getIdentifier();
        entry->setContentColumn("content", string("text/plain"), data("text"));
        entry->setContentColumn("XMLRepresentation", string("text/xml"), data("<entry/>"));
        EnclosureCore* enclosure = row<EnclosureCore>();
        enclosure->mURL.setValue(url("http://example.org/file"));
        entry->addToEnclosures(enclosure);
        entry->saveChanges();
        return entry;
    }
    static std::string counts() {
        std::string text;
        for (const char* table : {"Feeds", "Entries", "Contents", "Enclosures"}) {
            text += std::to_string(count(table)) + " ";
        }
        return text;
    }
};

}  // namespace

TEST_F(FeedCoreDeletion, TakesItsEntriesAlong) {
    const LoggingOn on({});
    FeedCore* feed = storedFeed();
    FeedCore* other = storedFeed("http://example.org/other");
    storedEntry(feed, "a");
    storedEntry(feed, "b");
    storedEntry(other, "c");
    ASSERT_EQ(counts(), "2 3 6 3 ");
    const std::string name = text(feed->toString());
    log.clear();
    feed->deleteRow();
    EXPECT_EQ(counts(), "1 1 2 1 ");
    EXPECT_EQ(feed->getRowID(), 0);
    EXPECT_EQ(log.count("Deleting " + name), 1);
    EXPECT_EQ(log.count("    deleted 4 Contents (duration=0.000s)"), 1);
    EXPECT_EQ(log.count("    deleted 2 Enclosures (duration=0.000s)"), 1);
    EXPECT_EQ(log.count("    deleted 2 Entries (duration=0.000s)"), 1);
    EXPECT_EQ(log.count("    delegated deletion of truth directory (duration=0.000s)"), 1);
}

TEST_F(FeedCoreDeletion, TakesItsFilesAlong) {
    FeedCore* feed = storedFeed();
    feed->setXMLData(data("<rss/>"));
    feed->saveEntryToFile(string("abc"), data("<entry/>"));
    ASSERT_TRUE(exists(truth(kIdentifier)));
    feed->deleteRow();
    EXPECT_FALSE(exists(truth(kIdentifier)));
    EXPECT_FALSE(exists(truth(std::string(kIdentifier) + ".xml")));
    EXPECT_EQ(feed->getURLOfEntryXMLDir(true), nullptr);
}

TEST_F(FeedCoreDeletion, EndsItsFeeder) {
    FakeFeeders feeders;
    FeedCore* feed = storedFeed();
    feed->getFeeder();
    feed->deleteRow();
    EXPECT_EQ(feeders.feeder->calls, "removed ");
}

TEST_F(FeedCoreDeletion, IsHeardOfByEntriesInMemory) {
    db().setPostsNotifications(true);
    FeedCore* feed = storedFeed();
    EntryCore* entry = storedEntry(feed, "a");
    clock.advanceBy(1);
    ASSERT_TRUE(entry->isCached());
    feed->deleteRow();
    // As any change it is announced in the next turn of the loop.
    clock.advanceBy(1);
    EXPECT_FALSE(entry->isCached());
    db().setPostsNotifications(false);
}

TEST_F(FeedCoreDeletion, TakesEntriesAlongThatAreNotSaved) {
    FeedCore* feed = storedFeed();
    EntryCore* entry = row<EntryCore>();
    feed->addToEntries(entry);
    entry->addToTable(TableOf<EntryCore>::instance());
    feed->deleteRow();
    db().saveRows();
    EXPECT_EQ(counts(), "0 0 0 0 ");
    EXPECT_EQ(entry->getTable(), nullptr);
}

TEST_F(FeedCoreDeletion, WorksInMemory) {
    FeedCore* feed = freeFeed();
    feed->setXMLData(data("<rss/>"));
    feed->addToEntries(row<EntryCore>());
    feed->deleteRow();
    Data* none = feed->getXMLData();
    EXPECT_EQ(none, nullptr);
}

TEST_F(FeedCoreDeletion, GoesOnBehindAPartThatFails) {
    FeedCore* feed = storedFeed();
    storedEntry(feed, "a");
    db().execute(
        "create trigger Refuse before delete on Contents begin select raise(abort, 'refused'); "
        "end");
    feed->deleteRow();
    db().execute("drop trigger Refuse");
    EXPECT_EQ(counts(), "0 0 2 0 ");
    EXPECT_EQ(log.count("virtual void Orvane::FeedCore::deleteRow()"), 1);
}
