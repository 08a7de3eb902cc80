// The agent's program, on a bus.

#include "Agent/RPC/AgentService.h"
#include "Agent/Work/RefreshKillTest.h"
#include "Foundation/Bus.h"
#include "Foundation/BusCenter.h"
#include "Foundation/Dictionary.h"
#include "Foundation/PropertyListVariant.h"
#include "Support/BackgroundProcess.h"
#include "Support/PrivateBus.h"
#include "Support/TurnUntil.h"

#include <sys/wait.h>

#include <csignal>
#include <cstdint>
#include <fstream>
#include <iterator>
#include <memory>
#include <span>
#include <string>
#include <vector>

using namespace Foundation;
using namespace Orvane;
using Support::BackgroundProcess;
using Support::turnUntil;

namespace {

class AgentKill : public RefreshKillTest {
 protected:
    AgentKill() {
        mSubscription = Bus::user().subscribe({.sender = RPC::kServiceName,
                                               .path = BusCenter::kPath,
                                               .interface = BusCenter::kInterface,
                                               .member = BusCenter::kMember,
                                               .argument0 = "com.tarnwick.orvane.FeedEndedUpdate"},
                                              [this](BusMessage& signal) { take(signal); });
    }

    std::string agentLog() const {
        std::ifstream stream(base / "log");
        return {std::istreambuf_iterator<char>(stream), std::istreambuf_iterator<char>()};
    }

    /// What clients hear at the end of a refresh.
    void take(BusMessage& signal) {
        std::string name, feed;
        ASSERT_TRUE(signal.read(name) && signal.read(feed));
        const Ref<Dictionary> info = PropertyListVariant::read(signal);
        EXPECT_EQ(info->get("ErrorCode"), nullptr) << feed;
        acknowledged.insert(server.url("/feed/" + feed));
    }
    /// Starts the agent, and asks it for all feeds.
    void start() {
        mAgent = std::make_unique<BackgroundProcess>(std::vector<std::string>{
            "sh", "-c", "exec " ORVANE_AGENT " 2> '" + (base / "log") + "'"});
        ASSERT_TRUE(turnUntil([this] { return hasEnded() || isServing(); })) << agentLog();
        std::vector<std::int64_t> feeds;
        for (int i = 1; i <= kFeeds; ++i)
            feeds.push_back(i);
        BusMessage call = Bus::user().newCall(
            {RPC::kServiceName, RPC::kObjectPath, RPC::kInterface, "feed_refreshMultiple"});
        ASSERT_TRUE(
            Bus::user().send(call.append(std::span<const std::int64_t>(feeds)).append(false)));
    }
    static bool isServing() { return !Bus::user().getNameOwner(RPC::kServiceName).empty(); }
    bool hasEnded() {
        if (!mHasEnded) mHasEnded = waitpid(mAgent->getPID(), nullptr, WNOHANG) != 0;
        return mHasEnded;
    }
    /// Hears of so many feeds that their refresh has ended, if none has ended badly before.
    void awaitRefreshes(int refreshes) {
        EXPECT_TRUE(turnUntil([&] {
            return static_cast<int>(acknowledged.size()) >= refreshes || HasFailure() || hasEnded();
        })) << agentLog();
        EXPECT_FALSE(hasEnded()) << agentLog();
    }
    void killAgent() {
        kill(mAgent->getPID(), SIGKILL);
        // What it has told comes before the word of its end.
        EXPECT_TRUE(turnUntil([this] { return hasEnded() && !isServing(); }));
        Bus::user().deliverArrived();
        mAgent.reset();
        mHasEnded = false;
    }

    Support::EnvVar mData{"XDG_DATA_HOME", base.path().c_str()};
    Support::EnvVar mLog{"OVLog", "1"};
    Support::EnvVar mLogAgent{"OVLogAgent", "1"};
    Support::EnvVar mNoSystemLog{"OVUseSystemLog", "0"};
    Support::PrivateBus mBus;
    BusSubscriptionPtr mSubscription;
    std::unique_ptr<BackgroundProcess> mAgent;
    bool mHasEnded = false;
};

TEST_F(AgentKill, LosesNothingAcknowledgedAndGoesOn) {
    for (int i = 0; i < kills(); ++i) {
        beginRound();
        start();
        if (!HasFailure()) awaitRefreshes(between(0, kFeeds - 5));
        letSomeTimePass();
        killAgent();
        checkFiles();
        if (HasFailure()) return;
    }
    // One that nobody kills brings all of them up to date.
    beginRound();
    start();
    awaitRefreshes(kFeeds);
    killAgent();
    checkFiles();
    for (int feed = 1; feed <= kFeeds; ++feed)
        EXPECT_EQ(numbers[feed], round);
}

}  // namespace
