// The agent's start, and its end.

#include "Agent/AgentTest.h"
#include "Foundation/NetException.h"
#include "Foundation/PreferenceKeys.h"
#include "SQLite/Exception.h"
#include "Support/AssertionOf.h"
#include "Support/FileAccess.h"

#include <gmock/gmock.h>

#include <algorithm>
#include <functional>

using namespace Foundation;
using namespace Orvane;
using Support::EnvVar;
using testing::Contains;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsSupersetOf;
using Strings = std::vector<std::string>;

namespace {

class AgentTaskTest : public AgentTest {
 protected:
    /// Where in the log a line with that text stands; -1 without one.
    int lineOf(const std::string& text) const {
        const auto& lines = log.lines();
        const auto found = std::find_if(lines.begin(), lines.end(), [&](const auto& line) {
            return line.find(text) != std::string::npos;
        });
        return found == lines.end() ? -1 : static_cast<int>(found - lines.begin());
    }
    void start(bool registerType = false) {
        task = std::make_unique<AgentTask>();
        task->start(registerType);
    }
};

TEST_F(AgentTaskTest, IsTheOnlyOne) {
    EXPECT_EQ(Support::assertionOf([] { AgentTask::sharedInstance(); }), "No AgentTask instance");
    {
        AgentTask only;
        EXPECT_EQ(&AgentTask::sharedInstance(), &only);
        EXPECT_EQ(Support::assertionOf([] { AgentTask second; }),
                  "There is already an AgentTask instance");
        EXPECT_EQ(&AgentTask::sharedInstance(), &only);
    }
    EXPECT_EQ(Support::assertionOf([] { AgentTask::sharedInstance(); }), "No AgentTask instance");
}

TEST_F(AgentTaskTest, HasThePreferencesOfTheApplication) {
    EXPECT_EQ(&AgentTask::getAgentPrefs(), &Prefs::applicationPrefs());
}

TEST_F(AgentTaskTest, StartsInOrder) {
    FakeRegistry registry;
    FakeSync sync;
    registry.answer = false;
    writeFile("../ServiceAgents/com.tarnwick.Orvane.Agent.plist", "");
    start(true);
    const std::vector<int> places{
        lineOf("[Agent] Starting AgentTask"),
        lineOf("Unregistering old svcd plist file"),
        lineOf("Could not register Orvane Agent with Type Registry!"),
        lineOf("No database exists"),
        lineOf("[Agent] Preloading tables duration "),
        lineOf("[Agent] Time now "),
        lineOf("[Agent] Agent will quit after 15 seconds of inactivity.")};
    EXPECT_THAT(places, testing::Each(testing::Ge(0)));
    EXPECT_TRUE(std::is_sorted(places.begin(), places.end())) << testing::PrintToString(places);
    EXPECT_EQ(sync.scheduled, 1);
    EXPECT_TRUE(db().isOpen());
    EXPECT_TRUE(db().isWriteable());
}

TEST_F(AgentTaskTest, RegistersItsTypesOnlyIfTold) {
    FakeRegistry registry;
    start(false);
    EXPECT_EQ(registry.calls, 0);
    task.reset();
    start(true);
    EXPECT_EQ(registry.calls, 1);
    EXPECT_FALSE(log.contains("Type Registry"));
}

TEST_F(AgentTaskTest, TakesTheDesktopsTypesAsTheyAre) {
    EXPECT_TRUE(TypeRegistry::current().registerApplication());
}

TEST_F(AgentTaskTest, HoldsRefreshesOffForTwoSeconds) {
    const double began = clock.now();
    start();
    EXPECT_EQ(task->getHoldOffUntil(), began + 2.0);
    EXPECT_EQ(task->getRefreshTimer().getTimeRemaining(), 2.0);
    EXPECT_EQ(task->getQuitTimer().getTimeRemaining(), 15.0);
    EXPECT_TRUE(
        log.contains(OVFormat("[Agent] Time now %.3f, hold off until %.3f", began, began + 2.0)));
}

TEST_F(AgentTaskTest, LeavesSyncAloneThatIsNotWanted) {
    FakeSync sync;
    sync.enabled = false;
    start();
    EXPECT_EQ(sync.scheduled, 0);
}

TEST_F(AgentTaskTest, WaitsForADebuggerIfAsked) {
    {
        const EnvVar pause("OVPauseOnLaunch", "");
        start();
    }
    EXPECT_EQ(log.lines().front(), "[Agent] Pausing 30 seconds before starting...");
    EXPECT_EQ(clock.slept(), 30.0);
    task.reset();

    UntypedPref(AgentTask::getAgentPrefs(), "PauseOnLaunch") = true;
    start();
    EXPECT_EQ(clock.slept(), 60.0);
    task.reset();
    UntypedPref(AgentTask::getAgentPrefs(), "PauseOnLaunch") = nullptr;

    const EnvVar pause("OVPauseOnLaunch", "no");
    start();
    EXPECT_EQ(clock.slept(), 60.0);
}

TEST_F(AgentTaskTest, NeverQuitsIfTold) {
    const EnvVar dontQuit("OVAgentDontQuit", "");
    start();
    EXPECT_TRUE(log.contains("[Agent] OVAgentDontQuit is set -- No quit timer"));
    EXPECT_FALSE(task->getQuitTimer().isRunning());
    post(NotificationNames::kCallHandled);
    post(NotificationNames::kSCGIHandlerCreated);
    task->resetQuitTimer(1);
    EXPECT_FALSE(task->getQuitTimer().isRunning());
    EXPECT_FALSE(log.contains("seconds of inactivity"));
    clock.advanceBy(1000);
    EXPECT_TRUE(services.intervals.empty());
}

TEST_F(AgentTaskTest, QuitsAsUsualIfTheSwitchIsOff) {
    const EnvVar dontQuit("OVAgentDontQuit", "0");
    start();
    EXPECT_TRUE(task->getQuitTimer().isRunning());
}

TEST_F(AgentTaskTest, ReadsClientsFeedsAndSubscriptionsBeforehand) {
    start();
    subscribe("http://example.org/1");
    task.reset();
    {
        const Support::LoggingOn sql({&SQLite::gLogSQL});
        log.clear();
        start();
    }
    const int clients = lineOf("SELECT * FROM Clients");
    const int feeds = lineOf("SELECT * FROM Feeds");
    const int subscriptions = lineOf("SELECT * FROM Subscriptions");
    EXPECT_LT(0, clients);
    EXPECT_LT(clients, feeds);
    EXPECT_LT(feeds, subscriptions);
    EXPECT_EQ(SQLite::TableOf<ClientCore>::instance()->getCachedRowCount(), 1u);
    // With the client's settings.
    EXPECT_EQ(SQLite::TableOf<SubscriptionCore>::instance()->getCachedRowCount(), 2u);
}

TEST_F(AgentTaskTest, GivesFeedsTheirIdentifiersBeforehand) {
    start();
    const FeedCore* feed = subscribe("http://example.org/1");
    const std::string known = feed->getIdentifier()->utf8();
    db().execute("update Feeds set identifier = null");
    task.reset();
    start();
    EXPECT_THAT(rows("select identifier from Feeds"), ElementsAre(known));
}

TEST_F(AgentTaskTest, SaysHowLongTheTablesTook) {
    start();
    EXPECT_TRUE(log.contains("[Agent] Preloading tables duration 0 ms"));
}

TEST_F(AgentTaskTest, ServesEvenIfTheTablesCannotBeRead) {
    start();
    db().execute("alter table Clients rename to Gone");
    task.reset();
    log.clear();
    start();
    EXPECT_TRUE(log.contains("void Orvane::AgentTask::start(bool)"));
    EXPECT_TRUE(log.contains("hold off until"));
    post(NotificationNames::kCallHandled);
    EXPECT_EQ(task->getQuitTimer().getTimeRemaining(), 120.0);
    EXPECT_TRUE(task->getRefreshTimer().isRunning());
}

TEST_F(AgentTaskTest, DoesNotStartWithoutADatabase) {
    writeFile("Database", "not a directory");
    task = std::make_unique<AgentTask>();
    EXPECT_THROW(task->start(false), NetException);
    EXPECT_FALSE(task->getQuitTimer().isRunning());
    EXPECT_FALSE(log.contains("hold off until"));
}

TEST_F(AgentTaskTest, ObservesWhatConcernsIt) {
    start();
    EXPECT_THAT(platform.subscriptions,
                IsSupersetOf({"com.tarnwick.orvane.EnclosureDownloadStarted ",
                              "com.tarnwick.orvane.EnclosureDownloadEnded "}));
    for (const NotificationName* name :
         {&NotificationNames::kCallHandled, &NotificationNames::kSCGIHandlerCreated}) {
        task->resetQuitTimer(1);
        post(*name);
        EXPECT_EQ(task->getQuitTimer().getTimeRemaining(), 120.0) << name->text();
    }
}

TEST_F(AgentTaskTest, ClosesTheDatabaseAtItsEnd) {
    start();
    subscribe("http://example.org/1")->mTitle.setValue(String::string("unsaved"));
    log.clear();
    task.reset();
    EXPECT_EQ(log.lines().front(), "[Agent] ===== Closing database =====");
    EXPECT_FALSE(db().isOpen());
    db().open((storage() / "Database/Database.sqlite3").c_str(), false);
    EXPECT_THAT(rows("select title from Feeds"), ElementsAre("unsaved"));
}

TEST_F(AgentTaskTest, ReportsADatabaseThatCannotBeSavedAtItsEnd) {
    start();
    FeedCore* feed = subscribe("http://example.org/1");
    db().execute(
        "create trigger Refusal before update on Feeds begin select raise(abort, 'refused'); end");
    feed->mTitle.setValue(String::string("unsaved"));
    log.clear();
    task.reset();
    EXPECT_TRUE(log.contains("virtual Orvane::AgentTask::~AgentTask()"));
    EXPECT_EQ(Support::assertionOf([] { AgentTask::sharedInstance(); }), "No AgentTask instance");
    if (db().isOpen()) db().execute("drop trigger Refusal");
}

TEST_F(AgentTaskTest, HearsOfNothingAfterItsEnd) {
    start();
    const FeedCore* feed = subscribe("http://example.org/1");
    task.reset();
    log.clear();
    for (const NotificationName* name : NotificationName::all()) {
        if (name->getChannel() == NotificationName::Channel::Local) {
            post(*name, const_cast<FeedCore*>(feed));
        } else {
            platform.deliver(name->text(), "", nullptr);
        }
    }
    EXPECT_EQ(agentLines(), Strings());
    EXPECT_FALSE(log.contains("AgentTask"));
}

}  // namespace
