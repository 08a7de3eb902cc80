// The agent's work without a bus around it.

#include "Agent/Work/RefreshKillTest.h"
#include "Support/PipedChild.h"

namespace {

class RefreshKill : public RefreshKillTest {
 protected:
    void take(const std::string& line) {
        EXPECT_TRUE(line.starts_with("ended ")) << line;
        acknowledged.insert(line.substr(line.find(' ') + 1));
    }
    /// Hears of so many feeds that their refresh has ended, if it has not ended badly before.
    void awaitRefreshes(Support::PipedChild& child, int refreshes) {
        ASSERT_EQ(child.readLine(), "started");
        while (static_cast<int>(acknowledged.size()) < refreshes && !HasFailure()) {
            const std::string line = child.readLine();
            ASSERT_FALSE(line.empty());
            take(line);
        }
    }
    /// Lets the agent end so many refreshes, and kills it at some moment of the next ones.
    void killAfter(int refreshes) {
        Support::PipedChild child({REFRESH_WORKER, base.path().string()});
        awaitRefreshes(child, refreshes);
        letSomeTimePass();
        child.kill();
        for (std::string line; !(line = child.readLine()).empty();)
            take(line);
        EXPECT_EQ(child.wait(), -1) << "it ended by itself";
    }
};

TEST_F(RefreshKill, LosesNothingAcknowledgedAndGoesOn) {
    for (int i = 0; i < kills(); ++i) {
        beginRound();
        killAfter(between(0, kFeeds - 5));
        checkFiles();
        if (HasFailure()) return;
    }
    // An agent that nobody kills brings all of them up to date.
    beginRound();
    Support::PipedChild child({REFRESH_WORKER, base.path().string()});
    awaitRefreshes(child, kFeeds);
    child.kill();
    EXPECT_EQ(child.wait(), -1);
    checkFiles();
    for (int feed = 1; feed <= kFeeds; ++feed)
        EXPECT_EQ(numbers[feed], round);
}

}  // namespace
