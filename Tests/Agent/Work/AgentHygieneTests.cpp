// How the agent looks after the database once a day.

#include "Agent/AgentHousekeeping.h"
#include "Agent/Work/HygieneTest.h"
#include "Foundation/NotificationRecorder.h"
#include "Model/EntryCore.h"
#include "SQLite/TableOf.h"

#include <gmock/gmock.h>

using namespace Foundation;
using namespace Orvane;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using Strings = std::vector<std::string>;

// When.

TEST_F(AgentHygieneTest, ComesFourMinutesAfterTheStartOfANewInstallation) {
    startAgent();
    EXPECT_NEAR(remaining(), 240, 1e-6);
    EXPECT_EQ(task->getNextHygieneDate()->getAbsoluteTime(), 86400);
}

TEST_F(AgentHygieneTest, ComesADayAfterTheLastOne) {
    preferences.set("LastHygieneRun", clock.now() - 1000);
    startAgent();
    EXPECT_NEAR(remaining(), kDay - 1000, 1e-6);
    EXPECT_EQ(task->getNextHygieneDate()->getAbsoluteTime(), clock.now() + kDay - 1000);
}

TEST_F(AgentHygieneTest, WaitsOnlyWhereItIsOverdueByMoreThanTheWait) {
    preferences.set("LastHygieneRun", clock.now() - kDay - 240);
    startAgent();
    EXPECT_NEAR(remaining(), -240, 1e-6);
    preferences.set("LastHygieneRun", clock.now() - kDay - 240.5);
    task->scheduleHygieneTasks();
    EXPECT_NEAR(remaining(), 240, 1e-6);
}

TEST_F(AgentHygieneTest, TakesALastRunInTheFutureForNone) {
    preferences.set("LastHygieneRun", clock.now() + kDay);
    startAgent();
    EXPECT_NEAR(remaining(), 2 * kDay, 1e-6);
    preferences.set("LastHygieneRun", clock.now() + kDay + 1);
    task->scheduleHygieneTasks();
    EXPECT_NEAR(remaining(), 240, 1e-6);
}

TEST_F(AgentHygieneTest, ReadsItsIntervalsOnce) {
    EXPECT_EQ(AgentTask::getHygieneRunInterval(), 86400);
    EXPECT_EQ(AgentTask::getHygieneBackoffInterval(), 240);
    preferences.set("HygieneRunInterval", 100);
    preferences.set("HygieneBackoffInterval", 10);
    EXPECT_EQ(AgentTask::getHygieneRunInterval(), 86400);
    EXPECT_EQ(AgentTask::getHygieneBackoffInterval(), 240);
    preferences.forgetKept();
    EXPECT_EQ(AgentTask::getHygieneRunInterval(), 100);
    EXPECT_EQ(AgentTask::getHygieneBackoffInterval(), 10);
}

TEST_F(AgentHygieneTest, ReadsAnIntervalOf0Again) {
    preferences.set("HygieneRunInterval", 0);
    EXPECT_EQ(AgentTask::getHygieneRunInterval(), 0);
    preferences.set("HygieneRunInterval", 50);
    EXPECT_EQ(AgentTask::getHygieneRunInterval(), 50);
}

// The run.

TEST_F(AgentHygieneTest, RunsInOrderAndSaysHowLongEachStepTook) {
    start();
    entry(feedExpiring({1000.0}), "old", 999);
    clock.advanceBy(240);
    EXPECT_THAT(agentLines(),
                ElementsAre("[Agent] ===== Good morning! -- it's time for database calisthenics! "
                            "=====",
                            "[Agent] Checking database integrity...",
                            "[Agent] Bumping subscription expiration dates...",
                            "[Agent] Expunging old entries...",
                            "[Agent] Deleted 1 entries, 3 contents, 1 enclosures",
                            "[Agent] Recomputing all subscription unread counts...",
                            "[Agent] Daily Task times: transaction 0, integrity 0, expiration 0, "
                            "expunge 0, unread-counts 0, vacuum 0, total 0",
                            "[Agent] ===== Finished with daily tasks =====",
                            HasSubstr("[Agent] === Next daily task time: 2026-01-02 00:04:0")))
        << testing::PrintToString(log.lines());
    EXPECT_TRUE(log.contains("*** Passed integrity_check on database"));
}

TEST_F(AgentHygieneTest, NotesWhenItRanAndComesAgainADayLater) {
    start();
    task->hygieneTasks();
    EXPECT_EQ(preferences.get("LastHygieneRun"), clock.now());
    EXPECT_NEAR(remaining(), kDay, 1e-6);
    EXPECT_EQ(task->getNextHygieneDate()->getAbsoluteTime(), clock.now() + kDay);
    // What another process would read.
    Prefs other;
    other.synchronize();
    EXPECT_EQ(AgentPreferences::kLastHygieneRun.valueIn(other), clock.now());
}

TEST_F(AgentHygieneTest, SplitsTheTimeBetweenTheSteps) {
    start();
    entry(feedExpiring({1000.0}), "old", 999);
    SlowLog slow(clock, "Bumping", 1.2346);
    task->hygieneTasks();
    EXPECT_TRUE(
        slow.contains("Daily Task times: transaction 0, integrity 0, expiration 1235, "
                      "expunge 0, unread-counts 0, vacuum 0, total 1235"));
    EXPECT_FALSE(slow.contains("Daily Tasks took"));
    EXPECT_TRUE(slow.contains("Long work on the run loop: daily tasks took 1235 ms"));
}

TEST_F(AgentHygieneTest, WarnsWhereItTakesMoreThanFiveSecondsToTheEndOfTheExpunge) {
    start();
    {
        SlowLog slow(clock, "Expunging", 5.001);
        task->hygieneTasks();
        EXPECT_TRUE(slow.contains("[WARNING] AgentTask: Daily Tasks took 5001 msec"));
    }
    SlowLog slow(clock, "Expunging", 5.0);
    task->hygieneTasks();
    EXPECT_FALSE(slow.contains("Daily Tasks took"));
}

TEST_F(AgentHygieneTest, DoesNotWarnOfTimeForTheCounts) {
    start();
    entry(feedExpiring({1000.0}), "old", 999);
    SlowLog slow(clock, "Recomputing", 60);
    task->hygieneTasks();
    EXPECT_TRUE(slow.contains("unread-counts 60000"));
    EXPECT_FALSE(slow.contains("Daily Tasks took"));
}

TEST_F(AgentHygieneTest, WarnsOfALongIntegrityCheck) {
    start();
    SlowLog slow(clock, "Performing integrity_check", 0.2);
    task->hygieneTasks();
    EXPECT_TRUE(slow.contains("Long work on the run loop: integrity check took 200 ms"));
}

TEST_F(AgentHygieneTest, CountsOnlyWhereSomethingHasChanged) {
    start();
    task->hygieneTasks();
    EXPECT_FALSE(log.contains("Recomputing"));
    EXPECT_FALSE(log.contains("Deleted"));
    // A ghost alone will do.
    entry(0, "ghost", clock.now() - 2 * kDay - 1);
    task->hygieneTasks();
    EXPECT_TRUE(log.contains("[Agent] Busted 1 ghost entries"));
    EXPECT_TRUE(log.contains("Recomputing"));
}

TEST_F(AgentHygieneTest, EndsForTheDayWithAFileThatIsNotInOrder) {
    start();
    entry(feedExpiring({1000.0}), "old", 999);
    breakIntegrity();
    task->hygieneTasks();
    EXPECT_TRUE(log.contains("void Orvane::AgentTask::hygieneTasks()"));
    EXPECT_TRUE(log.contains("integrity check failed"));
    EXPECT_FALSE(log.contains("Bumping"));
    EXPECT_FALSE(log.contains("Finished with daily tasks"));
    EXPECT_FALSE(db().isInTransaction());
    EXPECT_THAT(titles(), ElementsAre("old"));
    EXPECT_EQ(preferences.get("LastHygieneRun"), clock.now());
    EXPECT_NEAR(remaining(), kDay, 1e-6);
}

TEST_F(AgentHygieneTest, HasABrokenFileRepaired) {
    start();
    breakIntegrity();
    task->hygieneTasks();
    clock.advanceBy(0);
    EXPECT_TRUE(log.contains("AgentTask: Notified of fatal database error"));
    EXPECT_EQ(count("sqlite_master where name='Odd'"), 0);
}

TEST_F(AgentHygieneTest, LetsNothingExpireByAClockThatIsBehindTheBuild) {
    start();
    const long long feed = feedExpiring({1000.0, std::nullopt});
    entry(feed, "old", 999);
    db().execute("update Subscriptions set expirationInterval=86400 where expirationDate is null");
    ClockTrust::setBuildDate(clock.now() + 1);
    task->hygieneTasks();
    EXPECT_THAT(titles(), ElementsAre("old"));
    EXPECT_EQ(count("Subscriptions where expirationDate is null"), 1);
    EXPECT_TRUE(
        log.contains("[WARNING] AgentTask: The clock says 2026-01-01 00:00:02 +0000, which "
                     "was before this was built. Nothing expires today"));
    EXPECT_TRUE(log.contains("Finished with daily tasks"));
    EXPECT_TRUE(log.contains("Passed integrity_check"));
    ClockTrust::setBuildDate(clock.now());
    task->hygieneTasks();
    EXPECT_THAT(titles(), IsEmpty());
}

TEST_F(AgentHygieneTest, GivesManyFreePagesBack) {
    start();
    db().execute("create table Big (a)");
    db().execute(
        "with n(i) as (select 1 union all select i+1 from n where i<300) "
        "insert into Big select zeroblob(4000) from n");
    db().execute("drop table Big");
    ASSERT_GE(db().execScalar("PRAGMA freelist_count"), 257);
    task->hygieneTasks();
    EXPECT_EQ(db().execScalar("PRAGMA freelist_count"), 0);
}

// Expiration dates.

TEST_F(AgentHygieneTest, MovesExpirationDatesToTheIntervalBeforeLocalMidnight) {
    // 2026-01-01 01:00 in Berlin: midnight was at 23:00 GMT.
    start();
    feedExpiring({1000.0, 1000.0, 1000.0});
    db().execute("update Subscriptions set expirationInterval=100 where rowID=1");
    db().execute(
        "insert into Subscriptions (client, feed, expirationInterval, expirationDate) "
        "values (2, 0, 5000, 0)");
    db().execute("update Subscriptions set expirationInterval=0 where rowID=2");
    EXPECT_TRUE(task->bumpExpirationDates());
    EXPECT_EQ(rows("select cast(expirationDate as integer) from Subscriptions order by rowID"),
              (Strings{"788914700", "788909800", "1000", "788909800"}));
    EXPECT_EQ(log.count("[Agent] Bumped exp date to "), 3);
    EXPECT_FALSE(task->bumpExpirationDates());
    clock.jumpTo(clock.now() + kDay);
    EXPECT_TRUE(task->bumpExpirationDates());
}

TEST_F(AgentHygieneTest, SavesEntriesAndAllElse) {
    start();
    const long long feed = feedExpiring({});
    const Ref<EntryCore> made = Returner<EntryCore>::adopted(new EntryCore);
    made->mTitle.setValue(String::string("new"));
    FeedCore::getRow(feed)->addToEntries(made);
    made->addToTable(SQLite::TableOf<EntryCore>::instance());
    task->bumpExpirationDates();
    EXPECT_THAT(titles(), ElementsAre("new"));
}

TEST_F(AgentHygieneTest, GoesOnWithTheDatesThatThereAreWhereMovingThemFails) {
    start();
    entry(feedExpiring({1000.0}), "old", 999);
    db().execute("update Subscriptions set expirationInterval=86400");
    db().execute(
        "create trigger Refusal before update on Subscriptions begin "
        "select raise(abort, 'refused'); end");
    EXPECT_FALSE(task->bumpExpirationDates());
    EXPECT_TRUE(log.contains("bool Orvane::AgentTask::bumpExpirationDates()"));
    task->hygieneTasks();
    EXPECT_THAT(titles(), IsEmpty());
    EXPECT_TRUE(log.contains("Finished with daily tasks"));
    db().execute("drop trigger Refusal");
}

// Counts.

TEST_F(AgentHygieneTest, CountsTheUnreadOfAllSubscriptionsAndSavesThat) {
    start();
    const long long a = feedExpiring({1000.0});
    feedExpiring({1000.0});
    db().execute("insert into Subscriptions (client, unreadCount) values (1, 7)");
    entry(a, "unread", 1001);
    entry(a, "old", 1000);
    entry(a, "read", 1001);
    db().execute("update Entries set read=1 where title='read'");
    db().execute("update Subscriptions set unreadCount=4 where rowID=2");
    NotificationRecorder changes;
    NotificationCenter::getLocal()->addObserver(
        changes, SubscriptionCore::kUnreadCountChangedNotification, nullptr);
    task->updateAllUnreadCounts();
    NotificationCenter::getLocal()->removeObserver(changes);
    EXPECT_EQ(rows("select unreadCount from Subscriptions order by rowID"),
              (Strings{"1", "0", "7"}));
    EXPECT_EQ(changes.notes.size(), 2u);
    EXPECT_TRUE(log.contains("[Agent] Recomputing all subscription unread counts..."));
}

// The port.

TEST_F(AgentHygieneTest, CountsInTheNextTurnForAMigration) {
    start();
    entry(feedExpiring({1000.0}), "unread", 1001);
    AgentHousekeeping housekeeping;
    housekeeping.updateAllUnreadCountsSoon();
    housekeeping.updateAllUnreadCountsSoon();
    EXPECT_EQ(count("Subscriptions where unreadCount=1"), 0);
    clock.advanceBy(0);
    EXPECT_EQ(count("Subscriptions where unreadCount=1"), 1);
    EXPECT_EQ(log.count("Recomputing"), 1);
}

TEST_F(AgentHygieneTest, DeletesForAClientThatLetsAllExpire) {
    start();
    AgentHousekeeping housekeeping;
    Housekeeping::setCurrent(&housekeeping);
    entry(feedExpiring({1000.0}), "seen", 1001);
    entry(1, "current", 1001, true);
    ClientCore::getRow(1)->expireAllEntries();
    Housekeeping::setCurrent(nullptr);
    EXPECT_THAT(titles(), ElementsAre("current"));
    EXPECT_EQ(count("Subscriptions where unreadCount=0"), 1);
}
