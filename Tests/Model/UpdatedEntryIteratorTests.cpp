#include "Model/UpdatedEntryIterator.h"

#include "Foundation/Logger.h"
#include "Model/ClientTest.h"

#include <gmock/gmock.h>

using namespace Foundation;
using namespace Orvane;
using Support::LoggingOn;
using testing::UnorderedElementsAre;
using Strings = std::vector<std::string>;

namespace {

/// Entries that are all two days old, and a last look that was a day ago.
class UpdatedEntryIteratorTest : public ClientTest {
 protected:
    /// A stored entry of which nothing has changed since the last look.
    EntryCore* entry(const char* identifier, FeedCore* of = nullptr) {
        EntryCore* made = newEntry(of ? of : feed.get(), identifier, since - kDay);
        made->mLocalDateUpdated.setValue(date(since - kDay));
        made->mLocalDateXMLChanged.setValue(date(since - kDay));
        made->mLocalDateFlagsUpdated.setValue(date(since - kDay));
        made->saveChanges();
        return made;
    }
    /// The entries as "identifier", with "c", "f" and "x" for what has happened to them.
    static Strings walk(ClientCore* client, double from) {
        Strings result;
        for (UpdatedEntryIterator i(client, date(from)); i.getEntry(); ++i) {
            result.push_back(text(i.getEntry()->mIdentifier.getValue()) + " " +
                             (i.hasUpdatedContent() ? "c" : "") + (i.hasUpdatedFlags() ? "f" : "") +
                             (i.hasExpired() ? "x" : ""));
        }
        return result;
    }
    Strings walk() const {
        db().saveRows();
        return walk(client, since);
    }
    static double latest(ClientCore* client, Date* from) {
        UpdatedEntryIterator i(client, from);
        while (i.getEntry())
            ++i;
        return time(i.getMaxDate());
    }

    const double since = clock.now() - kDay;
    const Ref<ClientCore> client = newClient();
    const Ref<FeedCore> feed = storedFeed();
    const Ref<SubscriptionCore> mine = newSubscription(client, feed);
};

}  // namespace

TEST_F(UpdatedEntryIteratorTest, GivesNothingOfWhatHasNotChanged) {
    entry("a");
    EXPECT_EQ(walk(), Strings{});
}

TEST_F(UpdatedEntryIteratorTest, GivesEveryEntryAsUpdatedWhereNothingIsKnown) {
    entry("a");
    EntryCore* never = entry("b");
    never->mLocalDateFlagsUpdated.setValue(nullptr);
    db().saveRows();
    EXPECT_THAT(walk(client, 0), UnorderedElementsAre("a cf", "b c"));
}

TEST_F(UpdatedEntryIteratorTest, TellsFlagsFromContent) {
    entry("flags")->mLocalDateFlagsUpdated.setValue(date(since + 1));
    EntryCore* content = entry("content");
    content->mLocalDateXMLChanged.setValue(date(since + 1));
    EntryCore* both = entry("both");
    both->mLocalDateXMLChanged.setValue(date(since + 1));
    both->mLocalDateFlagsUpdated.setValue(date(since + 1));
    entry("at the time")->mLocalDateXMLChanged.setValue(date(since));
    EXPECT_THAT(walk(), UnorderedElementsAre("flags f", "content c", "both cf"));
}

TEST_F(UpdatedEntryIteratorTest, TakesAChangeOfTheXMLAloneForContentIfTheClientUsesIt) {
    entry("xml")->mLocalDateXMLChanged.setValue(date(since + 1));
    EntryCore* content = entry("content");
    content->mLocalDateUpdated.setValue(date(since + 1));
    content->mLocalDateXMLChanged.setValue(date(since + 1));
    EXPECT_TRUE(client->mUsesXML);
    EXPECT_THAT(walk(), UnorderedElementsAre("xml c", "content c"));
    client->mUsesXML = false;
    EXPECT_THAT(walk(), UnorderedElementsAre("content c"));
    EXPECT_FALSE(UpdatedEntryIterator(client, nullptr).usesXML());
}

TEST_F(UpdatedEntryIteratorTest, TellsAnExpiryOnce) {
    const double now = clock.now();
    const auto created = [&](const char* identifier, double age) {
        entry(identifier)->mLocalDateCreated.setValue(date(now - age));
    };
    created("expires now", 14 * kDay);
    created("has expired", 14 * kDay + 1);
    created("at the last look", 15 * kDay);
    created("before it", 15 * kDay + 1);
    EXPECT_THAT(walk(), UnorderedElementsAre("has expired x", "at the last look x"));
}

TEST_F(UpdatedEntryIteratorTest, GoesByTheSubscriptionsIntervalOrTheSettings) {
    const Ref<FeedCore> other = storedFeed("http://example.org/2");
    newSubscription(client, other)->mExpirationInterval.setValue(1.5 * kDay);
    client->getDefaultSubscription()->mExpirationInterval.setValue(1.9 * kDay);
    entry("a")->mLocalDateCreated.setValue(date(clock.now() - 1.8 * kDay));
    entry("b", other)->mLocalDateCreated.setValue(date(clock.now() - 1.8 * kDay));
    EXPECT_THAT(walk(), UnorderedElementsAre("b x"));
    client->getDefaultSubscription()->mExpirationInterval.setValue(1.7 * kDay);
    EXPECT_THAT(walk(), UnorderedElementsAre("a x", "b x"));
}

TEST_F(UpdatedEntryIteratorTest, LeavesOutEntriesOfOthersAndOfNoFeed) {
    const Ref<FeedCore> other = storedFeed("http://example.org/2");
    newSubscription(newClient("other"), other);
    entry("theirs", other)->mLocalDateXMLChanged.setValue(date(since + 1));
    // As if it belonged to the settings, whose feed is 0.
    auto* ghost = row<EntryCore>();
    ghost->mIdentifier.setValue(string("ghost"));
    ghost->mLocalDateCreated.setValue(date(since));
    ghost->mLocalDateXMLChanged.setValue(date(since + 1));
    ghost->saveChanges();
    EXPECT_EQ(count("Entries where feed=0"), 1);
    EXPECT_EQ(walk(), Strings{});
}

TEST_F(UpdatedEntryIteratorTest, GivesTheSubscriptionWithTheEntry) {
    EntryCore* changed = entry("a");
    changed->mLocalDateXMLChanged.setValue(date(since + 1));
    db().saveRows();
    UpdatedEntryIterator iterator(client, date(since));
    EXPECT_EQ(iterator.getClient(), client.get());
    EXPECT_EQ(iterator.getEntry(), changed);
    EXPECT_EQ(iterator.getSubscription(), mine.get());
    ++iterator;
    EXPECT_EQ(iterator.getEntry(), nullptr);
    EXPECT_EQ(iterator.getSubscription(), nullptr);
}

TEST_F(UpdatedEntryIteratorTest, ReadsNoMoreThanItNeeds) {
    entry("a")->mLocalDateXMLChanged.setValue(date(since + 1));
    db().saveRows();
    SQLite::TableOf<EntryCore>::instance()->uncacheRows();
    const UpdatedEntryIterator iterator(client, date(since));
    const EntryCore* read = iterator.getEntry();
    EXPECT_TRUE(read->mIdentifier.isLoaded() && read->mLocalDateCreated.isLoaded());
    EXPECT_FALSE(read->mTitle.isLoaded() || read->mRead.isLoaded());
}

TEST_F(UpdatedEntryIteratorTest, KeepsTheLatestDateOfChange) {
    EntryCore* a = entry("a");
    a->mLocalDateUpdated.setValue(date(since + 5));
    a->mLocalDateXMLChanged.setValue(date(since + 7));
    EntryCore* b = entry("b");
    b->mLocalDateUpdated.setValue(date(since + 1));
    b->mLocalDateXMLChanged.setValue(nullptr);
    b->mLocalDateFlagsUpdated.setValue(date(since + 6));
    db().saveRows();
    EXPECT_EQ(latest(client, date(since)), since + 7);
    client->mUsesXML = false;
    EXPECT_EQ(latest(client, date(since)), since + 6);
    EXPECT_EQ(latest(client, nullptr), since + 6);
    EXPECT_EQ(latest(client, date(since + 100)), since + 100);
    const UpdatedEntryIterator none(client, nullptr);
    EXPECT_NE(none.getMaxDate(), nullptr);
}

TEST_F(UpdatedEntryIteratorTest, FindsNothingNewFromTheLatestDateOn) {
    EntryCore* changed = entry("a");
    changed->mLocalDateXMLChanged.setValue(date(since + 5));
    db().saveRows();
    const double next = latest(client, date(since));
    EXPECT_EQ(walk(client, next), Strings{});
}

TEST_F(UpdatedEntryIteratorTest, HasNoDateWhereItFoundNoneAndKnewNone) {
    const UpdatedEntryIterator iterator(client, nullptr);
    EXPECT_EQ(iterator.getMaxDate(), nullptr);
}

TEST_F(UpdatedEntryIteratorTest, WalksBesideAnother) {
    for (const char* identifier : {"a", "b", "c"}) {
        entry(identifier)->mLocalDateXMLChanged.setValue(date(since + 1));
    }
    db().saveRows();
    const UpdatedEntryIterator outer(client, date(since));
    EXPECT_THAT(walk(client, since), UnorderedElementsAre("a c", "b c", "c c"));
    EXPECT_NE(outer.getEntry(), nullptr);
}

TEST_F(UpdatedEntryIteratorTest, SaysInTheLogWhatItFinds) {
    entry("a")->mLocalDateFlagsUpdated.setValue(date(since + 1));
    db().saveRows();
    const LoggingOn on{{&gLogSub}};
    log.clear();
    EXPECT_EQ(walk(client, since), Strings{"a f"});
    EXPECT_EQ(log.count("[Sub] UpdatedEntryIterator: =====Beginning (since=788832000.000/"
                        "2025-12-31 00:00:00 +0000, now=788918400.000, usesXML=1)"),
              1);
    EXPECT_EQ(log.count("[Sub]     Got Orvane::EntryCore[Entries #1]"), 1);
    EXPECT_EQ(log.count(" (feed=1, sub=2)"), 1);
    EXPECT_EQ(log.count("[Sub]         content=0, flags=1, expired=0"), 1);
    EXPECT_EQ(log.count("[Sub]     xml=2025-12-30 00:00:00 +0000, content=2025-12-30 00:00:00 "
                        "+0000, flags=2025-12-31 00:00:01 +0000 (maxDate=2025-12-31 00:00:01 "
                        "+0000)"),
              1);
    EXPECT_EQ(log.lines().back(), "[Sub] UpdatedEntryIterator: =====Ended");
}
