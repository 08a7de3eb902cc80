#include "Foundation/SessionApplications.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/ProcessInfo.h"
#include "Foundation/RunLoop.h"
#include "Support/ManualClock.h"
#include "Support/PrivateBus.h"
#include "Support/TurnUntil.h"

#include <gtest/gtest.h>

using namespace Foundation;
using Support::PrivateBus;
using Support::turnUntil;

namespace {

constexpr const char* kName = "com.tarnwick.orvane.Test";
constexpr const char* kLowerCasedName = "com.tarnwick.orvane.test";

/// The session of a private bus, with processes that the test makes up.
class SessionApplicationsTest : public testing::Test {
 protected:
    SessionApplicationsTest() {
        // The bus tells of this connection, which moves the seed, in its own time.
        Bus::user().connect();
        settle();
    }

    /// Serves what the bus has sent so far: it answers a name's request after it has told of it.
    void settle() {
        const std::int32_t before = session.getSeed();
        ASSERT_TRUE(Bus::user().requestName("com.tarnwick.orvane.Settled"));
        Bus::user().releaseName("com.tarnwick.orvane.Settled");
        ASSERT_TRUE(turnUntil([&] { return session.getSeed() >= before + 2; }));
    }

    ~SessionApplicationsTest() override { Bus::user().releaseName(kName); }

    /// What is found of processes holds as long as the test wants.
    Support::ManualClock clock;
    PrivateBus privateBus;
    std::set<std::string> processes;
    int looks = 0;
    SessionApplications session{Bus::user(), [this] {
                                    ++looks;
                                    return processes;
                                }};
};

}  // namespace

TEST_F(SessionApplicationsTest, FindsTheOwnerOfANameInAnyCase) {
    EXPECT_FALSE(session.isRunning(kLowerCasedName));
    const std::int32_t seed = session.getSeed();
    ASSERT_TRUE(Bus::user().requestName(kName));
    ASSERT_TRUE(turnUntil([&] { return session.getSeed() != seed; }));
    EXPECT_TRUE(session.isRunning(kLowerCasedName));
}

TEST_F(SessionApplicationsTest, NoticesThatANameIsGivenUp) {
    ASSERT_TRUE(Bus::user().requestName(kName));
    settle();
    EXPECT_TRUE(session.isRunning(kLowerCasedName));
    const std::int32_t seed = session.getSeed();
    Bus::user().releaseName(kName);
    ASSERT_TRUE(turnUntil([&] { return session.getSeed() != seed; }));
    EXPECT_FALSE(session.isRunning(kLowerCasedName));
}

TEST_F(SessionApplicationsTest, UniqueNamesAreNoApplications) {
    EXPECT_FALSE(session.isRunning(Bus::user().getUniqueName()));
}

TEST_F(SessionApplicationsTest, FindsProcesses) {
    processes = {"reader"};
    EXPECT_TRUE(session.isRunning("reader"));
    EXPECT_FALSE(session.isRunning("writer"));
}

TEST_F(SessionApplicationsTest, LooksAtProcessesOnceForEachSeed) {
    const std::int32_t seed = session.getSeed();
    session.isRunning("reader");
    session.isRunning("writer");
    EXPECT_EQ(looks, 1);
    EXPECT_EQ(session.getSeed(), seed);
    settle();
    session.isRunning("reader");
    EXPECT_EQ(looks, 2);
}

TEST_F(SessionApplicationsTest, NoticesProcessesThatCameAndWent) {
    const std::int32_t seed = session.getSeed();
    EXPECT_FALSE(session.isRunning("reader"));
    processes = {"reader"};
    clock.advanceBy(SessionApplications::kProcessesHoldSeconds - 1);
    EXPECT_EQ(session.getSeed(), seed);
    EXPECT_FALSE(session.isRunning("reader"));
    clock.advanceBy(1);
    EXPECT_NE(session.getSeed(), seed);
    EXPECT_TRUE(session.isRunning("reader"));
}

TEST_F(SessionApplicationsTest, DoesNothingAsLongAsNobodyAsks) {
    session.isRunning("reader");
    clock.advanceBy(SessionApplications::kProcessesHoldSeconds);
    const std::int32_t seed = session.getSeed();
    clock.advanceBy(1000 * SessionApplications::kProcessesHoldSeconds);
    EXPECT_EQ(session.getSeed(), seed);
    EXPECT_EQ(looks, 1);
}

TEST_F(SessionApplicationsTest, WithoutABusThereAreOnlyProcesses) {
    ASSERT_TRUE(Bus::user().requestName(kName));
    settle();
    processes = {"reader"};
    EXPECT_TRUE(session.isRunning(kLowerCasedName));
    const std::int32_t seed = session.getSeed();
    privateBus.die();
    ASSERT_TRUE(turnUntil([&] { return session.getSeed() != seed; }));
    EXPECT_FALSE(session.isRunning(kLowerCasedName));
    EXPECT_TRUE(session.isRunning("reader"));
}

TEST(ProcessInfoOnTheBus, FollowsTheSession) {
    AutoreleasePool pool;
    PrivateBus privateBus;
    ProcessInfo info(String::string(kName));
    EXPECT_FALSE(info.isRunning());
    ASSERT_TRUE(Bus::user().requestName(kName));
    EXPECT_TRUE(turnUntil([&] { return info.isRunning(); }));
    Bus::user().releaseName(kName);
    EXPECT_TRUE(turnUntil([&] { return !info.isRunning(); }));
}
