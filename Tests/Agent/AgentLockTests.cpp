#include "Agent/AgentLock.h"

#include "Agent/AgentTest.h"
#include "Foundation/UniqueFD.h"

#include <fcntl.h>
#include <gmock/gmock.h>
#include <sys/file.h>

#include <optional>

using Foundation::UniqueFD;
using Orvane::AgentLock;

namespace {

class AgentLockTest : public AgentTest {};

TEST_F(AgentLockTest, IsHadByOneAtATime) {
    std::optional<AgentLock> first(std::in_place);
    EXPECT_TRUE(first->take(0));
    AgentLock second;
    EXPECT_FALSE(second.take(0));
    EXPECT_EQ(clock.slept(), 0);
    first.reset();
    EXPECT_TRUE(second.take(0));
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(AgentLockTest, WaitsForTheOther) {
    AgentLock first;
    EXPECT_TRUE(first.take(0));
    AgentLock second;
    EXPECT_FALSE(second.take(AgentLock::kWaitSeconds));
    EXPECT_NEAR(clock.slept(), AgentLock::kWaitSeconds, AgentLock::kRetrySeconds);
}

TEST_F(AgentLockTest, IsPrivate) {
    AgentLock lock;
    EXPECT_TRUE(lock.take(0));
    const auto permissions = std::filesystem::status(storage() / ".agent").permissions();
    EXPECT_EQ(static_cast<int>(permissions), 0600);
}

TEST_F(AgentLockTest, DoesNotStopAnAgentThatHasNoStorage) {
    std::filesystem::create_directories(base.path());
    base.writeFile("Orvane", "in the way");
    AgentLock lock;
    EXPECT_TRUE(lock.take(AgentLock::kWaitSeconds));
    EXPECT_TRUE(log.contains("[WARNING] The storage cannot be locked: Not a directory"));
    EXPECT_EQ(clock.slept(), 0);
}

}  // namespace
