#include <Orvane/OVRunLoop.h>

#include "Foundation/RunLoop.h"
#include "Support/ManualClock.h"

#include <gtest/gtest.h>

#include <vector>

using Foundation::RunLoop;

namespace {

void later(std::function<void()> function) {
    RunLoop::current().perform(std::move(function));
}

}  // namespace

TEST(OVRunLoop, TurnsUntilItIsStopped) {
    int calls = 0;
    later([&] {
        ++calls;
        later([&] {
            ++calls;
            OVRunLoop::stop();
        });
    });
    EXPECT_TRUE(OVRunLoop::run());
    EXPECT_EQ(calls, 2);
}

TEST(OVRunLoop, ServesWhatIsReadyWithoutATime) {
    for (const double seconds : {0.0, -1.0}) {
        int calls = 0;
        later([&] { ++calls; });
        EXPECT_FALSE(OVRunLoop::run(seconds));
        EXPECT_EQ(calls, 1);
    }
}

TEST(OVRunLoop, EndsWhenItsTimeHasPassed) {
    Support::ManualClock clock;
    clock.setAdvancesWhenIdle(true);
    EXPECT_FALSE(OVRunLoop::run(30));
    EXPECT_EQ(clock.now(), Support::ManualClock::kStart + 30);
}

TEST(OVRunLoop, IsStoppedRunByRun) {
    std::vector<bool> stopped;
    later([&] {
        later([] { OVRunLoop::stop(); });
        stopped.push_back(OVRunLoop::run());
        OVRunLoop::stop();
    });
    stopped.push_back(OVRunLoop::run());
    EXPECT_EQ(stopped, (std::vector<bool>{true, true}));
}

TEST(OVRunLoop, IsNotStoppedBeforeItRuns) {
    OVRunLoop::stop();
    EXPECT_FALSE(OVRunLoop::run(0));
}
