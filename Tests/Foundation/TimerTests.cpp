#include "Foundation/RunOnceTimer.h"
#include "Foundation/Timer.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/RunLoop.h"
#include "Support/LogCapture.h"
#include "Support/ManualClock.h"

#include <gtest/gtest.h>

#include <cmath>
#include <stdexcept>

using namespace Foundation;
using Support::LogCapture;
using Support::ManualClock;

namespace {

/// An object with a timer as its member, as most have it.
class Saver {
 public:
    void touch() { mTimer.start(0.0, false); }
    void save() { ++saves; }

    int saves = 0;

 private:
    Timer<Saver> mTimer{this, &Saver::save};
};

struct TargetState {
    int calls = 0;
    int deaths = 0;
    std::uint32_t references = 0;
};

class Target : public RefCounted {
 public:
    explicit Target(TargetState* state) : mState(state) {}
    ~Target() override { ++mState->deaths; }

    void work() {
        ++mState->calls;
        mState->references = getRefCount();
    }
    void fail() {
        work();
        throw std::runtime_error("no good");
    }
    void workAgainLater() {
        work();
        if (mState->calls < 3) callAfterDelay(1.0, this, &Target::workAgainLater);
    }

 private:
    TargetState* mState;
};

class RunOnceTimerTest : public testing::Test {
 protected:
    ManualClock clock;
    RunLoop& loop = RunLoop::current();
    TargetState state;
};

}  // namespace

TEST(Timer, CallsTheMethodOfItsTarget) {
    ManualClock clock;
    Saver saver;
    saver.touch();
    EXPECT_EQ(saver.saves, 0);
    RunLoop::current().turn();
    EXPECT_EQ(saver.saves, 1);
}

TEST(Timer, GathersTheStartsOfOneTurn) {
    ManualClock clock;
    Saver saver;
    saver.touch();
    saver.touch();
    saver.touch();
    RunLoop::current().turn();
    EXPECT_EQ(saver.saves, 1);
}

TEST(Timer, EndsWithItsTarget) {
    ManualClock clock;
    LogCapture log;
    { Saver().touch(); }
    RunLoop::current().turn();
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(RunOnceTimerTest, HoldsAReferenceToItsTarget) {
    {
        const Ref<Target> target = Returner<Target>::adopted(new Target(&state));
        {
            const RunOnceTimer<Target> timer(target, &Target::work);
            EXPECT_EQ(target->getRefCount(), 2u);
        }
        EXPECT_EQ(target->getRefCount(), 1u);
    }
    EXPECT_EQ(state.deaths, 1);
}

TEST_F(RunOnceTimerTest, CallsOnceAfterTheDelayAndThenLetsItsTargetGo) {
    callAfterDelay(2.0, new Target(&state), &Target::work);
    clock.advanceBy(1.9);
    EXPECT_EQ(state.calls, 0);
    EXPECT_EQ(state.deaths, 0);
    clock.advanceBy(0.1);
    EXPECT_EQ(state.calls, 1);
    EXPECT_EQ(state.references, 1u);
    EXPECT_EQ(state.deaths, 1);
    clock.advanceBy(10);
    EXPECT_EQ(state.calls, 1);
}

TEST_F(RunOnceTimerTest, WithoutADelayCallsInTheNextTurn) {
    callAfterDelay(0.0, new Target(&state), &Target::work);
    EXPECT_EQ(state.calls, 0);
    loop.turn();
    EXPECT_EQ(state.calls, 1);
}

TEST_F(RunOnceTimerTest, LetsItsTargetGoAlsoAfterACallThatThrew) {
    LogCapture log;
    callAfterDelay(1.0, new Target(&state), &Target::fail);
    clock.advanceBy(1);
    EXPECT_EQ(state.calls, 1);
    EXPECT_EQ(state.deaths, 1);
    EXPECT_EQ(log.count("caught in void Foundation::AbstractTimer::_fire()"), 1);
}

TEST_F(RunOnceTimerTest, TheMethodMayAskForAFurtherCall) {
    callAfterDelay(1.0, new Target(&state), &Target::workAgainLater);
    clock.advanceBy(2);
    EXPECT_EQ(state.calls, 2);
    EXPECT_EQ(state.deaths, 0);
    clock.advanceBy(1);
    EXPECT_EQ(state.calls, 3);
    EXPECT_EQ(state.deaths, 1);
}

TEST_F(RunOnceTimerTest, ADelayThatIsNoNumberLeavesNothingBehind) {
    LogCapture log;
    EXPECT_THROW(callAfterDelay(std::nan(""), new Target(&state), &Target::work), AssertionFailure);
    EXPECT_EQ(state.deaths, 1);
}
