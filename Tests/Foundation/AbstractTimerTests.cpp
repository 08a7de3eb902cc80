#include "Foundation/AbstractTimer.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Date.h"
#include "Foundation/RunLoop.h"
#include "Support/LogCapture.h"
#include "Support/ManualClock.h"

#include <gtest/gtest.h>

#include <cmath>
#include <functional>
#include <limits>
#include <memory>
#include <stdexcept>

using namespace Foundation;
using Support::LogCapture;
using Support::ManualClock;

namespace {

constexpr double kInfinity = std::numeric_limits<double>::infinity();

/// Notes when it fires, and then does what the test wants.
class TestTimer : public AbstractTimer {
 public:
    explicit TestTimer(ManualClock& clock) : mClock(clock) {}
    TestTimer(ManualClock& clock, bool deleteAfterFire, int* deaths)
        : AbstractTimer(deleteAfterFire), mClock(clock), mDeaths(deaths) {}
    ~TestTimer() override {
        if (mDeaths) ++*mDeaths;
    }

    void fire() override {
        fired.push_back(mClock.now() - ManualClock::kStart);
        const std::function<void()> action = whenFired;  // may destroy the timer
        if (action) action();
    }

    std::vector<double> fired;
    std::function<void()> whenFired;

 private:
    ManualClock& mClock;
    int* mDeaths = nullptr;
};

using Times = std::vector<double>;

class AbstractTimerTest : public testing::Test {
 protected:
    std::string failureOfStart(double interval, bool repeats) {
        try {
            timer.start(interval, repeats);
        } catch (const AssertionFailure& e) {
            return e.what();
        }
        return "";
    }

    ManualClock clock;
    LogCapture log;
    RunLoop& loop = RunLoop::current();
    TestTimer timer{clock};
};

}  // namespace

TEST_F(AbstractTimerTest, FiresOnceAtItsAbsoluteTime) {
    timer.start(ManualClock::kStart + 5, 0.0);
    clock.advanceBy(4.5);
    EXPECT_EQ(timer.fired, Times());
    clock.advanceBy(20);
    EXPECT_EQ(timer.fired, Times({5}));
}

TEST_F(AbstractTimerTest, RepeatsFromItsAbsoluteTimeOn) {
    timer.start(ManualClock::kStart + 5, 3.0);
    clock.advanceBy(12);
    EXPECT_EQ(timer.fired, Times({5, 8, 11}));
}

TEST_F(AbstractTimerTest, StartsAnIntervalFromNow) {
    timer.start(2.0, false);
    clock.advanceBy(10);
    EXPECT_EQ(timer.fired, Times({2}));
}

TEST_F(AbstractTimerTest, RepeatsEveryInterval) {
    timer.start(2.0, true);
    clock.advanceBy(7);
    EXPECT_EQ(timer.fired, Times({2, 4, 6}));
}

TEST_F(AbstractTimerTest, WithoutADelayFiresInTheNextTurnAndNotBefore) {
    timer.start(0.0, false);
    EXPECT_EQ(timer.fired, Times());
    loop.turn();
    EXPECT_EQ(timer.fired, Times({0}));
}

TEST_F(AbstractTimerTest, ARepeatingTimerNeedsMoreThanATenthOfAMillisecond) {
    const std::string text = "!repeats || interval>0.0001";
    EXPECT_EQ(failureOfStart(0.0, true), text);
    EXPECT_EQ(failureOfStart(0.0001, true), text);
    EXPECT_EQ(failureOfStart(std::nan(""), true), text);
    EXPECT_EQ(failureOfStart(0.00011, true), "");
    EXPECT_EQ(failureOfStart(0.0, false), "");
}

TEST_F(AbstractTimerTest, AFailedStartLeavesAnArmedTimerAlone) {
    timer.start(5.0, false);
    EXPECT_NE(failureOfStart(0.0, true), "");
    EXPECT_EQ(timer.getTimeRemaining(), 5);
}

TEST_F(AbstractTimerTest, ATimeThatIsNoNumberCannotBeArmed) {
    EXPECT_EQ(failureOfStart(std::nan(""), false), "mTimer");
    EXPECT_THROW(timer.start(1.0, std::nan("")), AssertionFailure);
    EXPECT_EQ(timer.getTimeRemaining(), kInfinity);
}

TEST_F(AbstractTimerTest, FiresOnceAtADate) {
    AutoreleasePool pool;
    timer.start(Date::nowPlus(4));
    EXPECT_EQ(timer.getTimeRemaining(), 4);
    clock.advanceBy(20);
    EXPECT_EQ(timer.fired, Times({4}));
}

TEST_F(AbstractTimerTest, ANullDateStopsAnArmedTimer) {
    timer.start(1.0, true);
    timer.start(nullptr);
    EXPECT_EQ(timer.getTimeRemaining(), kInfinity);
    clock.advanceBy(5);
    EXPECT_EQ(timer.fired, Times());
}

TEST_F(AbstractTimerTest, StartingAgainReplacesTheFirstStart) {
    timer.start(1.0, true);
    timer.start(3.0, false);
    clock.advanceBy(10);
    EXPECT_EQ(timer.fired, Times({3}));
}

TEST_F(AbstractTimerTest, AStoppedTimerDoesNotFire) {
    timer.start(1.0, false);
    timer.stop();
    timer.stop();
    clock.advanceBy(2);
    EXPECT_EQ(timer.fired, Times());
}

TEST_F(AbstractTimerTest, NeedsNoPoolToStartAndStop) {
    timer.start(1.0, false);
    timer.start(2.0, false);
    timer.stop();
    EXPECT_EQ(log.lines(), std::vector<std::string>());
}

TEST_F(AbstractTimerTest, IsServedInEveryMode) {
    timer.start(0.0, false);
    loop.turn("a mode of its own");
    EXPECT_EQ(timer.fired, Times({0}));
}

TEST_F(AbstractTimerTest, TheTimeRemainingIsInfiniteUnlessArmed) {
    EXPECT_EQ(timer.getTimeRemaining(), kInfinity);
    timer.start(5.0, false);
    EXPECT_EQ(timer.getTimeRemaining(), 5);
    clock.advanceBy(2);
    EXPECT_EQ(timer.getTimeRemaining(), 3);
    timer.stop();
    EXPECT_EQ(timer.getTimeRemaining(), kInfinity);
}

TEST_F(AbstractTimerTest, TheTimeRemainingIsNegativeForALateTimer) {
    timer.start(5.0, false);
    clock.jumpTo(ManualClock::kStart + 7);
    EXPECT_EQ(timer.getTimeRemaining(), -2);
}

TEST_F(AbstractTimerTest, TheTimeRemainingIsInfiniteForADateNotAfterTheBeginningOf2001) {
    timer.start(-1.0, 0.0);
    EXPECT_EQ(timer.getTimeRemaining(), kInfinity);
    timer.start(0.0, 0.0);
    EXPECT_EQ(timer.getTimeRemaining(), kInfinity);
    timer.start(0.5, 0.0);
    EXPECT_EQ(timer.getTimeRemaining(), 0.5 - ManualClock::kStart);
}

TEST_F(AbstractTimerTest, AOneShotIsDisarmedWhileItFires) {
    double remaining = 0;
    timer.whenFired = [&] { remaining = timer.getTimeRemaining(); };
    timer.start(1.0, false);
    clock.advanceBy(1);
    EXPECT_EQ(remaining, kInfinity);
}

TEST_F(AbstractTimerTest, ARepeatingTimerShowsItsNextDateWhileItFires) {
    double remaining = 0;
    timer.whenFired = [&] { remaining = timer.getTimeRemaining(); };
    timer.start(4.0, true);
    clock.advanceBy(4);
    EXPECT_EQ(remaining, 4);
}

TEST_F(AbstractTimerTest, StaysArmedIfItRearmsItselfFromItsFire) {
    timer.whenFired = [&] {
        if (timer.fired.size() < 3) timer.start(2.0, false);
    };
    timer.start(1.0, false);
    clock.advanceBy(1);
    EXPECT_EQ(timer.getTimeRemaining(), 2);
    clock.advanceBy(9);
    EXPECT_EQ(timer.fired, Times({1, 3, 5}));
    EXPECT_EQ(timer.getTimeRemaining(), kInfinity);
}

TEST_F(AbstractTimerTest, ARepeatingTimerMayBecomeAOneShotInItsFire) {
    timer.whenFired = [&] {
        if (timer.fired.size() == 2) timer.start(5.0, false);
    };
    timer.start(1.0, true);
    clock.advanceBy(20);
    EXPECT_EQ(timer.fired, Times({1, 2, 7}));
}

TEST_F(AbstractTimerTest, ARepeatingTimerMayStopInItsFire) {
    timer.whenFired = [&] { timer.stop(); };
    timer.start(1.0, true);
    clock.advanceBy(5);
    EXPECT_EQ(timer.fired, Times({1}));
}

TEST_F(AbstractTimerTest, MayBeDestroyedInItsFire) {
    for (const bool repeats : {false, true}) {
        int deaths = 0;
        auto owned = std::make_unique<TestTimer>(clock, false, &deaths);
        owned->whenFired = [&] { owned.reset(); };
        owned->start(1.0, repeats);
        clock.advanceBy(5);
        EXPECT_EQ(deaths, 1);
    }
    EXPECT_EQ(log.lines(), std::vector<std::string>());
}

TEST_F(AbstractTimerTest, DoesNotFireOnceDestroyed) {
    int deaths = 0;
    int fires = 0;
    {
        TestTimer local(clock, false, &deaths);
        local.whenFired = [&] { ++fires; };
        local.start(1.0, true);
    }
    clock.advanceBy(3);
    EXPECT_EQ(deaths, 1);
    EXPECT_EQ(fires, 0);
}

TEST_F(AbstractTimerTest, DeletesItselfAfterItsFireIfItIsToldTo) {
    int deaths = 0;
    int deathsInFire = -1;
    auto* own = new TestTimer(clock, true, &deaths);
    own->whenFired = [&] { deathsInFire = deaths; };
    own->start(1.0, false);
    clock.advanceBy(1);
    EXPECT_EQ(deathsInFire, 0);
    EXPECT_EQ(deaths, 1);
}

TEST_F(AbstractTimerTest, DeletesItselfAlsoAfterAFireThatThrew) {
    int deaths = 0;
    auto* own = new TestTimer(clock, true, &deaths);
    own->whenFired = [] { throw std::runtime_error("no good"); };
    own->start(1.0, false);
    clock.advanceBy(1);
    EXPECT_EQ(deaths, 1);
}

TEST_F(AbstractTimerTest, FiresInsideAPool) {
    std::uint32_t level = 0;
    timer.whenFired = [&] { level = AutoreleasePool::getNestLevel(); };
    timer.start(0.0, false);
    loop.turn();
    EXPECT_GT(level, 0u);
    EXPECT_EQ(AutoreleasePool::getNestLevel(), 0u);
}

TEST_F(AbstractTimerTest, ReportsWhatItsFireThrowsAndGoesOn) {
    timer.whenFired = [] { throw std::runtime_error("no good"); };
    timer.start(1.0, true);
    clock.advanceBy(2);
    EXPECT_EQ(timer.fired, Times({1, 2}));
    const std::string line =
        "[WARNING] std::runtime_error \"no good\" caught in void "
        "Foundation::AbstractTimer::_fire()";
    EXPECT_EQ(log.lines(), std::vector<std::string>({line, line}));
}

TEST_F(AbstractTimerTest, ReportsWhatIsNoStandardException) {
    timer.whenFired = [] { throw 42; };
    timer.start(1.0, false);
    clock.advanceBy(1);
    EXPECT_EQ(log.lines(), std::vector<std::string>({"[WARNING] Unknown exception caught in void "
                                                     "Foundation::AbstractTimer::_fire()"}));
}
