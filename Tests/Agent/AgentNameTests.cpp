#include "Agent/AgentName.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Bus.h"
#include "Foundation/BusCenter.h"
#include "Foundation/BusPeer.h"
#include "Support/EnvVar.h"
#include "Support/LogCapture.h"
#include "Support/PrivateBus.h"
#include "Support/TempDir.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

using namespace Foundation;
using Orvane::AgentName;

namespace {

class AgentNameTest : public testing::Test {
 protected:
    ~AgentNameTest() noexcept override { Bus::user().releaseName(BusCenter::kAgentName); }

    AutoreleasePool pool;
    Support::LogCapture log;
    Support::PrivateBus bus;
};

TEST_F(AgentNameTest, IsOursIfNobodyHasIt) {
    EXPECT_EQ(AgentName::claim(), AgentName::Claim::kOurs);
    EXPECT_EQ(Bus::user().getNameOwner(BusCenter::kAgentName), Bus::user().getUniqueName());
    EXPECT_EQ(AgentName::claim(), AgentName::Claim::kOurs);
}

TEST_F(AgentNameTest, StaysWithWhoeverHasIt) {
    BusPeer other(bus);
    other.own(BusCenter::kAgentName);
    EXPECT_EQ(AgentName::claim(), AgentName::Claim::kTaken);
    EXPECT_EQ(Bus::user().getNameOwner(BusCenter::kAgentName), other.name());
    // It is not waited for either.
    other.disown(BusCenter::kAgentName);
    EXPECT_EQ(Bus::user().getNameOwner(BusCenter::kAgentName), "");
}

TEST_F(AgentNameTest, CannotBeHadWithoutABus) {
    const Support::EnvVar nowhere("DBUS_SESSION_BUS_ADDRESS", "unix:path=/nonexistent/bus");
    const Support::EnvVar noPrograms("PATH", "/nonexistent");
    Bus::user().close();
    EXPECT_EQ(AgentName::claim(), AgentName::Claim::kNoBus);
    AgentName::giveUp();
}

TEST_F(AgentNameTest, IsGivenUpBeforeWhatCameIsServed) {
    ASSERT_EQ(AgentName::claim(), AgentName::Claim::kOurs);
    std::vector<std::string> served;
    const BusSubscriptionPtr subscription = Bus::user().subscribe(
        {.interface = "org.example.Test", .member = "Said"}, [&](BusMessage& signal) {
            std::string text;
            EXPECT_TRUE(signal.read(text));
            served.push_back(text + " " + Bus::user().getNameOwner(BusCenter::kAgentName));
        });
    BusPeer peer(bus);
    for (const char* text : {"first", "second"}) {
        BusMessage signal = peer.signal("/", "org.example.Test", "Said");
        signal.append(text);
        peer.send(signal);
    }
    peer.settle();
    EXPECT_EQ(served, std::vector<std::string>());
    AgentName::giveUp();
    EXPECT_EQ(served, (std::vector<std::string>{"first ", "second "}));
    EXPECT_EQ(Bus::user().getNameOwner(BusCenter::kAgentName), "");
}

TEST_F(AgentNameTest, IsGivenUpWithoutEndIfWorkGoesOn) {
    ASSERT_EQ(AgentName::claim(), AgentName::Claim::kOurs);
    int turns = 0;
    // Something that has work in every turn must not keep the process.
    std::function<void()> again = [&] {
        if (++turns < 1000000) Bus::user().onLaterTurn(again);
    };
    Bus::user().onLaterTurn(again);
    AgentName::giveUp();
    EXPECT_LT(turns, 1000000);
}

}  // namespace
