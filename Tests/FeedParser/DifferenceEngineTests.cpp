#include "FeedParser/DifferenceEngine.h"

#include "FeedParser/MergeTest.h"
#include "Foundation/AssertionFailure.h"
#include "Foundation/Logger.h"
#include "SQLite/Exception.h"

#include <stdexcept>

using namespace Foundation;
using namespace Orvane;
using namespace SQLite;
using Support::LoggingOn;

namespace {

class DifferenceEngineTest : public MergeTest {
 protected:
    /// Makes saving an entry of the title "bad" fail, until it is dropped.
    static void refuseBadTitles() {
        for (const char* event : {"insert", "update"}) {
            db().execute(
                "create trigger Refuse_%s before %s on Entries when NEW.title='bad' begin "
                "select raise(abort, 'refused'); end",
                event, event);
        }
    }
    static void acceptAll() {
        db().execute("drop trigger Refuse_insert; drop trigger Refuse_update");
    }
};

}  // namespace

TEST_F(DifferenceEngineTest, AddsTheEntriesOfTheFirstDocumentTheOldestFirst) {
    EXPECT_EQ(merge({{"c", "Three"}, {"b", "Two"}, {"a", "One"}}), "changed 0 3 0");
    EXPECT_EQ(titles(), "One Two Three ");
    EXPECT_EQ(stateOf("a"), "current");
    EXPECT_EQ(Date::getAbsoluteTime(entry("c")->mLocalDateCreated), clock.now() - 0.01);
    EXPECT_DOUBLE_EQ(Date::getAbsoluteTime(entry("a")->mLocalDateCreated), clock.now() - 0.03);
    EXPECT_EQ(Date::getAbsoluteTime(entry("a")->mLocalDateUpdated), clock.now());
    EXPECT_EQ(Date::getAbsoluteTime(entry("a")->mLocalDateXMLChanged), clock.now());
    EXPECT_EQ(Date::getAbsoluteTime(feed->mLocalDateUpdated), clock.now());
    EXPECT_EQ(text(feed->mTitle), "News");
    EXPECT_EQ(subscription->mUnreadCount.getValue(), 3);
    EXPECT_FALSE(feed->isChanged());
    EXPECT_EQ(count("Contents"), 3);
    EXPECT_FALSE(exists(truth(kIdentifier)));
}

TEST_F(DifferenceEngineTest, LogsWhatItDoes) {
    merge({{"a", "One"}, {"b", "Two"}});
    const LoggingOn on({&gLogSub});
    log.clear();
    merge({{"b", "New"}, {"c", "Three"}});
    EXPECT_EQ(log.lines().front(), "[Sub] DifferenceEngine updating feed http://example.org/feed");
    EXPECT_EQ(log.count("[Sub] \tDifferenceEngine: updated 1, added 1, archived 1 articles in "
                        "<http://example.org/feed>"),
              1);
}

TEST_F(DifferenceEngineTest, LoadsNoEntryThatHasNotChanged) {
    merge({{"a", "One"}, {"b", "Two"}});
    TableOf<EntryCore>::instance()->uncacheRows();
    const double before = clock.now();
    clock.advanceBy(10);
    const LoggingOn on({&gLogPersist, &gLogSub});
    FeedCore* parsed = document({{"a", "One"}, {"b", "Two"}});
    parsed->mTitle.setValue(string("Renamed"));
    log.clear();
    EXPECT_EQ(merge(parsed), "same 0 0 0");
    EXPECT_EQ(log.count("Instantiated row "), 0);
    EXPECT_EQ(log.count("Comparing entry"), 0);
    EXPECT_EQ(Date::getAbsoluteTime(feed->mLocalDateUpdated), before);
    EXPECT_EQ(count("Feeds where title='News'"), 1);
    clock.advanceBy(Database::kSaveDelaySeconds);
    EXPECT_EQ(count("Feeds where title='Renamed'"), 1);
}

TEST_F(DifferenceEngineTest, UpdatesWhatHasChanged) {
    merge({{"a", "One"}, {"b", "Two"}});
    entry("a")->setRead(true);
    entry("a")->setFlagged(true);
    const double created = Date::getAbsoluteTime(entry("a")->mLocalDateCreated);
    clock.advanceBy(10);
    EXPECT_EQ(merge({{"a", "Mended"}, {"b", "Two"}}), "changed 1 0 0");
    EXPECT_EQ(text(entry("a")->mTitle), "Mended");
    EXPECT_EQ(stateOf("a"), "current read flagged");
    EXPECT_EQ(Date::getAbsoluteTime(entry("a")->mLocalDateCreated), created);
    EXPECT_EQ(Date::getAbsoluteTime(entry("a")->mLocalDateUpdated), clock.now());
    EXPECT_EQ(Date::getAbsoluteTime(entry("b")->mLocalDateUpdated), clock.now() - 10);
    EXPECT_EQ(Date::getAbsoluteTime(feed->mLocalDateUpdated), clock.now());
    EXPECT_EQ(text(entry("a")->getXMLRepresentation()->mData),
              "<item><guid>a</guid><title>Mended</title></item>");
    EXPECT_EQ(count("Contents"), 2);
}

TEST_F(DifferenceEngineTest, DatesAChangeOfTheSourceAlone) {
    merge({{"a", "One"}});
    clock.advanceBy(10);
    EXPECT_EQ(merge({{"a", "One", "<extra/>"}}), "changed 1 0 0");
    EXPECT_EQ(Date::getAbsoluteTime(entry("a")->mLocalDateUpdated), clock.now() - 10);
    EXPECT_EQ(Date::getAbsoluteTime(entry("a")->mLocalDateXMLChanged), clock.now());
}

TEST_F(DifferenceEngineTest, TakesOverADateThatMoved) {
    merge({{"a", "One", "<date>1</date>"}});
    EXPECT_EQ(merge({{"a", "One", "<date>2</date>", true, 6000}}), "changed 1 0 0");
    EXPECT_EQ(Date::getAbsoluteTime(entry("a")->mDatePublished), 6000);
}

TEST_F(DifferenceEngineTest, TakesOverTheLengthOfAnEnclosureWithItsState) {
    merge({{"a", "One", "", true, 5000, 100}});
    const Ref<EnclosureCore> enclosure = entry("a")->getEnclosures(nullptr).getRow();
    enclosure->mDownloadState.setValue(3);
    enclosure->saveChanges();
    EXPECT_EQ(merge({{"a", "One", "", true, 5000, 200}}), "changed 1 0 0");
    EXPECT_EQ(enclosure->mLength.getValue(), 200);
    EXPECT_EQ(count("Enclosures where length=200 and downloadState=3"), 1);
    EXPECT_EQ(count("Enclosures"), 1);
}

TEST_F(DifferenceEngineTest, ArchivesWhatHasLeftTheDocument) {
    merge({{"b", "Two"}, {"a", "One"}});
    entry("a")->setFlagged(true);
    clock.advanceBy(10);
    EXPECT_EQ(merge({{"c", "Three"}, {"b", "Two"}}), "changed 0 1 1");
    EXPECT_EQ(stateOf("a"), "archived flagged file");
    EXPECT_EQ(stateOf("b"), "current");
    EXPECT_EQ(readFileOf("a"), "<item><guid>a</guid><title>One</title></item>");
    EXPECT_EQ(Date::getAbsoluteTime(entry("a")->mLocalDateUpdated), clock.now() - 10);
    EXPECT_EQ(subscription->mUnreadCount.getValue(), 3);
    EXPECT_EQ(merge({{"c", "Three"}, {"b", "Two"}}), "same 0 0 0");
}

TEST_F(DifferenceEngineTest, DoesNotArchiveWhatHasNoSource) {
    EntryCore* bare = row<EntryCore>();
    bare->mID.setValue(string("bare"));
    bare->mCurrent.setValue(true);
    feed->addToEntries(bare);
    bare->getIdentifier();
    bare->saveChanges();
    EXPECT_EQ(merge({{"a", "One"}}), "changed 0 1 0");
    EXPECT_EQ(stateOf("bare"), "current");
}

TEST_F(DifferenceEngineTest, TakesBackAnEntryThatReturns) {
    merge({{"b", "Two"}, {"a", "One"}});
    entry("a")->setRead(true);
    merge({{"b", "Two"}});
    ASSERT_EQ(stateOf("a"), "archived read file");
    clock.advanceBy(10);
    EXPECT_EQ(merge({{"b", "Two"}, {"a", "One"}}), "changed 1 0 0");
    EXPECT_EQ(stateOf("a"), "current read");
    EXPECT_EQ(Date::getAbsoluteTime(entry("a")->mLocalDateUpdated), clock.now());
    EXPECT_EQ(count("Entries"), 2);
}

TEST_F(DifferenceEngineTest, SeesThatAnEntryInMemoryIsArchived) {
    merge({{"b", "Two"}, {"a", "One"}});
    const Ref<EntryCore> held = entry("a");
    EXPECT_TRUE(held->mCurrent);
    merge({{"b", "Two"}});
    EXPECT_FALSE(held->mCurrent);
    merge({{"b", "Two"}, {"a", "One"}});
    EXPECT_TRUE(held->mCurrent);
    EXPECT_EQ(count("Entries where current"), 2);
    EXPECT_FALSE(exists(fileOf("a")));
}

TEST_F(DifferenceEngineTest, TakesANewGUIDForANewEntry) {
    merge({{"http://example.org/1", "One"}, {"http://example.org/2", "Two"}});
    entry("http://example.org/1")->setRead(true);
    EXPECT_EQ(merge({{"https://example.org/1", "One"}, {"https://example.org/2", "Two"}}),
              "changed 0 2 2");
    EXPECT_EQ(stateOf("http://example.org/1"), "archived read file");
    EXPECT_EQ(stateOf("https://example.org/1"), "current");
    EXPECT_EQ(subscription->mUnreadCount.getValue(), 3);
}

TEST_F(DifferenceEngineTest, TakesTheFirstOfTwoEntriesOfTheSameGUID) {
    EXPECT_EQ(merge({{"a", "One"}, {"a", "Two"}}), "changed 0 1 0");
    EXPECT_EQ(titles(), "One ");
}

TEST_F(DifferenceEngineTest, IgnoresTheSecondOfTwoEntriesOfTheSameSource) {
    FeedCore* parsed = document({{"a", "One"}, {"b", "Two"}});
    EntryCore* second = parsed->mEntries.getNewRows().empty()
                            ? nullptr
                            : static_cast<EntryCore*>(parsed->mEntries.getNewRows()[1].get());
    second->setXMLRepresentation(
        static_cast<EntryCore*>(parsed->mEntries.getNewRows()[0].get())->getXMLRepresentation());
    EXPECT_EQ(merge(parsed), "changed 0 1 0");
    EXPECT_EQ(titles(), "One ");
}

TEST_F(DifferenceEngineTest, PrunesByTheSourceAloneWhoeverHasIt) {
    const std::string source = sourceOf({"a", "One"});
    merge({{"a", "One"}});
    FeedCore* parsed = document({{"a", "Mended"}, {"b", "Two"}});
    static_cast<EntryCore*>(parsed->mEntries.getNewRows()[1].get())
        ->setContentColumn("XMLRepresentation", string("application/rss+xml"), data(source));
    EXPECT_EQ(merge(parsed), "changed 1 0 0");
    EXPECT_EQ(titles(), "Mended ");
}

TEST_F(DifferenceEngineTest, ArchivesNothingForADocumentWithoutEntries) {
    merge({{"a", "One"}});
    const LoggingOn on({});
    clock.advanceBy(10);
    FeedCore* empty = document({});
    empty->mTitle.setValue(string("Renamed"));
    EXPECT_EQ(merge(empty), "same 0 0 0");
    EXPECT_EQ(stateOf("a"), "current");
    EXPECT_EQ(text(feed->mTitle), "Renamed");
    EXPECT_EQ(log.lines().back(),
              "DifferenceEngine: Found zero articles in http://example.org/feed");
    Post bare{"b", "Two"};
    bare.hasSource = false;
    EXPECT_EQ(merge({bare}), "same 0 0 0");
    EXPECT_EQ(stateOf("a"), "current");
    EXPECT_EQ(stateOf("b"), "none");
}

TEST_F(DifferenceEngineTest, LooksAtNoEntryWhileTheDateOfTheDocumentRemains) {
    FeedCore* first = document({{"a", "One"}});
    first->mDateUpdated.setValue(date(7000));
    EXPECT_EQ(merge(first), "changed 0 1 0");
    FeedCore* second = document({{"b", "Two"}});
    second->mDateUpdated.setValue(date(7000));
    EXPECT_EQ(merge(second), "same 0 0 0");
    EXPECT_EQ(titles(), "One ");
    EXPECT_EQ(merge(second, true), "changed 0 1 1");
}

TEST_F(DifferenceEngineTest, AdoptsAGhostWithItsFlags) {
    for (const bool isSaved : {true, false}) {
        const char* guid = isSaved ? "a" : "b";
        EntryCore* ghost = EntryCore::createGhostEntry(string(identifierOf(guid)));
        ghost->mRead.setValue(true);
        ghost->mFlagged.setValue(true);
        const double created = Date::getAbsoluteTime(ghost->mLocalDateCreated);
        ghost->addToTable(TableOf<EntryCore>::instance());
        if (isSaved) ghost->saveChanges();
        clock.advanceBy(10);
        EXPECT_EQ(merge({{guid, "One"}}), isSaved ? "changed 0 1 0" : "changed 0 1 1");
        EXPECT_EQ(stateOf(guid), "current read flagged");
        EXPECT_EQ(text(entry(guid)->mTitle), "One");
        EXPECT_EQ(entry(guid)->getFeed(), feed);
        EXPECT_EQ(Date::getAbsoluteTime(entry(guid)->mLocalDateCreated), created);
    }
    EXPECT_EQ(subscription->mUnreadCount.getValue(), 0);
    EXPECT_EQ(count("Entries where feed=1"), 2);
}

TEST_F(DifferenceEngineTest, AdoptsAnEntryWhoseFeedIsGone) {
    merge({{"a", "One"}});
    entry("a")->setRead(true);
    db().saveRows();
    TableOf<EntryCore>::instance()->uncacheRows();
    db().execute("update Entries set feed=99");
    EXPECT_EQ(merge({{"a", "One"}}), "changed 0 1 0");
    EXPECT_EQ(stateOf("a"), "current read");
    EXPECT_EQ(entry("a")->getFeed(), feed);
    EXPECT_EQ(count("Entries where feed=1"), 1);
}

TEST_F(DifferenceEngineTest, ComparesEveryEntryIfForced) {
    merge({{"a", "One"}, {"b", "Two"}});
    const LoggingOn on({&gLogSub});
    log.clear();
    EXPECT_EQ(merge({{"a", "One"}, {"b", "Two"}}, true), "same 0 0 0");
    EXPECT_EQ(log.count("Comparing entry"), 2);
}

TEST_F(DifferenceEngineTest, AnnouncesWhatItHasChanged) {
    db().setPostsNotifications(true);
    merge({{"a", "One"}});
    clock.advanceBy(1);
    ASSERT_EQ(platform.posts.size(), 1U);
    const auto* tables = platform.posts[0].info->getAs<Dictionary>("Entries");
    ASSERT_NE(tables, nullptr) << text(platform.posts[0].info->toString());
    db().setPostsNotifications(false);
}

TEST_F(DifferenceEngineTest, GivesEverythingUpIfItFails) {
    merge({{"b", "Two", "", true, 5000, 100}, {"a", "One"}});
    merge({{"b", "Two", "", true, 5000, 100}});
    ASSERT_EQ(stateOf("a"), "archived file");
    feed->mDateUpdated.setValue(date(1));
    feed->mRefreshETag.setValue(string("before"));
    db().saveRows();
    const double updated = Date::getAbsoluteTime(feed->mLocalDateUpdated);
    clock.advanceBy(10);
    refuseBadTitles();
    FeedCore* parsed = document({{"d", "Four", "", true, 5000, 300},
                                 {"c", "bad"},
                                 {"b", "Mended", "", true, 5000, 200},
                                 {"a", "One"}});
    parsed->mDateUpdated.setValue(date(2));
    EXPECT_THROW(merge(parsed), SQLite::Exception);
    EXPECT_EQ(Date::getAbsoluteTime(feed->mDateUpdated), 1);
    EXPECT_EQ(Date::getAbsoluteTime(feed->mLocalDateUpdated), updated);
    EXPECT_EQ(text(feed->mRefreshETag), "before");
    EXPECT_EQ(stateOf("a"), "archived file");
    // Nothing of it is saved later.
    db().saveRows();
    EXPECT_EQ(titles(), "One Two ");
    EXPECT_EQ(text(entry("b")->mTitle), "Two");
    EXPECT_EQ(entry("b")->getEnclosures(nullptr).getRow()->mLength.getValue(), 100);
    EXPECT_EQ(count("Contents"), 2);
    EXPECT_EQ(count("Enclosures"), 1);
    EXPECT_EQ(subscription->mUnreadCount.getValue(), 2);
    // The same document comes through once it can.
    acceptAll();
    EXPECT_EQ(merge(parsed), "changed 2 2 0");
    EXPECT_EQ(stateOf("a"), "current");
    EXPECT_EQ(titles(), "One Mended bad Four ");
    EXPECT_EQ(count("Contents"), 4);
    EXPECT_EQ(count("Enclosures"), 2);
    EXPECT_EQ(subscription->mUnreadCount.getValue(), 4);
}

TEST_F(DifferenceEngineTest, KeepsFilesThatItHasWrittenIfItFails) {
    merge({{"b", "Two"}, {"a", "One"}});
    refuseBadTitles();
    EXPECT_THROW(merge({{"b", "bad"}}), SQLite::Exception);
    EXPECT_EQ(stateOf("a"), "current file");
    acceptAll();
}

TEST_F(DifferenceEngineTest, PassesOnThatTheFeedIsAnother) {
    merge({{"a", "One"}});
    feed->mURL.setValue(url("http://example.org/moved"));
    FeedCore* parsed = document({{"a", "One"}});
    parsed->mURL.setValue(url("http://example.org/moved"));
    parsed->mIdentifier.setValue(nullptr);
    EXPECT_THROW(merge(parsed), std::runtime_error);
}

TEST_F(DifferenceEngineTest, MergesIntoAFeedInMemory) {
    FeedCore* inMemory = freeFeed();
    const auto mergeIt = [&](const std::vector<Post>& posts) {
        DifferenceEngine engine(inMemory, false);
        engine.updateFrom(document(posts));
        return OVFormat("%u %u %u", engine.getUpdatedCount(), engine.getAddedCount(),
                        engine.getArchivedCount());
    };
    const auto currentOf = [&] {
        std::string result;
        for (auto entry = inMemory->getEntries(nullptr); entry.hasRow(); entry.nextRow()) {
            result += text(entry->mTitle) + (entry->mCurrent ? " " : "- ");
        }
        return result;
    };
    EXPECT_EQ(mergeIt({{"b", "Two"}, {"a", "One"}}), "0 2 0");
    EXPECT_EQ(currentOf(), "One Two ");
    EXPECT_EQ(mergeIt({{"c", "Three"}, {"b", "Mended"}}), "1 1 0");
    EXPECT_EQ(currentOf(), "One- Mended Three ");
    // What is never saved stays changed, and so counts as updated each time.
    EXPECT_EQ(mergeIt({{"b", "Mended"}, {"a", "One"}}), "2 0 0");
    EXPECT_EQ(currentOf(), "One Mended Three- ");
    EXPECT_EQ(count("Entries"), 0);
    EXPECT_FALSE(exists(truth(text(inMemory->getIdentifier()))));
}

TEST_F(DifferenceEngineTest, ReplaysTheLifeOfAFeed) {
    struct Step {
        std::vector<Post> posts;
        const char* result;
        const char* unread;
    };
    const Step steps[] = {
        {{{"a", "A"}, {"b", "B"}, {"c", "C"}}, "changed 0 3 0", "3"},
        {{{"a", "A"}, {"b", "B"}, {"c", "C"}}, "same 0 0 0", "3"},
        {{{"d", "D"}, {"a", "A"}, {"b", "B"}}, "changed 0 1 1", "4"},
        {{{"c", "C2"}, {"d", "D"}, {"a", "A"}}, "changed 1 0 1", "4"},
        {{}, "same 0 0 0", "4"},
        {{{"e", "E"}}, "changed 0 1 3", "5"},
        {{{"a", "A"}, {"b", "B"}, {"c", "C2"}, {"d", "D"}, {"e", "E"}}, "changed 4 0 0", "5"},
    };
    for (const Step& step : steps) {
        clock.advanceBy(60);
        EXPECT_EQ(merge(step.posts), step.result);
        EXPECT_EQ(std::to_string(subscription->mUnreadCount.getValue()), step.unread);
        // A file for each archived entry, and for no other.
        for (const char* guid : {"a", "b", "c", "d", "e"}) {
            const std::string state = stateOf(guid);
            EXPECT_TRUE(state == "none" || state == "current" || state == "archived file")
                << guid << " " << state;
        }
    }
}
