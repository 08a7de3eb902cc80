// The agent ends or is killed while applications live on.

#include "Bridges/ApplicationsTest.h"

#include <csignal>
#include <cstdlib>
#include <set>
#include <string>
#include <vector>

using Support::turnUntil;

namespace {

/// The agent ends between calls: it is killed, or it ends in order, as it does when it is idle.
class AgentBetweenCalls : public ApplicationsTest, public testing::WithParamInterface<int> {};

/// The agent is killed with a call that it has got.
class AgentDuringCalls : public ApplicationsTest {
 protected:
    AgentDuringCalls() { subscribeTwo(); }

    /// Has the first application make the call, and kills the agent before it looks at that. What
    /// the application says.
    std::string interrupt(const std::string& command, const std::string& method) {
        BusMonitor monitor(bus);
        const pid_t running = agent();
        EXPECT_GT(running, 0);
        kill(running, SIGSTOP);
        first->send(command);
        EXPECT_TRUE(monitor.seesCall(method));
        endAgent(SIGKILL);
        return first->answer();
    }
};

/// The agent is killed at any time.
class AgentAtAnyTime : public ApplicationsTest {};

/// The agent ends by itself.
class AgentWhenIdle : public ApplicationsTest {};

constexpr const char* kLost = "failed Orvane 203";

}  // namespace

TEST_P(AgentBetweenCalls, ReadsGoOnAndTheNextChangeStartsAnother) {
    subscribeTwo();
    std::string marks;
    for (const char* change : {"read One", "flag One", "unflag One"}) {
        SCOPED_TRACE(change);
        const std::string before = "One:" + marks;
        endAgent(GetParam());
        for (const auto* each : {&first, &second}) {
            EXPECT_EQ((*each)->ask("title feed"), "The feed");
            EXPECT_EQ((*each)->ask("state One"), before);
            EXPECT_EQ((*each)->ask("list feed"), before + " Two:");
            EXPECT_EQ((*each)->ask("query"), before + " Two:");
        }
        EXPECT_EQ(agent(), 0);

        marks = marks.empty() ? "r" : marks == "r" ? "rf" : "r";
        EXPECT_EQ(first->ask(change), "One:" + marks);
        EXPECT_GT(agent(), 0);
        EXPECT_TRUE(first->hears("flags feed One"));
        EXPECT_TRUE(second->hears("flags feed One"));
        EXPECT_EQ(second->ask("state One"), "One:" + marks);
    }
    EXPECT_TRUE(second->hears("count feed 1"));
}

TEST_P(AgentBetweenCalls, OneThatTurnsNoLoopGetsRightAnswers) {
    subscribeTwo();
    const auto reader = subscriber("Reader", false);
    EXPECT_EQ(reader->ask("state One"), "One:");
    endAgent(GetParam());
    EXPECT_EQ(reader->ask("query"), "One: Two:");
    EXPECT_EQ(agent(), 0);
    EXPECT_EQ(second->ask("read One"), "One:r");
    EXPECT_EQ(reader->ask("state One"), "One:r");
    endAgent(GetParam());
    EXPECT_EQ(reader->ask("flag Two"), "Two:f");
    EXPECT_TRUE(second->hears("flags feed Two"));
    EXPECT_EQ(second->ask("query"), "One:r Two:f");
}

TEST_P(AgentBetweenCalls, ARefreshIsOverForAll) {
    subscribeTwo();
    EXPECT_TRUE(first->hears("end feed"));
    EXPECT_TRUE(second->hears("end feed"));
    server.answer("/feed", Support::ServerAnswer().holdHead("gate"));
    EXPECT_EQ(first->ask("refresh feed"), "started");
    EXPECT_TRUE(turnUntil([&] { return server.getWaitingCount("gate") == 1; }));
    for (const auto* each : {&first, &second}) {
        EXPECT_TRUE((*each)->hears("begin feed"));
        EXPECT_EQ((*each)->ask("refreshing feed"), "yes");
    }
    endAgent(GetParam());
    for (const auto* each : {&first, &second}) {
        EXPECT_TRUE((*each)->hears("end feed"));
        EXPECT_EQ((*each)->ask("refreshing feed"), "no");
    }
    EXPECT_EQ(agent(), 0);

    serve({"Three", "One", "Two"});
    EXPECT_EQ(second->ask("refresh feed"), "started");
    for (const auto* each : {&first, &second}) {
        EXPECT_TRUE((*each)->hears("begin feed"));
        EXPECT_TRUE(brings(**each, {"Three"}));
        EXPECT_TRUE((*each)->hears("end feed"));
    }
}

INSTANTIATE_TEST_SUITE_P(Signals, AgentBetweenCalls, testing::Values(SIGKILL, SIGTERM),
                         [](const auto& signal) {
                             return std::string(signal.param == SIGKILL ? "Killed" : "Ended");
                         });

TEST_F(AgentDuringCalls, EveryChangeThatIsLostFailsAndCanBeMadeAgain) {
    struct Change {
        std::string command;
        std::string method;
        std::string done;
        std::set<std::string> told;  ///< whose flags the other one hears of
    };
    const std::vector<Change> changes = {
        {"read One", "entry_setRead", "One:r", {"One"}},
        {"flag Two", "entry_setFlagged", "Two:f", {"Two"}},
        {"all", "entries_setflags", "One:rf Two:rf", {"One", "Two"}},
        {"interval feed", "subscription_set", "3600", {}},
        {"add " + server.url("/other"), "subscription_create", "added", {}},
        {"refresh feed", "feed_refresh", "started", {}},
        {"remove other", "subscription_delete", "removed", {}},
    };
    std::string states = "One: Two:";
    for (const Change& change : changes) {
        SCOPED_TRACE(change.command);
        const std::string said = interrupt(change.command, change.method);
        // That a feed could not be removed is all that there is to say.
        EXPECT_EQ(said, change.method == "subscription_delete" ? "failed" : kLost);
        EXPECT_EQ(agent(), 0);
        for (const auto* each : {&first, &second}) {
            EXPECT_EQ((*each)->ask("query"), states);
        }
        EXPECT_EQ(first->ask(change.command), change.done);
        EXPECT_GT(agent(), 0);
        states = first->ask("query");
        EXPECT_TRUE(second->hearsOfAll({"flags feed"}, change.told));
        EXPECT_EQ(second->ask("query"), states);
    }
    EXPECT_EQ(states, "One:rf Two:rf");
    EXPECT_TRUE(second->hears("count feed 0"));
}

TEST_F(AgentDuringCalls, ABatchThatIsLostChangesNothing) {
    // It has no way to fail but in the log.
    EXPECT_EQ(interrupt("batch", "entries_setflags"), "One: Two:");
    EXPECT_EQ(first->ask("batch"), "One:r Two:r");
    EXPECT_TRUE(second->hears("count feed 0"));
}

TEST_F(AgentDuringCalls, AClientThatIsLostCanBeMadeAgain) {
    BusMonitor monitor(bus);
    const pid_t running = agent();
    ASSERT_GT(running, 0);
    kill(running, SIGSTOP);
    const auto third = launch("Third");
    EXPECT_TRUE(monitor.seesCall("client_create"));
    endAgent(SIGKILL);
    EXPECT_EQ(third->answer(), kLost);
    EXPECT_EQ(application("Third")->ask("feeds"), "");
}

TEST_F(AgentAtAnyTime, NothingIsLostThatWasDone) {
    const std::vector<std::string> titles = {"A", "B", "C", "D", "E", "F"};
    serve(titles);
    std::vector<std::unique_ptr<TestApplication>> applications;
    for (const std::string& title : titles) {
        applications.push_back(subscriber("Reader" + title));
    }
    EXPECT_EQ(applications[0]->ask("refresh feed"), "started");
    for (const auto& each : applications) {
        EXPECT_TRUE(brings(*each, {titles.begin(), titles.end()}));
    }
    for (int round = 0; round < 10; ++round) {
        SCOPED_TRACE(round);
        const std::string verb = round % 2 == 0 ? "flag " : "unflag ";
        const std::string mark = round % 2 == 0 ? ":f" : ":";
        for (std::size_t i = 0; i < titles.size(); ++i) {
            applications[i]->send(verb + titles[i]);
        }
        // Whatever it does just then.
        const pid_t running = agent();
        if (running > 0) kill(running, SIGKILL);
        for (std::size_t i = 0; i < titles.size(); ++i) {
            std::string said = applications[i]->answer();
            for (int again = 0; said.starts_with("failed Orvane 20") && again < 10; ++again) {
                said = applications[i]->ask(verb + titles[i]);
            }
            EXPECT_EQ(said, titles[i] + mark);
        }
    }
    // The last round's changes are there. Of what an agent had no time left to tell, others hear
    // with what the next one tells.
    EXPECT_EQ(application("Fresh")->ask("add " + url()), "added");
    EXPECT_EQ(application("Fresh")->ask("query"), "A: B: C: D: E: F:");
    EXPECT_EQ(applications[0]->ask("all"), "A:rf B:rf C:rf D:rf E:rf F:rf");
    for (const auto& each : applications) {
        EXPECT_TRUE(each->hears("flags feed A B C D E F"));
        EXPECT_EQ(each->ask("query"), "A:rf B:rf C:rf D:rf E:rf F:rf");
    }
}

TEST_F(AgentWhenIdle, QuitsAndComesBack) {
    subscribeTwo();
    if (std::getenv("ORVANE_SLOW_TESTS")) {
        // After two minutes without anything to do.
        ASSERT_TRUE(turnUntil([] { return agent() == 0; }, 300));
        EXPECT_NE(log().find("Agent quitting. Scheduling restart by svcd in"), std::string::npos);
    } else {
        endAgent(SIGTERM);
    }
    EXPECT_EQ(second->ask("query"), "One: Two:");
    EXPECT_EQ(agent(), 0);
    EXPECT_EQ(first->ask("read One"), "One:r");
    EXPECT_GT(agent(), 0);
    EXPECT_TRUE(second->hears("flags feed One"));
    EXPECT_TRUE(second->hears("count feed 1"));
}
