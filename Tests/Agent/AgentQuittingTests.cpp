// When the agent ends, and when it asks to be started again.

#include "Agent/AgentTest.h"
#include "Utilities/FileDeletionQueue.h"
#include "Utilities/FileUtils.h"

#include <gmock/gmock.h>

#include <functional>

using namespace Foundation;
using namespace Orvane;
using testing::ElementsAre;
using testing::IsEmpty;

namespace {

class AgentQuittingTest : public AgentTest {
 protected:
    AgentQuittingTest() { startAgent(); }

    double remaining() const { return task->getQuitTimer().getTimeRemaining(); }
    /// What the agent asks for when it ends now.
    std::int64_t quit() {
        services.intervals.clear();
        task->quit();
        return services.intervals.empty() ? -1 : services.intervals.front();
    }
};

TEST_F(AgentQuittingTest, EndsAfterFifteenSecondsIfNobodyCalls) {
    const double began = clock.now();
    EXPECT_TRUE(runUntilQuit());
    EXPECT_EQ(clock.now(), began + 15);
    EXPECT_THAT(services.intervals, ElementsAre(31536000));
}

TEST_F(AgentQuittingTest, EndsTwoMinutesAfterTheLastCall) {
    const double began = clock.now();
    clock.advanceBy(10);
    post(NotificationNames::kCallHandled);
    clock.advanceBy(100);
    post(NotificationNames::kSCGIHandlerCreated);
    EXPECT_TRUE(log.contains("[Agent] Agent will quit after 120 seconds of inactivity."));
    EXPECT_TRUE(runUntilQuit());
    EXPECT_EQ(clock.now(), began + 230);
}

TEST_F(AgentQuittingTest, ComesBackInAYearWithoutFeeds) {
    EXPECT_EQ(quit(), 31536000);
    EXPECT_TRUE(
        log.contains("[Agent] Agent quitting. Scheduling restart by svcd in 31536000 "
                     "seconds (at 2027-01-01 00:00:00 +0000)."));
}

TEST_F(AgentQuittingTest, ComesBackForTheEarliestFeed) {
    subscribe("http://example.org/1", clock.now() - 100, 1000);
    subscribe("http://example.org/2", clock.now() - 400, 1000);
    subscribe("http://example.org/3", clock.now() - 200, 1000);
    EXPECT_EQ(quit(), 600);
}

TEST_F(AgentQuittingTest, CutsTheSecondsDownToWholeOnes) {
    subscribe("http://example.org/1", clock.now() - 0.25, 1000);
    EXPECT_EQ(quit(), 999);
}

TEST_F(AgentQuittingTest, ComesBackLateForAnIntervalBeyondCounting) {
    subscribe("http://example.org/1", clock.now(), 1e300);
    EXPECT_EQ(quit(), 9000000000000000000);
    EXPECT_FALSE(log.contains("Oops"));
}

TEST_F(AgentQuittingTest, LeavesFeedsOutThatAreNeverDue) {
    subscribe("http://example.org/never", clock.now() - 5000, -1);
    EXPECT_EQ(quit(), 31536000);
    subscribe("http://example.org/1", clock.now(), 7200);
    EXPECT_EQ(quit(), 7200);
}

TEST_F(AgentQuittingTest, ComesBackInAMinuteForAnOverdueFeed) {
    subscribe("http://example.org/1", clock.now() - 1500, 1000);
    EXPECT_EQ(quit(), 60);
    EXPECT_TRUE(log.contains("[Agent] Oops, start interval of -500.0 is too short"));
    EXPECT_TRUE(
        log.contains("Scheduling restart by svcd in 60 seconds "
                     "(at 2026-01-01 00:01:00 +0000)."));
}

TEST_F(AgentQuittingTest, ComesBackInAMinuteForWhatIsSooner) {
    subscribe("http://example.org/1", clock.now() - 940.5, 1000);
    EXPECT_EQ(quit(), 60);
    EXPECT_TRUE(log.contains("start interval of 59.5 is too short"));
}

TEST_F(AgentQuittingTest, TakesAMinuteAsItIs) {
    subscribe("http://example.org/1", clock.now() - 940, 1000);
    EXPECT_EQ(quit(), 60);
    EXPECT_FALSE(log.contains("Oops"));
}

TEST_F(AgentQuittingTest, ComesBackForTheSyncIfThatIsSooner) {
    FakeSync sync;
    sync.remaining = 180;
    subscribe("http://example.org/1", clock.now(), 1000);
    EXPECT_EQ(quit(), 180);
    EXPECT_TRUE(log.contains("[Agent] Next fetch in 1000.0 sec, next skerry sync in 180.0 sec"));
    sync.remaining = 2000;
    EXPECT_EQ(quit(), 1000);
}

TEST_F(AgentQuittingTest, LeavesSyncOutThatIsNotWanted) {
    FakeSync sync;
    sync.enabled = false;
    sync.remaining = 180;
    EXPECT_EQ(quit(), 31536000);
    EXPECT_FALSE(log.contains("skerry"));
}

TEST_F(AgentQuittingTest, WaitsForASync) {
    FakeSync sync;
    sync.syncing = true;
    task->resetQuitTimer(1);
    EXPECT_EQ(quit(), -1);
    EXPECT_EQ(remaining(), 120.0);
    sync.syncing = false;
    EXPECT_EQ(quit(), 31536000);
}

TEST_F(AgentQuittingTest, WaitsForRefreshes) {
    FeedCore* feed = subscribe("http://example.org/1", clock.now(), 1000);
    task->resetQuitTimer(1);
    post(FeedCore::kWillRefreshNotification, feed);
    EXPECT_EQ(quit(), -1);
    EXPECT_EQ(remaining(), 120.0);
    post(FeedCore::kEndedUpdateLocalNotification, feed);
    EXPECT_EQ(quit(), 1000);
}

TEST_F(AgentQuittingTest, WaitsForDownloads) {
    platform.deliver("com.tarnwick.orvane.EnclosureDownloadStarted", "1", nullptr);
    task->resetQuitTimer(1);
    EXPECT_EQ(quit(), -1);
    EXPECT_EQ(remaining(), 120.0);
    platform.deliver("com.tarnwick.orvane.EnclosureDownloadEnded", "1", nullptr);
    EXPECT_EQ(quit(), 31536000);
}

TEST_F(AgentQuittingTest, UsesWhatItFoundBeforeAFailure) {
    db().execute("alter table Subscriptions rename to Gone");
    EXPECT_EQ(quit(), 31536000);
    EXPECT_TRUE(log.contains("void Orvane::AgentTask::quit()"));
    db().execute("alter table Gone rename to Subscriptions");
}

TEST_F(AgentQuittingTest, EndsEvenIfItCannotComeBack) {
    services.intervalError = 95;
    EXPECT_TRUE(runUntilQuit());
    EXPECT_TRUE(log.contains("AgentTask: Got error updating launch interval: 95"));
}

TEST_F(AgentQuittingTest, DoesNotWarnIfAllIsWell) {
    EXPECT_TRUE(runUntilQuit());
    EXPECT_FALSE(log.contains("launch interval"));
}

TEST_F(AgentQuittingTest, PutsTheEndOffAnew) {
    log.clear();
    task->resetQuitTimer(0.5);
    EXPECT_EQ(remaining(), 0.5);
    EXPECT_THAT(agentLines(),
                ElementsAre("[Agent] Agent will quit after 0.5 seconds of inactivity."));
}

TEST(AgentQuitting, WaitsForFilesThatAreBeingDeleted) {
    const Support::TempDir directory;
    const Support::LogCapture log;
    {
        const AutoreleasePool pool;
        Support::ManualClock clock;
        FakeServiceManager services;
        AgentTask task;
        // A directory is no file to be deleted, and the warning about it waits for this pool.
        const Ref<URL> url = URL::urlWithFileSystemPath(directory.path().c_str(), true);
        const Ref<FileUtils::ArrayOfURLs> files = FileUtils::ArrayOfURLs::array({url});
        FileUtils::asyncDeleteFiles(files);
        task.quit();
        EXPECT_THAT(services.intervals, IsEmpty());
        EXPECT_EQ(task.getQuitTimer().getTimeRemaining(), 120.0);
    }
    FileDeletionQueue::shared().waitUntilIdle();
}

}  // namespace
