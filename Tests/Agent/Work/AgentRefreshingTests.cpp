// When the agent refreshes which feeds.

#include "Agent/AgentTest.h"
#include "Foundation/NetworkConfig.h"
#include "Foundation/SleepNotifier.h"
#include "Model/ClientTest.h"
#include "SQLite/Exception.h"
#include "SQLite/Transaction.h"

#include <gmock/gmock.h>

#include <map>
#include <optional>
#include <stdexcept>

using namespace Foundation;
using namespace Orvane;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using Strings = std::vector<std::string>;

namespace {

/// Feeders that note which feeds they are asked to refresh, and refresh them when the test says
/// that they are done. They are those of the process while this lives.
class NotingFeeders : public FeederFactory {
 public:
    class Feeder : public FeedRefresher {
     public:
        Feeder(NotingFeeders& owner, FeedCore* feed) : mOwner(owner), mFeed(feed) {}
        void removed() override { mFeed = nullptr; }
        bool needsRefresh() const override { return true; }
        bool refresh(bool force, bool queued) override {
            mOwner.noteRefresh(*mFeed, force, queued);
            mOwner.mRunning[mFeed->mURL.getValue()->text()] = this;
            mRefreshStarted.invoke(this);
            return true;
        }
        void refreshFromData(Data*) override {}
        NetError getStatus() const override { return {}; }
        bool hasChanged() const override { return false; }
        void finish() {
            const Ref<Date> now = Date::now();
            mFeed->mRefreshLocalDate.setValue(now);
            mRefreshFinished.invoke(this);
        }

     private:
        NotingFeeders& mOwner;
        FeedCore* mFeed;
    };

    NotingFeeders() { setCurrent(this); }
    ~NotingFeeders() override { setCurrent(nullptr); }

    bool supportsURL(const URL*) const override { return true; }
    Returner<FeedRefresher> makeFeeder(FeedCore* feed) override {
        return Returner<FeedRefresher>::adopted(new Feeder(*this, feed));
    }
    void finish(const std::string& address) { mRunning.at(address)->finish(); }

    Strings refreshed;
    std::string broken;  ///< of this feed the refresh throws
    bool breaksDatabase = false;

 private:
    void noteRefresh(const FeedCore& feed, bool force, bool queued) {
        const std::string address = feed.mURL.getValue()->text();
        if (address == broken && breaksDatabase) throw SQLite::Exception(10, "no disk");
        if (address == broken) throw std::runtime_error("broken");
        refreshed.push_back(address.substr(address.rfind('/') + 1) + (force ? " forced" : "") +
                            (queued ? "" : " at once"));
    }

    std::map<std::string, Feeder*> mRunning;
};

class AgentRefreshingTest : public AgentTest {
 protected:
    AgentRefreshingTest() {
        startAgent();
        clock.advanceBy(AgentTask::kHoldOffSeconds);
        log.clear();
    }

    static std::string address(const char* name) { return std::string("http://e.org/") + name; }
    /// A feed that was refreshed so many seconds ago and has an interval.
    FeedCore* feed(const char* name, double ago, double interval) {
        return subscribe(address(name).c_str(), clock.now() - ago, interval);
    }
    static SubscriptionCore* subscribeToo(const char* signature, FeedCore* feed, double interval) {
        ClientCore* client = ClientCore::createClient(String::string(signature));
        SubscriptionCore* made = client->createSubscription(feed, nullptr);
        made->setRefreshInterval(interval);
        SQLite::gDatabase->saveRows();
        return made;
    }
    static SubscriptionCore* subscriptionOf(FeedCore* feed) {
        return feed->getSubscriptions(nullptr).allRows()->first();
    }
    /// Runs a pass, and gives the names of the feeds that it has started.
    Strings pass() {
        feeders.refreshed.clear();
        task->scheduleNextRefresh();
        return feeders.refreshed;
    }
    /// Seconds until the timer of the next pass.
    double remaining() const { return task->getRefreshTimer().getTimeRemaining(); }

    std::optional<Support::EnvVar> dontQuit{std::in_place, "OVAgentDontQuit", "1"};
    NotingFeeders feeders;
};

}  // namespace

TEST_F(AgentRefreshingTest, WaitsForTheEndOfTheHoldOff) {
    task.reset();
    task = std::make_unique<AgentTask>();
    task->start(false);
    subscribe("http://e.org/new");
    log.clear();
    clock.advanceBy(0.5);
    EXPECT_TRUE(log.contains(
        OVFormat("[Agent] ===== SCHEDULING REFRESH SKIPPED (now %.3f, hold off until %.3f) =====",
                 clock.now() - 0.4, clock.now() + 1.5)))
        << testing::PrintToString(log.lines());
    EXPECT_THAT(feeders.refreshed, IsEmpty());
    EXPECT_NEAR(remaining(), 1.5, 1e-6);
    clock.advanceBy(1.5);
    EXPECT_THAT(feeders.refreshed, ElementsAre("new"));
}

TEST_F(AgentRefreshingTest, IsNotHeldOffByAClockThatWasSetBack) {
    feed("a", 600, 600);
    task.reset();
    clock.jumpTo(clock.now() + 1e8);
    task = std::make_unique<AgentTask>();
    task->start(false);
    clock.jumpTo(clock.now() - 1e8);
    EXPECT_THAT(pass(), ElementsAre("a"));
}

TEST_F(AgentRefreshingTest, RefreshesAtOnceWhatNeverWas) {
    subscribe("http://e.org/new");
    EXPECT_THAT(pass(), ElementsAre("new"));
}

TEST_F(AgentRefreshingTest, RefreshesInTheBackgroundAndInTheOrderOfFeeds) {
    for (const char* name : {"c", "a", "b"})
        feed(name, 4000, 3600);
    EXPECT_THAT(pass(), ElementsAre("c", "a", "b"));
}

TEST_F(AgentRefreshingTest, TakesWhatIsDueWithin120SecondsForDue) {
    feed("in120", 480, 600);
    feed("in120.1", 479.9, 600);
    EXPECT_THAT(pass(), ElementsAre("in120"));
    EXPECT_NEAR(remaining(), 120.1, 1e-3);
}

TEST_F(AgentRefreshingTest, NeverRefreshesAFeedTwiceWithinAMinute) {
    feed("a", 60, 60);
    feed("b", 60, 150);
    EXPECT_THAT(pass(), ElementsAre("a", "b"));
    feeders.refreshed.clear();
    feeders.finish("http://e.org/a");
    feeders.finish("http://e.org/b");
    EXPECT_THAT(feeders.refreshed, IsEmpty());
    EXPECT_NEAR(remaining(), 60, 1e-3);
    // The pass for the one finds that the other is due within 120 seconds.
    clock.advanceBy(59.9);
    EXPECT_THAT(feeders.refreshed, IsEmpty());
    clock.advanceBy(0.1);
    EXPECT_THAT(feeders.refreshed, ElementsAre("a", "b"));
}

TEST_F(AgentRefreshingTest, LooksAgainWhenTheFirstOfTheOthersIsDue) {
    feed("late", 0, 5000);
    feed("soon", 0, 3000);
    feed("later", 0, 4000);
    feed("now", 3600, 3600);
    EXPECT_THAT(pass(), ElementsAre("now"));
    EXPECT_NEAR(remaining(), 3000, 1e-3);
    EXPECT_EQ(task->getRefreshTimer().isRunning(), true);
    const Ref<Date> next = Date::nowPlus(3000);
    EXPECT_TRUE(log.contains(
        OVFormat("[Agent] ===== END SCHEDULING REFRESH (next run at %@)", next.get())));
}

TEST_F(AgentRefreshingTest, StopsTheTimerWithoutFeedsAndLetsTheAgentEnd) {
    feed("a", 0, -1);
    EXPECT_THAT(pass(), IsEmpty());
    EXPECT_FALSE(task->getRefreshTimer().isRunning());
    EXPECT_TRUE(log.contains("[Agent] ===== END SCHEDULING REFRESH (next run at (null))"));
    task.reset();
    dontQuit.reset();
    startAgent();
    EXPECT_TRUE(runUntilQuit());
    EXPECT_THAT(services.intervals, ElementsAre(31536000));
}

TEST_F(AgentRefreshingTest, LooksAgainAtTheDateOfTheTimer) {
    feed("a", 0, 1000);
    EXPECT_THAT(pass(), IsEmpty());
    clock.advanceBy(999);
    EXPECT_THAT(feeders.refreshed, IsEmpty());
    clock.advanceBy(1);
    EXPECT_THAT(feeders.refreshed, ElementsAre("a"));
}

TEST_F(AgentRefreshingTest, LeavesWhatItHasStartedToTheEndOfTheLastRefresh) {
    feed("a", 4000, 3600);
    feed("b", 4000, 1800);
    EXPECT_THAT(pass(), ElementsAre("a", "b"));
    EXPECT_FALSE(task->getRefreshTimer().isRunning());
    EXPECT_EQ(task->getRefreshCount(), 2);
    feeders.finish("http://e.org/a");
    EXPECT_FALSE(task->getRefreshTimer().isRunning());
    feeders.finish("http://e.org/b");
    EXPECT_NEAR(remaining(), 1800, 1e-3);
}

TEST_F(AgentRefreshingTest, GoesByTheMostImpatientSubscriptionButNotBelowAMinute) {
    subscribeToo("org.example.B", feed("a", 0, 3600), 600);
    pass();
    EXPECT_NEAR(remaining(), 600, 1e-3);
    FeedCore* hasty = feed("b", 0, 10);
    subscribeToo("org.example.B", hasty, 20);
    EXPECT_EQ(hasty->getRefreshInterval(), 60);
}

TEST_F(AgentRefreshingTest, TakesAnIntervalOf0ForTheClientsAndThatFor1800) {
    FeedCore* a = feed("a", 0, 0);
    SubscriptionCore* settings = subscriptionOf(a)->getClient()->getDefaultSubscription();
    settings->mRefreshInterval.setValue(7200);
    pass();
    EXPECT_NEAR(remaining(), 7200, 1e-3);
    settings->mRefreshInterval.setValue(0);
    pass();
    EXPECT_NEAR(remaining(), 1800, 1e-3);
}

TEST_F(AgentRefreshingTest, LeavesOutWhatIsNeverToBeRefreshed) {
    FeedCore* a = feed("a", 5000, 1800);
    subscriptionOf(a)->setRefreshInterval(-1);
    db().saveRows();
    EXPECT_THAT(pass(), IsEmpty());
    EXPECT_TRUE(SubscriptionCore::getSubscribedFeeds()->isEmpty());
}

TEST_F(AgentRefreshingTest, DropsFeedsOfApplicationsInTheForegroundThatDoNotRun) {
    FakeSession session;
    FeedCore* a = feed("a", 5000, 1800);
    subscriptionOf(a)->mRefreshesInBackground.setValue(false);
    EXPECT_THAT(pass(), IsEmpty());
    EXPECT_FALSE(task->getRefreshTimer().isRunning());
    EXPECT_TRUE(log.contains("    sched <http://e.org/a>: in inf sec (interval=inf)"));
    session.run("org.example.reader");
    EXPECT_THAT(pass(), ElementsAre("a"));
}

TEST_F(AgentRefreshingTest, SaysOfEachFeedWhenItIsDue) {
    feed("a", 0, 1800);
    pass();
    EXPECT_TRUE(
        log.contains("[Agent.Verbose]     sched <http://e.org/a>: in 1800.0 sec (interval=1800.0)"))
        << testing::PrintToString(log.lines());
}

TEST_F(AgentRefreshingTest, RefreshesWhatWasRefreshedByAWrongClock) {
    feed("future", -86401, 1800);
    feed("tomorrow", -86400, 1800);
    EXPECT_THAT(pass(), ElementsAre("future"));
    EXPECT_NEAR(remaining(), 86400 + 1800, 1e-3);
}

TEST_F(AgentRefreshingTest, IsNotKeptFromTheOthersByABrokenFeed) {
    feed("a", 5000, 1800);
    feed("b", 5000, 1800);
    feed("c", 0, 1800);
    feeders.broken = "http://e.org/a";
    EXPECT_THAT(pass(), ElementsAre("b"));
    EXPECT_NEAR(remaining(), 1800, 1e-3);
    EXPECT_TRUE(log.contains("void Orvane::AgentTask::scheduleNextRefresh()"));
    EXPECT_TRUE(log.contains("broken"));
}

TEST_F(AgentRefreshingTest, EndsWithABrokenDatabase) {
    feed("a", 5000, 1800);
    feeders.broken = "http://e.org/a";
    feeders.breaksDatabase = true;
    EXPECT_THROW(pass(), SQLite::Exception);
    EXPECT_FALSE(db().isInTransaction());
}

TEST_F(AgentRefreshingTest, SavesWhatIsChanged) {
    FeedCore* a = feed("a", 5000, 1800);
    a->mTitle.setValue(String::string("changed"));
    pass();
    EXPECT_FALSE(a->isChanged());
    EXPECT_EQ(count("Feeds where title='changed'"), 1);
}

TEST_F(AgentRefreshingTest, LeavesTheTimerAloneWithoutADatabase) {
    feed("a", 0, 1000);
    pass();
    db().close(true);
    log.clear();
    task->scheduleNextRefresh();
    EXPECT_NEAR(remaining(), 1000, 1e-3);
    EXPECT_THAT(log.lines(), IsEmpty());
}

TEST_F(AgentRefreshingTest, TriesAgainUntilThereIsADatabase) {
    const std::string path = (storage() / "Database/Database.sqlite3").string();
    feed("a", 5000, 1800);
    pass();
    db().close(true);
    post(SubscriptionCore::kRefreshScheduleChangedNotification);
    clock.advanceBy(5);
    EXPECT_TRUE(task->getRefreshTimer().isRunning());
    feeders.refreshed.clear();
    db().open(path.c_str(), true);
    clock.advanceBy(0.1);
    EXPECT_THAT(feeders.refreshed, ElementsAre("a"));
    EXPECT_FALSE(task->getRefreshTimer().isRunning());
}

TEST_F(AgentRefreshingTest, LooksSoonWhenTheScheduleChanges) {
    pass();
    post(SubscriptionCore::kRefreshScheduleChangedNotification);
    EXPECT_NEAR(remaining(), 0.1, 1e-6);
}

TEST_F(AgentRefreshingTest, LooksThreeSecondsAfterTheMachineHasSlept) {
    pass();
    post(SleepNotifier::kDidWakeNotification);
    EXPECT_NEAR(remaining(), 3.0, 1e-6);
}

TEST_F(AgentRefreshingTest, DiesWithATransactionThatCannotBeOpenedUntilItIsCalledAgain) {
    feed("a", 0, 1000);
    pass();
    {
        SQLite::Database other;
        other.open((storage() / "Database/Database.sqlite3").c_str(), true);
        const SQLite::Transaction lock(&other, true);
        clock.advanceBy(1000);
        EXPECT_TRUE(log.contains("SQLITE_BUSY"));
        EXPECT_FALSE(task->getRefreshTimer().isRunning());
    }
    EXPECT_THAT(feeders.refreshed, IsEmpty());
    post(SubscriptionCore::kRefreshScheduleChangedNotification);
    clock.advanceBy(0.1);
    EXPECT_THAT(feeders.refreshed, ElementsAre("a"));
}

TEST_F(AgentRefreshingTest, TriesAgainWhatFailedForWantOfANetwork) {
    const NetError noNetwork{NetError::kPFURL, -1009};
    ASSERT_TRUE(NetworkConfig::isConfigError(noNetwork));
    feed("a", 0, 5000)->setLastError(noNetwork);
    feed("gone", 0, 5000)->setLastError({NetError::kHTTP, 404});
    feed("fine", 0, 5000);
    post(NetworkConfig::kNetworkChangedNotification);
    EXPECT_THAT(feeders.refreshed, ElementsAre("a"));
    EXPECT_TRUE(log.contains("[Agent] Notified that network configuration changed!"));
    EXPECT_EQ(log.count("    retry <"), 1);
    EXPECT_TRUE(log.contains("[Agent]     retry <http://e.org/a>"));
}

TEST_F(AgentRefreshingTest, TriesNothingAgainDuringTheHoldOff) {
    feed("a", 0, 5000)->setLastError({NetError::kPFURL, -1009});
    db().saveRows();
    task.reset();
    task = std::make_unique<AgentTask>();
    task->start(false);
    post(NetworkConfig::kNetworkChangedNotification);
    EXPECT_THAT(feeders.refreshed, IsEmpty());
    EXPECT_TRUE(log.contains("[Agent] Notified that network configuration changed!"));
}

TEST_F(AgentRefreshingTest, StartsDownloadsOnlyWhileNothingIsRefreshed) {
    const Support::LoggingOn download{{&gLogDownload}};
    pass();
    EXPECT_EQ(log.count("Found no enclosures to auto-download"), 1);
    feed("a", 5000, 1800);
    pass();
    EXPECT_EQ(log.count("Found no enclosures to auto-download"), 1);
}

TEST_F(AgentRefreshingTest, StartsNoDownloadWhereThereIsNoDownloader) {
    FeedCore* a = feed("a", 0, 1800);
    db().execute("insert into Entries (rowID, identifier, feed) values (1, 'e', %lld)",
                 a->getRowID());
    db().execute(
        "insert into Enclosures (rowID, entry, url, downloadAuditStatus, downloadState) "
        "values (1, 1, 'http://e.org/f', 1, 0)");
    pass();
    EXPECT_EQ(task->getDownloadCount(), 0);
    EXPECT_EQ(count("Enclosures where downloadState=0"), 1);
}

TEST_F(AgentRefreshingTest, WarnsOfAPassThatTakesLong) {
    class SlowLog : public Support::LogCapture {
     public:
        explicit SlowLog(Support::ManualClock& clock) : mClock(clock) {}
        void write(const Logger& logger, std::string_view text) override {
            if (text.find("sched <") != std::string_view::npos) mClock.sleep(0.06);
            LogCapture::write(logger, text);
        }

     private:
        Support::ManualClock& mClock;
    };
    feed("a", 0, 1800);
    SlowLog slow(clock);
    pass();
    EXPECT_FALSE(slow.contains("Long work"));
    feed("b", 0, 1800);
    pass();
    EXPECT_TRUE(slow.contains("Long work on the run loop: scheduling of refreshes took 120 ms"));
}
