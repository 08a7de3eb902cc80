#include "Foundation/DictionaryOf.h"
#include "Foundation/Logger.h"
#include "Foundation/NetException.h"
#include "Foundation/NotificationCenter.h"
#include "Model/FeedCore.h"
#include "Model/FeedTest.h"

using namespace Foundation;
using namespace Orvane;
using namespace SQLite;
using Support::LoggingOn;

namespace {

class FeedCoreRefresh : public FeedTest {
 protected:
    FakeFeeders feeders;
};

/// What a feed announces, a line each, while this lives.
class Announcements {
 public:
    explicit Announcements(FeedCore* feed) {
        NotificationCenter::getLocal()->addObserver(&mReceiver, nullptr, feed);
    }
    ~Announcements() { NotificationCenter::getLocal()->removeObserver(&mReceiver); }
    Announcements(const Announcements&) = delete;
    Announcements& operator=(const Announcements&) = delete;

    std::string text;

 private:
    void take(Notification* note) {
        const std::string name = note->name->utf8();
        text += name.substr(name.rfind(':') + 1) + " ";
        if (note->info) text += note->info->toString()->utf8();
        text += "\n";
    }

    MethodReceiver<Notification, Announcements> mReceiver{this, &Announcements::take};
};

}  // namespace

TEST_F(FeedCoreRefresh, IsRefreshedAsOftenAsTheMostEagerSubscriptionWants) {
    FeedCore* feed = storedFeed();
    EXPECT_EQ(feed->getRefreshInterval(), FeedCore::kRefreshNever);
    ClientCore* client = storedClient("a");
    subscribe(client, feed, -1);
    EXPECT_EQ(feed->getRefreshInterval(), FeedCore::kRefreshNever);
    subscribe(client, feed, 1800);
    subscribe(client, feed, 300);
    EXPECT_EQ(feed->getRefreshInterval(), 300);
    subscribe(client, feed, 30);
    EXPECT_EQ(feed->getRefreshInterval(), 60);
}

TEST_F(FeedCoreRefresh, TakesTheClientsIntervalForASubscriptionWithoutOne) {
    FeedCore* feed = storedFeed();
    ClientCore* client = storedClient("a");
    subscribe(client, feed, 0);
    EXPECT_EQ(feed->getRefreshInterval(), 1800);
    client->getDefaultSubscription()->mRefreshInterval.setValue(900);
    EXPECT_EQ(feed->getRefreshInterval(), 900);
}

TEST_F(FeedCoreRefresh, IsNotRefreshedForClientsThatAreNotInUse) {
    FeedCore* feed = storedFeed();
    ClientCore* client = storedClient("org.example.NotRunning");
    SubscriptionCore* subscription = subscribe(client, feed, 300);
    clock.advanceBy(1209599);
    EXPECT_EQ(feed->getRefreshInterval(), 300);
    clock.advanceBy(1);
    EXPECT_EQ(feed->getRefreshInterval(), FeedCore::kRefreshNever);
    client->mDateUsed.setValue(Date::now());
    EXPECT_EQ(feed->getRefreshInterval(), 300);
    subscription->mRefreshesInBackground.setValue(false);
    EXPECT_EQ(feed->getRefreshInterval(), FeedCore::kRefreshNever);
}

TEST_F(FeedCoreRefresh, IsNeverDueInMemory) {
    FeedCore* feed = freeFeed();
    EXPECT_EQ(feed->getRefreshInterval(), FeedCore::kRefreshNever);
    EXPECT_EQ(static_cast<Date*>(feed->getNextRefreshDate()), nullptr);
}

TEST_F(FeedCoreRefresh, IsDueAnIntervalAfterTheLastRefreshOrNow) {
    FeedCore* feed = storedFeed();
    subscribe(storedClient("a"), feed, 300);
    EXPECT_EQ(feed->getNextRefreshDate()->getAbsoluteTime(), clock.now());
    feed->mRefreshLocalDate.setValue(date(clock.now() - 100));
    EXPECT_EQ(feed->getNextRefreshDate()->getAbsoluteTime(), clock.now() + 200);
}

TEST_F(FeedCoreRefresh, TakesADateOfAWrongClockForNone) {
    FeedCore* feed = storedFeed();
    subscribe(storedClient("a"), feed, 300);
    feed->mRefreshLocalDate.setValue(date(clock.now() + 86400));
    EXPECT_EQ(feed->getNextRefreshDate()->getAbsoluteTime(), clock.now() + 86400 + 300);
    feed->mRefreshLocalDate.setValue(date(clock.now() + 86401));
    EXPECT_EQ(feed->getNextRefreshDate()->getAbsoluteTime(), clock.now());
}

TEST_F(FeedCoreRefresh, MakesItsFeederOnceAndAsksIt) {
    FeedCore* feed = storedFeed();
    EXPECT_FALSE(feed->needsRefresh());
    feeders.feeder->isDue = true;
    EXPECT_TRUE(feed->needsRefresh());
    EXPECT_TRUE(feed->refresh(true, false));
    feeders.feeder->starts = false;
    EXPECT_FALSE(feed->refresh(false, false));
    EXPECT_FALSE(feed->startRefresh());
    EXPECT_EQ(feeders.feeder->calls, "refresh(1,0) refresh(0,0) refresh(0,1) ");
    EXPECT_EQ(feeders.made, 1);
    EXPECT_EQ(feeders.madeFor, feed);
}

TEST_F(FeedCoreRefresh, CannotBeRefreshedWithoutFeeders) {
    FeederFactory::setCurrent(nullptr);
    FeedCore* feed = storedFeed();
    EXPECT_FALSE(feed->needsRefresh());
    EXPECT_FALSE(feed->refresh(true, true));
    EXPECT_EQ(feed->getFeeder(), nullptr);
    EXPECT_LE(log.count("FeederFactory: nothing stands behind it"), 1);
}

TEST_F(FeedCoreRefresh, StopsAndDropsItsFeeder) {
    FeedCore* feed = storedFeed();
    feed->removeFeeder();
    EXPECT_EQ(feeders.feeder->calls, "");
    feed->getFeeder();
    feed->removeFeeder();
    EXPECT_EQ(feeders.feeder->calls, "removed ");
    const LoggingOn on({&gLogSub});
    feeders.feeder->mRefreshStarted.invoke(feeders.feeder);
    EXPECT_FALSE(log.contains("Started refresh"));
    feed->getFeeder();
    EXPECT_EQ(feeders.made, 2);
}

TEST_F(FeedCoreRefresh, EndsItsFeederWithIt) {
    {
        const AutoreleasePool inner;
        freeFeed()->getFeeder();
    }
    EXPECT_EQ(feeders.feeder->calls, "removed ");
    feeders.feeder->mRefreshFinished.invoke(feeders.feeder.get());
}

TEST_F(FeedCoreRefresh, AnnouncesWhatItsFeederDoes) {
    FeedCore* feed = storedFeed();
    feed->getFeeder();
    const LoggingOn on({&gLogSub});
    Announcements heard(feed);
    FakeFeeder* feeder = feeders.feeder;
    feeder->mRefreshStarted.invoke(feeder);
    feeder->mFetchStarted.invoke(feeder);
    feeder->mRefreshFinished.invoke(feeder);
    feeder->changed = true;
    feeder->mRefreshFinished.invoke(feeder);
    feeder->changed = false;
    feeder->status = {NetError::kHTTP, 404};
    feeder->mRefreshFinished.invoke(feeder);
    EXPECT_EQ(heard.text,
              "FeedWillRefresh \n"
              "FeedBeganUpdate \n"
              "FeedEndedUpdate {}\n"
              "FeedEndedUpdate {DidChange = 1}\n"
              "FeedEndedUpdate {ErrorDomain = 4, ErrorCode = 404}\n");
    const std::string name = text(feed->toString());
    EXPECT_EQ(log.count("Started refresh of " + name), 1);
    EXPECT_EQ(log.count("Started actual HTTP fetch of " + name), 1);
    EXPECT_EQ(log.count("Ended refresh of " + name), 3);
}

TEST_F(FeedCoreRefresh, StartsByWayOfTheAgentWhereItCannotBeChanged) {
    storedFeed();
    reopen(false);
    FakeAgent agent;
    FeedCore* feed = FeedCore::getRow(1);
    EXPECT_TRUE(feed->startRefresh());
    agent.answer = {NetError::kOrvane, OVAgentLaunchError};
    EXPECT_FALSE(feed->startRefresh());
    EXPECT_EQ(agent.calls, "refresh(1,1) refresh(1,1) ");
    EXPECT_EQ(feeders.made, 0);
}

TEST_F(FeedCoreRefresh, KeepsTheLastErrorInItsColumns) {
    FeedCore* feed = storedFeed();
    EXPECT_EQ(feed->getLastError(), NetError::None);
    feed->setLastError({NetError::kHTTP, 404});
    feed->saveChanges();
    EXPECT_EQ(count("Feeds where lastErrorDomain=4 and lastErrorCode=404"), 1);
    EXPECT_EQ(feed->getLastError(), NetError(NetError::kHTTP, 404));
}

TEST_F(FeedCoreRefresh, SetsItsLoginWhereItCanBeChanged) {
    FeedCore* feed = storedFeed();
    FakeAgent agent;
    String* login = string("ann");
    feed->public_setLogin(login);
    EXPECT_EQ(text(feed->mLogin.getValue()), "ann");
    EXPECT_EQ(agent.calls, "");
}

TEST_F(FeedCoreRefresh, LeavesItsLoginToTheAgentElsewhere) {
    storedFeed();
    reopen(false);
    FakeAgent agent;
    FeedCore* feed = FeedCore::getRow(1);
    EXPECT_EQ(text(feed->mLogin.getValue()), "null");
    ASSERT_TRUE(feed->mLogin.isLoaded());
    String* login = string("ann");
    feed->public_setLogin(login);
    EXPECT_EQ(agent.calls, "setLogin(1,ann) ");
    EXPECT_FALSE(feed->mLogin.isLoaded());
    EXPECT_FALSE(feed->isChanged());
}

TEST_F(FeedCoreRefresh, FailsWhereThereIsNoAgent) {
    storedFeed();
    reopen(false);
    FeedCore* feed = FeedCore::getRow(1);
    EXPECT_FALSE(feed->startRefresh());
    try {
        feed->public_setLogin(nullptr);
        FAIL();
    } catch (const NetException& failure) {
        EXPECT_EQ(failure.getError(), NetError(NetError::kOrvane, OVAgentLaunchError));
    }
    EXPECT_LE(log.count("AgentLink: nothing stands behind it"), 1);
}
