#include "Model/FeedCore.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Logger.h"
#include "Model/FeedTest.h"

#include <cerrno>

using namespace Foundation;
using namespace Orvane;
using namespace SQLite;
using Support::LoggingOn;

namespace {

class FeedCoreTest : public FeedTest {
 protected:
    /// The IDs of a feed's entries in order, 0 for one that is not saved.
    static std::string idsOf(RowIterator<EntryCore> entries) {
        std::string ids;
        for (; entries.hasRow(); entries.nextRow()) {
            ids += std::to_string(entries->getRowID()) + " ";
        }
        return ids;
    }
    static FeedCore* found(const char* address) {
        return FeedCore::existingFeedWithURL(url(address));
    }
    /// Puts an entry straight into the file.
    static void insertEntry(const FeedCore* feed, const char* identifier, double created,
                            bool read) {
        db().execute(
            "insert into Entries (feed, identifier, localDateCreated, read, current) values "
            "(%lld, %Q, %f, %d, 1)",
            feed->getRowID(), identifier, created, read ? 1 : 0);
    }
};

}  // namespace

TEST_F(FeedCoreTest, IsIdentifiedByTheURLThatItWasFirstStoredWith) {
    FeedCore* feed = storedFeed();
    EXPECT_EQ(text(feed->getIdentifier()), kIdentifier);
    feed->mURL.setValue(url("http://example.org/moved"));
    EXPECT_EQ(text(feed->getIdentifier()), kIdentifier);
    feed->saveChanges();
    EXPECT_EQ(db().execScalar("select count(*) from Feeds where identifier=%Q", kIdentifier), 1);
}

TEST_F(FeedCoreTest, LogsWhatItsIdentifierIsBasedOn) {
    const LoggingOn on({&gLogSub});
    FeedCore* feed = freeFeed();
    feed->preloaded();
    EXPECT_TRUE(feed->mIdentifier.isChanged());
    ASSERT_EQ(log.lines().size(), 1U);
    EXPECT_NE(log.lines()[0].find(std::string(": set ident ") + kIdentifier +
                                  " based on \"http://example.org/feed\""),
              std::string::npos);
    feed->getIdentifier();
    EXPECT_EQ(log.lines().size(), 1U);
}

TEST_F(FeedCoreTest, ComputesItsIdentifierEachTimeWhereItCannotBeStored) {
    FeedCore* feed = freeFeed();
    feed->saveChanges();
    reopen(false);
    const LoggingOn on({&gLogSub});
    FeedCore* read = FeedCore::getRow(1);
    EXPECT_EQ(text(read->getIdentifier()), kIdentifier);
    EXPECT_EQ(text(read->getIdentifier()), kIdentifier);
    EXPECT_EQ(log.count(": set ident "), 2);
    EXPECT_FALSE(read->isChanged());
}

TEST_F(FeedCoreTest, LinksEntriesOnBothSides) {
    FeedCore* feed = storedFeed();
    EntryCore* entry = row<EntryCore>();
    feed->addToEntries(entry);
    EXPECT_EQ(entry->getFeed(), feed);
    EXPECT_EQ(idsOf(feed->getEntries(nullptr)), "0 ");
    feed->removeFromEntries(entry);
    EXPECT_EQ(entry->getFeed(), nullptr);
    EXPECT_EQ(idsOf(feed->getEntries(nullptr)), "");
}

TEST_F(FeedCoreTest, TakesAnEntryFromTheFeedThatHadIt) {
    FeedCore* first = storedFeed();
    FeedCore* second = storedFeed("http://example.org/second");
    EntryCore* entry = row<EntryCore>();
    first->addToEntries(entry);
    second->addToEntries(entry);
    EXPECT_EQ(entry->getFeed(), second);
    EXPECT_EQ(idsOf(first->getEntries(nullptr)), "");
    EXPECT_EQ(idsOf(second->getEntries(nullptr)), "0 ");
}

TEST_F(FeedCoreTest, LinksSubscriptionsOnBothSides) {
    FeedCore* feed = storedFeed();
    SubscriptionCore* subscription = row<SubscriptionCore>();
    subscription->setFeed(feed);
    EXPECT_EQ(feed->getSubscriptions(nullptr).getRow(), subscription);
    feed->removeFromSubscriptions(subscription);
    EXPECT_EQ(subscription->getFeed(), nullptr);
    EXPECT_FALSE(feed->getSubscriptions(nullptr).hasRow());
}

TEST_F(FeedCoreTest, LeavesNoLinkToItselfBehind) {
    EntryCore* entry = row<EntryCore>();
    SubscriptionCore* subscription = row<SubscriptionCore>();
    {
        const AutoreleasePool inner;
        FeedCore* feed = freeFeed();
        feed->addToEntries(entry);
        feed->addToSubscriptions(subscription);
    }
    EXPECT_EQ(entry->getFeed(), nullptr);
    EXPECT_EQ(subscription->getFeed(), nullptr);
}

TEST_F(FeedCoreTest, LeavesItsIDBehindOnceItHasOne) {
    EntryCore* entry = row<EntryCore>();
    {
        const AutoreleasePool inner;
        FeedCore* feed = freeFeed();
        feed->addToEntries(entry);
        TableOf<FeedCore>::instance()->uncacheRows();
        feed->addToTable(TableOf<FeedCore>::instance());
        feed->SQLite::Row::saveChanges();
        TableOf<FeedCore>::instance()->uncacheRows();
    }
    EXPECT_EQ(entry->mFeed.getRowID(), 1);
    ASSERT_NE(entry->getFeed(), nullptr);
    EXPECT_EQ(entry->getFeed()->getRowID(), 1);
}

TEST_F(FeedCoreTest, GivesTheEntriesOfTheFileThatMeetACondition) {
    FeedCore* feed = storedFeed();
    insertEntry(feed, "a", 100, false);
    insertEntry(feed, "b", 200, true);
    EXPECT_EQ(idsOf(feed->getEntries(nullptr)), "1 2 ");
    EXPECT_EQ(idsOf(feed->getEntries("read=1")), "2 ");
}

TEST_F(FeedCoreTest, CountsUnreadEntriesForEachSubscription) {
    FeedCore* feed = storedFeed();
    SubscriptionCore* first = subscribe(storedClient("a"), feed);
    SubscriptionCore* second = subscribe(storedClient("b"), feed);
    second->mExpirationDate.setValue(date(150));
    insertEntry(feed, "a", 100, false);
    insertEntry(feed, "b", 200, false);
    insertEntry(feed, "c", 300, true);
    feed->updateUnreadCounts();
    EXPECT_EQ(first->mUnreadCount.getValue(), 2);
    EXPECT_EQ(second->mUnreadCount.getValue(), 1);
    EXPECT_FALSE(first->isChanged());
    EXPECT_EQ(count("Subscriptions where unreadCount=2"), 1);
}

TEST_F(FeedCoreTest, SavesEntriesBeforeItCountsThem) {
    FeedCore* feed = storedFeed();
    SubscriptionCore* subscription = subscribe(storedClient("a"), feed);
    EntryCore* entry = row<EntryCore>();
    feed->addToEntries(entry);
    entry->mLocalDateCreated.setValue(Date::now());
    entry->addToTable(TableOf<EntryCore>::instance());
    EXPECT_THROW(subscription->getEntryCount(false), AssertionFailure);
    feed->updateUnreadCounts();
    EXPECT_EQ(subscription->mUnreadCount.getValue(), 1);
    EXPECT_EQ(subscription->getEntryCount(true), 1);
}

TEST_F(FeedCoreTest, CountsNothingForAFeedInMemory) {
    freeFeed()->updateUnreadCounts();
    EXPECT_FALSE(db().isInTransaction());
    EXPECT_EQ(count("Feeds"), 0);
}

TEST_F(FeedCoreTest, CountsUnreadEntriesByTheirIndexAlone) {
    const auto planOf = [](const char* more) {
        Cursor plan(&db(),
                    "explain query plan select count(*) from Entries where feed=1 and "
                    "localDateCreated>2.0%s",
                    more);
        std::string step = plan.cStringColumn(3);
        EXPECT_FALSE(plan.nextRow());
        return step;
    };
    const std::string search = "SEARCH Entries USING COVERING INDEX Entries_unreadcount ";
    EXPECT_EQ(planOf(" and read=0"), search + "(feed=? AND read=? AND localDateCreated>?)");
    EXPECT_EQ(planOf(""), search + "(feed=?)");
}

TEST_F(FeedCoreTest, IsFoundByItsURL) {
    FeedCore* feed = storedFeed();
    storedFeed("http://example.org/other");
    EXPECT_EQ(found("http://example.org/feed"), feed);
    EXPECT_EQ(found("feed://example.org/feed"), feed);
    EXPECT_EQ(found("http://example.org/none"), nullptr);
    EXPECT_EQ(found("feeds:name&example.org/feed"), nullptr);
    FeedCore* none = FeedCore::existingFeedWithURL(nullptr);
    EXPECT_EQ(none, nullptr);
}

TEST_F(FeedCoreTest, IsMadeOfAURLAndStored) {
    const FakeFeeders feeders;
    FeedCore* feed = FeedCore::createFeed(url("http://example.org/feed"), true);
    EXPECT_EQ(feed->getRowID(), 1);
    EXPECT_FALSE(feed->isChanged());
    EXPECT_EQ(db().execScalar("select count(*) from Feeds where identifier=%Q", kIdentifier), 1);
}

TEST_F(FeedCoreTest, IsMadeInMemory) {
    const FakeFeeders feeders;
    FeedCore* feed = FeedCore::createFeed(url("http://example.org/feed"), false);
    EXPECT_EQ(feed->getTable(), nullptr);
    EXPECT_EQ(count("Feeds"), 0);
}

TEST_F(FeedCoreTest, IsMadeOfTheSourceThatAFeedURLNames) {
    const FakeFeeders feeders;
    FeedCore* feed = FeedCore::createFeed(url("feed://example.org/feed"), true);
    EXPECT_EQ(text(feed->mURL.getValue()), "http://example.org/feed");
    EXPECT_EQ(text(feed->getIdentifier()), kIdentifier);
}

TEST_F(FeedCoreTest, IsNotMadeOfWhatCannotBeFetched) {
    const FakeFeeders feeders;
    const LoggingOn on({});
    FeedCore* feed = FeedCore::createFeed(url("gopher://example.org/feed"), true);
    EXPECT_EQ(feed, nullptr);
    EXPECT_EQ(log.lines().back(), "FeedCore: Unsupported URL 'gopher://example.org/feed'");
    feed = FeedCore::createFeed(url("feeds:name&example.org/feed"), true);
    EXPECT_EQ(feed, nullptr);
    EXPECT_EQ(count("Feeds"), 0);
}

TEST_F(FeedCoreTest, IsNotMadeOfNothing) {
    try {
        FeedCore* feed = FeedCore::createFeed(static_cast<URL*>(nullptr), true);
        FAIL() << feed;
    } catch (const AssertionFailure& failure) {
        EXPECT_STREQ(failure.what(), "url");
    }
}

TEST_F(FeedCoreTest, IsMadeOfADocument) {
    const FakeParser parser;
    FeedCore* feed = FeedCore::createFeed(data("feed News"), url("http://example.org/feed"));
    EXPECT_EQ(text(feed->mTitle.getValue()), "News");
    EXPECT_EQ(text(feed->getIdentifier()), kIdentifier);
    EXPECT_EQ(parser.lastURL, "http://example.org/feed");
    feed = FeedCore::createFeed(data("entry 1 Post"), nullptr);
    EXPECT_EQ(feed, nullptr);
}

TEST_F(FeedCoreTest, IsNotMadeOfADocumentWithoutAParser) {
    FeedCore* feed = FeedCore::createFeed(data("feed News"), nullptr);
    EXPECT_EQ(feed, nullptr);
    EXPECT_LE(log.count("DocumentParser: nothing stands behind it"), 1);
}

TEST_F(FeedCoreTest, KeepsItsPasswordInMemoryAlone) {
    FakeCredentials store;
    FeedCore* feed = storedFeed();
    EXPECT_EQ(feed->setPassword(string("secret"), false), NetError::None);
    EXPECT_EQ(text(feed->getPassword()), "secret");
    EXPECT_EQ(store.saved, "");
    EXPECT_FALSE(feed->isChanged());
}

TEST_F(FeedCoreTest, PutsItsPasswordIntoTheStoreOfTheUser) {
    FakeCredentials store;
    FeedCore* feed = storedFeed();
    feed->mLogin.setValue(string("ann"));
    EXPECT_EQ(feed->setPassword(string("secret"), true), NetError::None);
    EXPECT_EQ(store.saved, "http://example.org/feed ann secret ");
    store.answer = {NetError::kPOSIX, EACCES};
    EXPECT_EQ(feed->setPassword(nullptr, true), store.answer);
    EXPECT_EQ(feed->getPassword(), nullptr);
}

TEST_F(FeedCoreTest, SaysThatThereIsNoStoreForItsPassword) {
    EXPECT_EQ(storedFeed()->setPassword(string("secret"), true),
              NetError(NetError::kPOSIX, ENOTSUP));
}
