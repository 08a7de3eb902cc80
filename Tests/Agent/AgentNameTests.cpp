#include "Agent/AgentName.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Bus.h"
#include "Foundation/BusCenter.h"
#include "Foundation/BusPeer.h"
#include "Foundation/RunLoop.h"
#include "Foundation/RunLoopSource.h"
#include "Foundation/UniqueFD.h"
#include "Support/EnvVar.h"
#include "Support/LogCapture.h"
#include "Support/ManualClock.h"
#include "Support/PrivateBus.h"
#include "Support/TempDir.h"

#include <fcntl.h>
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
    Support::ManualClock clock;
    const double start = clock.now();
    // Something that has work in every turn must not keep the process, nor may the end of a run, as
    // at a signal, keep others from being served.
    const UniqueFD endless(open("/dev/zero", O_RDONLY | O_CLOEXEC));
    FileDescriptorSource work(endless.get());
    work.setReadHandler([&] {
        clock.sleep(0.5);
        RunLoop::current().stop();
        if (clock.now() > start + 1000) work.removeFromLoop();
    });
    work.addTo(RunLoop::current(), RunLoop::kDefaultMode);
    AgentName::giveUp();
    EXPECT_EQ(clock.now(), start + AgentName::kServeSeconds);
}

}  // namespace
