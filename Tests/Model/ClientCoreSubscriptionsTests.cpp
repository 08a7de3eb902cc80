#include "Foundation/DictionaryOf.h"
#include "Foundation/Logger.h"
#include "Foundation/Number.h"
#include "Model/ClientCore.h"
#include "Model/ClientTest.h"
#include "Model/FakeHousekeeping.h"
#include "SQLite/Exception.h"
#include "Support/AssertionOf.h"

// What a client has to do with its subscriptions, and with the feeds and entries behind them.

using namespace Foundation;
using namespace Orvane;
using Support::assertionOf;
using Support::LoggingOn;
using Objects = std::vector<void*>;

namespace {

class ClientCoreSubscriptionsTest : public ClientTest {};

}  // namespace

TEST_F(ClientCoreSubscriptionsTest, LinksItsSubscriptions) {
    auto* client = row<ClientCore>();
    auto* other = row<ClientCore>();
    auto* subscription = row<SubscriptionCore>();
    client->addToSubscriptions(subscription);
    EXPECT_EQ(subscription->getClient(), client);
    EXPECT_EQ(client->getSubscriptions(nullptr).getRow(), subscription);
    subscription->setClient(other);
    EXPECT_FALSE(client->getSubscriptions(nullptr).hasRow());
    EXPECT_EQ(other->getSubscriptions(nullptr).getRow(), subscription);
    other->removeFromSubscriptions(subscription);
    EXPECT_EQ(subscription->getClient(), nullptr);
    EXPECT_FALSE(other->getSubscriptions(nullptr).hasRow());
}

TEST_F(ClientCoreSubscriptionsTest, LeavesASubscriptionThatOthersHold) {
    const Ref<SubscriptionCore> subscription = row<SubscriptionCore>();
    {
        const AutoreleasePool inner;
        row<ClientCore>()->addToSubscriptions(subscription);
    }
    EXPECT_EQ(subscription->getClient(), nullptr);
}

TEST_F(ClientCoreSubscriptionsTest, ListsItsSubscriptionsAndThoseThatMeetACondition) {
    const Ref<ClientCore> client = newClient();
    newSubscription(client, storedFeed());
    newSubscription(newClient("other"), storedFeed("http://example.org/2"));
    EXPECT_EQ(client->getSubscriptions(nullptr).allRows()->count(), 2u);
    const Ref<ArrayOf<SubscriptionCore>> withFeed = client->getSubscriptions("feed != 0").allRows();
    ASSERT_EQ(withFeed->count(), 1u);
    EXPECT_FALSE(withFeed->at(0)->isClientSettings());
}

TEST_F(ClientCoreSubscriptionsTest, FindsItsSubscriptions) {
    const Ref<ClientCore> client = newClient();
    const Ref<ClientCore> other = newClient("other");
    const Ref<FeedCore> feed = storedFeed();
    const Ref<FeedCore> unknown = storedFeed("http://example.org/2");
    const Ref<SubscriptionCore> mine = newSubscription(client, feed);
    const Ref<SubscriptionCore> theirs = newSubscription(other, feed);
    const auto found = [](Returner<SubscriptionCore> row) -> SubscriptionCore* { return row; };
    EXPECT_EQ(found(client->getSubscription(feed.get())), mine.get());
    EXPECT_EQ(found(other->getSubscription(feed.get())), theirs.get());
    EXPECT_EQ(found(client->getSubscription(unknown.get())), nullptr);
    EXPECT_EQ(found(client->getSubscription(url(kAddress))), mine.get());
    EXPECT_EQ(found(client->getSubscription(url("http://example.org/2"))), nullptr);
    EXPECT_EQ(found(client->getSubscriptionWithFeedRowID(feed->getRowID())), mine.get());
    EXPECT_EQ(found(client->getSubscriptionWithFeedRowID(0)), client->getDefaultSubscription());
    EXPECT_EQ(found(client->getSubscriptionWithFeedIdentifier(string(kIdentifier))), mine.get());
    EXPECT_EQ(found(other->getSubscriptionWithFeedIdentifier(string(kIdentifier))), theirs.get());
    EXPECT_EQ(found(client->getSubscriptionWithFeedIdentifier(string("x"))), nullptr);
}

TEST_F(ClientCoreSubscriptionsTest, HasNoSubscriptionOfAFeedInMemory) {
    const Ref<ClientCore> client = newClient();
    EXPECT_EQ(static_cast<SubscriptionCore*>(client->getSubscription(freeFeed())), nullptr);
    EXPECT_EQ(static_cast<SubscriptionCore*>(
                  client->getSubscription(static_cast<const FeedCore*>(nullptr))),
              nullptr);
}

TEST_F(ClientCoreSubscriptionsTest, NeedsSomethingToFindSubscriptionsBy) {
    const Ref<ClientCore> client = newClient();
    EXPECT_EQ(assertionOf([&] { (void)client->getSubscription(static_cast<URL*>(nullptr)); }),
              "url");
    EXPECT_EQ(assertionOf([&] { (void)client->getSubscriptionWithFeedIdentifier(nullptr); }),
              "identifier");
    EXPECT_EQ(assertionOf([&] {
                  (void)client->createSubscription(static_cast<FeedCore*>(nullptr), nullptr);
              }),
              "feed");
    Ref<SubscriptionCore> subscription;
    EXPECT_EQ(assertionOf([&] { (void)client->getEntryWithIdentifier(nullptr, subscription); }),
              "identifier");
}

TEST_F(ClientCoreSubscriptionsTest, KeepsItsSettings) {
    const Ref<ClientCore> client = newClient();
    SubscriptionCore* settings = client->getDefaultSubscription();
    EXPECT_TRUE(settings->isClientSettings());
    const LoggingOn on{{&SQLite::gLogSQL}};
    log.clear();
    EXPECT_EQ(client->getDefaultSubscription(), settings);
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(ClientCoreSubscriptionsTest, MakesSettingsWhereThereAreNone) {
    const Ref<ClientCore> client = storedClient("old");
    EXPECT_EQ(count("Subscriptions"), 0);
    const SubscriptionCore* settings = client->getDefaultSubscription();
    EXPECT_EQ(settings->getRowID(), 1);
    EXPECT_EQ(count("Subscriptions where client=1 and feed=0 and refreshInterval=1800"), 1);
}

TEST_F(ClientCoreSubscriptionsTest, TakesSettingsThatWereDeletedForNone) {
    const Ref<ClientCore> client = newClient();
    client->getDefaultSubscription()->deleteRow();
    EXPECT_EQ(count("Subscriptions"), 0);
    EXPECT_EQ(client->getDefaultSubscription()->getTable()->getName(),
              std::string("Subscriptions"));
    EXPECT_EQ(count("Subscriptions"), 1);
}

TEST_F(ClientCoreSubscriptionsTest, CannotMakeSettingsForAReader) {
    storedClient("old");
    becomeReader();
    const Ref<ClientCore> client = ClientCore::getRow(1);
    EXPECT_THROW(client->getDefaultSubscription(), SQLite::Exception);
    EXPECT_FALSE(client->getSubscriptions(nullptr).hasRow());
}

TEST_F(ClientCoreSubscriptionsTest, SubscribesToAFeed) {
    const Ref<ClientCore> client = newClient();
    client->getDefaultSubscription()->mRefreshesInBackground.setValue(false);
    client->getDefaultSubscription()->mDownloadsEnclosures.setValue(true);
    const Ref<FeedCore> feed = freeFeed();
    const Schedule schedule;
    const Ref<SubscriptionCore> made = newSubscription(client, feed);
    EXPECT_EQ(feed->getRowID(), 1);
    EXPECT_EQ(count("Subscriptions where client=1 and feed=1 and refreshInterval=0 and "
                    "expirationInterval=0 and maxEnclosureSize=0 and refreshesInBackground=0 and "
                    "downloadsEnclosures=1"),
              1);
    EXPECT_EQ(made->getClient(), client.get());
    EXPECT_EQ(made->getFeed(), feed.get());
    EXPECT_EQ(schedule.objects, Objects{made.get()});
    // Saved once, and not by its owners again.
    client->saveChanges();
    feed->saveChanges();
    EXPECT_EQ(count("Subscriptions where feed=1"), 1);
}

TEST_F(ClientCoreSubscriptionsTest, SubscribesToAFeedOnce) {
    const Ref<ClientCore> client = newClient();
    const Ref<FeedCore> feed = storedFeed();
    const Ref<SubscriptionCore> made = newSubscription(client, feed);
    const Schedule schedule;
    EXPECT_EQ(newSubscription(client, feed), made.get());
    EXPECT_TRUE(schedule.notes.empty());
}

TEST_F(ClientCoreSubscriptionsTest, SubscribesToTheFeedOfAURL) {
    const FakeFeeders feeders;
    const Ref<ClientCore> client = newClient();
    const Ref<Dictionary> settings =
        MutableDictionary::dictionary({{string("refreshInterval"), Number::number(60)}});
    const Ref<SubscriptionCore> made = client->createSubscription(url(kAddress), settings);
    EXPECT_EQ(count("Feeds where url='http://example.org/feed'"), 1);
    EXPECT_EQ(made->getFeed(), FeedCore::getRow(1));
    EXPECT_EQ(text(made->getFeed()->getIdentifier()), kIdentifier);
    // A writer leaves it at its defaults.
    EXPECT_EQ(made->mRefreshInterval, 0);
    EXPECT_EQ(static_cast<SubscriptionCore*>(client->createSubscription(url(kAddress), nullptr)),
              made.get());
    const Ref<SubscriptionCore> theirs =
        newClient("other")->createSubscription(url(kAddress), nullptr);
    EXPECT_EQ(theirs->getFeed(), made->getFeed());
    EXPECT_EQ(count("Feeds"), 1);
}

TEST_F(ClientCoreSubscriptionsTest, SubscribesToNoFeedThatCannotBe) {
    const FakeFeeders feeders;
    const Ref<ClientCore> client = newClient();
    EXPECT_EQ(static_cast<SubscriptionCore*>(
                  client->createSubscription(url("gopher://example.org/"), nullptr)),
              nullptr);
    EXPECT_EQ(count("Feeds"), 0);
    EXPECT_EQ(count("Subscriptions"), 1);
}

TEST_F(ClientCoreSubscriptionsTest, SubscribesByTheAgentForAReader) {
    newSubscription(newClient(), storedFeed());
    storedFeed("http://example.org/2");
    becomeReader();
    const Ref<ClientCore> client = ClientCore::getRow(1);
    ClientAgent agent;
    EXPECT_EQ(newSubscription(client, FeedCore::getRow(1))->getRowID(), 2);
    EXPECT_EQ(agent.calls, "");
    agent.onCall = [&] {
        writeElsewhere("insert into Subscriptions (client,feed) values (1,2)");
        agent.subscription = SubscriptionCore::getRow(3);
    };
    const Ref<Dictionary> settings = MutableDictionary::dictionary({{string("a"), string("b")}});
    const Ref<SubscriptionCore> made = client->createSubscription(FeedCore::getRow(2), settings);
    EXPECT_EQ(made.get(), SubscriptionCore::getRow(3));
    EXPECT_EQ(agent.calls, "createSubscription(1,http://example.org/2,{a = b}) ");
    URL* address = url("http://example.org/2");
    EXPECT_EQ(static_cast<SubscriptionCore*>(client->createSubscription(address, nullptr)),
              made.get());
    EXPECT_EQ(agent.calls, "createSubscription(1,http://example.org/2,{a = b}) ");
    agent.calls.clear();
    agent.onCall = nullptr;
    agent.subscription = nullptr;
    EXPECT_EQ(static_cast<SubscriptionCore*>(
                  client->createSubscription(url("gopher://example.org/"), settings)),
              nullptr);
    EXPECT_EQ(agent.calls, "createSubscription(1,gopher://example.org/,{a = b}) ");
}

namespace {

/// What keeps rows from being saved: an insert that fails, or a commit.
class FailureTest : public ClientTest, public testing::WithParamInterface<bool> {
 protected:
    void fail() const {
        // A constraint that is looked at by the commit alone. The settings' feed is 0.
        db().execute(
            "create table Late (client integer references Clients deferrable initially deferred);"
            "insert into Feeds (rowID,url) values (0,'none'); PRAGMA foreign_keys = ON");
        db().execute("create trigger Failure after insert on Subscriptions begin %s; end",
                     GetParam() ? "insert into Late values (999)" : "select raise(abort,'no')");
    }
    static void recover() {
        db().execute("drop trigger Failure");
        db().execute("PRAGMA foreign_keys = OFF; delete from Feeds where rowID=0");
    }
};

}  // namespace

TEST_P(FailureTest, LeavesNoClientToBeSaved) {
    fail();
    EXPECT_THROW(newClient(), SQLite::Exception);
    EXPECT_EQ(count("Clients"), 0);
    recover();
    db().saveRows();
    EXPECT_EQ(count("Clients"), 0);
    EXPECT_EQ(count("Subscriptions"), 0);
    newClient();
    EXPECT_EQ(count("Clients"), 1);
    EXPECT_EQ(count("Subscriptions"), 1);
}

TEST_P(FailureTest, LeavesNoSubscriptionToBeSaved) {
    const FakeFeeders feeders;
    const Ref<ClientCore> client = newClient();
    const auto subscribe = [&] { (void)client->createSubscription(url(kAddress), nullptr); };
    const Ref<FeedCore> free = freeFeed("http://example.org/2");
    fail();
    EXPECT_THROW(subscribe(), SQLite::Exception);
    EXPECT_THROW(newSubscription(client, free), SQLite::Exception);
    EXPECT_EQ(free->getTable(), nullptr);
    recover();
    db().saveRows();
    EXPECT_EQ(count("Feeds"), 0);
    EXPECT_EQ(count("Subscriptions"), 1);
    subscribe();
    newSubscription(client, free);
    client->saveChanges();
    EXPECT_EQ(count("Feeds"), 2);
    EXPECT_EQ(count("Subscriptions"), 3);
}

INSTANTIATE_TEST_SUITE_P(Moments, FailureTest, testing::Bool());

TEST_F(ClientCoreSubscriptionsTest, ReadsAllItsFeedsByOneQuery) {
    const Ref<ClientCore> client = newClient();
    for (const char* address : {"http://example.org/1", "http://example.org/2"}) {
        FeedCore* feed = storedFeed(address);
        feed->mTitle.setValue(string("title"));
        newSubscription(client, feed);
    }
    newSubscription(newClient("other"), storedFeed("http://example.org/3"));
    db().saveRows();
    auto* feeds = SQLite::TableOf<FeedCore>::instance();
    feeds->uncacheRows();
    client->prefetchFeeds();
    EXPECT_EQ(feeds->getCachedRowCount(), 2u);
    const FeedCore* feed = feeds->cachedRowWithID(2);
    ASSERT_NE(feed, nullptr);
    EXPECT_TRUE(feed->mTitle.isLoaded() && feed->mURL.isLoaded() &&
                feed->mLocalDateUpdated.isLoaded() && feed->mLastErrorDomain.isLoaded() &&
                feed->mLastErrorCode.isLoaded());
    EXPECT_FALSE(feed->mSubtitle.isLoaded());
    EXPECT_EQ(text(feed->mURL.getValue()), "http://example.org/2");
}

TEST_F(ClientCoreSubscriptionsTest, ReadsNoFeedsWhereSomeAreInMemory) {
    const Ref<ClientCore> client = newClient();
    for (const char* address : {"http://example.org/1", "http://example.org/2",  //
                                "http://example.org/3"}) {
        newSubscription(client, storedFeed(address));
    }
    db().saveRows();
    auto* feeds = SQLite::TableOf<FeedCore>::instance();
    feeds->uncacheRows();
    FeedCore::getRow(1);
    FeedCore::getRow(2);
    client->prefetchFeeds();
    EXPECT_EQ(feeds->getCachedRowCount(), 2u);
    feeds->uncacheRows();
    FeedCore::getRow(1);
    client->prefetchFeeds();
    EXPECT_EQ(feeds->getCachedRowCount(), 3u);
}

TEST_F(ClientCoreSubscriptionsTest, LetsAllItsEntriesExpire) {
    const Ref<ClientCore> client = newClient();
    const Ref<SubscriptionCore> mine = newSubscription(client, storedFeed());
    const Ref<SubscriptionCore> theirs =
        newSubscription(newClient("other"), storedFeed("http://o/"));
    mine->mUnreadCount.setValue(3);
    theirs->mUnreadCount.setValue(4);
    FakeHousekeeping housekeeping;
    int saved = 0;
    housekeeping.onExpunge = [&] {
        saved = count("Subscriptions where expirationDate=788918400 and unreadCount=0");
    };
    client->expireAllEntries();
    EXPECT_EQ(housekeeping.expunges, 1);
    // With the settings row.
    EXPECT_EQ(saved, 2);
    EXPECT_EQ(time(mine->mExpirationDate), clock.now());
    EXPECT_EQ(mine->mUnreadCount, 0);
    EXPECT_LT(time(theirs->mExpirationDate), clock.now());
    EXPECT_EQ(theirs->mUnreadCount, 4);
}

TEST_F(ClientCoreSubscriptionsTest, LetsItsEntriesExpireWithoutAnybodyToDeleteThem) {
    const Ref<ClientCore> client = newClient();
    client->expireAllEntries();
    EXPECT_EQ(time(client->getDefaultSubscription()->mExpirationDate), clock.now());
}

TEST_F(ClientCoreSubscriptionsTest, LetsEntriesExpireByTheAgentForAReader) {
    newClient();
    becomeReader();
    ClientAgent agent;
    FakeHousekeeping housekeeping;
    ClientCore::getRow(1)->expireAllEntries();
    EXPECT_EQ(agent.calls, "expireAllEntries(1) ");
    EXPECT_EQ(housekeeping.expunges, 0);
}

TEST_F(ClientCoreSubscriptionsTest, FindsAnEntryWithItsSubscription) {
    const Ref<ClientCore> client = newClient();
    const Ref<FeedCore> feed = storedFeed();
    const Ref<SubscriptionCore> mine = newSubscription(client, feed);
    newSubscription(newClient("other"), feed);
    const Ref<EntryCore> entry = newEntry(feed, "abc", clock.now());
    newEntry(storedFeed("http://example.org/2"), "def", clock.now());
    const LoggingOn on{{}};
    Ref<SubscriptionCore> found;
    EXPECT_EQ(static_cast<EntryCore*>(client->getEntryWithIdentifier(string("abc"), found)),
              entry.get());
    EXPECT_EQ(found.get(), mine.get());
    EXPECT_EQ(log.count("getEntryWithIdentifier(\"abc\") => entry=#1, sub=#2"), 1);
    EXPECT_EQ(static_cast<EntryCore*>(client->getEntryWithIdentifier(string("def"), found)),
              nullptr);
    EXPECT_EQ(found.get(), nullptr);
    EXPECT_EQ(log.count("getEntryWithIdentifier(\"def\"): not found"), 1);
}

namespace {

/// A subscription for `refreshNonBackgroundSubscriptions`, whose feed was refreshed that many
/// seconds ago.
struct Due {
    const char* what;
    double interval;
    bool background;
    double age;
    double settings;  ///< interval of the settings row
    bool isRefreshed;
};

class DueTest : public ClientTest, public testing::WithParamInterface<Due> {};

}  // namespace

TEST_P(DueTest, IsRefreshedWhenTheClientComesUp) {
    const Due& due = GetParam();
    SCOPED_TRACE(due.what);
    const Ref<ClientCore> client = newClient();
    const Ref<FeedCore> feed = storedFeed();
    feed->mRefreshLocalDate.setValue(date(clock.now() - due.age));
    const Ref<SubscriptionCore> subscription = newSubscription(client, feed);
    subscription->mRefreshInterval.setValue(due.interval);
    subscription->mRefreshesInBackground.setValue(due.background);
    client->getDefaultSubscription()->mRefreshInterval.setValue(due.settings);
    newSubscription(newClient("other"), storedFeed("http://example.org/2"));
    becomeReader();
    ClientAgent agent;
    ClientCore::getRow(1)->refreshNonBackgroundSubscriptions();
    EXPECT_EQ(agent.calls, due.isRefreshed ? "refreshMultiple(1 ,0) " : "");
}

INSTANTIATE_TEST_SUITE_P(Kinds, DueTest,
                         testing::Values(Due{"due", 600, false, 601, 1800, true},
                                         Due{"not yet", 600, false, 600, 1800, false},
                                         Due{"in the background", 600, true, 601, 1800, false},
                                         Due{"never", -1, false, 1e6, 1800, false},
                                         Due{"by the settings", 0, false, 901, 900, true},
                                         Due{"not yet by these", 0, false, 900, 900, false},
                                         Due{"by the constant", 0, false, 1801, 0, true},
                                         Due{"not yet by that", 0, false, 1800, 0, false}));
