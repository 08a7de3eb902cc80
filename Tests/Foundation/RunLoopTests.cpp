#include "Foundation/RunLoop.h"

#include "Foundation/Clock.h"
#include "Support/LogCapture.h"
#include "Support/ManualClock.h"

#include <fcntl.h>
#include <glib.h>
#include <gtest/gtest.h>
#include <sys/socket.h>
#include <unistd.h>

#include <stdexcept>
#include <thread>

using namespace Foundation;
using Support::LogCapture;
using Support::ManualClock;

namespace {

constexpr double kForever = std::numeric_limits<double>::infinity();

/// A language for timers: `at(3, "a")` notes "a" when 3 seconds have passed.
class RunLoopTest : public testing::Test {
 protected:
    using Notes = std::vector<std::string>;

    ~RunLoopTest() override {
        for (const Ref<RunLoopTimer>& timer : timers) {
            timer->invalidate();
        }
    }

    RunLoopTimer* arm(double delay, double interval, RunLoopTimer::Callback callback,
                      const std::string& mode = RunLoop::kCommonModes) {
        Ref<RunLoopTimer> timer(
            new RunLoopTimer(clock.now() + delay, interval, std::move(callback)));
        loop.addTimer(timer, mode);
        timers.push_back(timer);
        return timers.back();
    }
    RunLoopTimer* at(double delay, const std::string& name,
                     const std::string& mode = RunLoop::kCommonModes) {
        return arm(
            delay, 0, [this, name] { notes.push_back(name); }, mode);
    }
    Notes noted() { return std::exchange(notes, {}); }

    ManualClock clock;
    RunLoop& loop = RunLoop::current();
    std::vector<Ref<RunLoopTimer>> timers;
    Notes notes;
};

struct Pipe {
    Pipe() { EXPECT_EQ(pipe2(fds, O_CLOEXEC | O_NONBLOCK), 0); }
    ~Pipe() {
        close(fds[0]);
        close(fds[1]);
    }
    void fill() {
        char block[4096] = {};
        while (write(fds[1], block, sizeof block) > 0) {
        }
    }
    void empty() {
        char block[4096];
        while (read(fds[0], block, sizeof block) > 0) {
        }
    }
    int fds[2];
};

}  // namespace

TEST_F(RunLoopTest, FiresTimersInTheOrderOfTheirDatesAndThenOfTheirArming) {
    at(3, "c");
    at(1, "a");
    at(2, "b1");
    at(2, "b2");
    clock.advanceBy(2);
    EXPECT_EQ(noted(), Notes({"a", "b1", "b2"}));
    clock.advanceBy(0.5);
    EXPECT_EQ(noted(), Notes());
    clock.advanceBy(0.5);
    EXPECT_EQ(noted(), Notes({"c"}));
}

TEST_F(RunLoopTest, AOneShotIsInvalidBeforeItsCallback) {
    RunLoopTimer* timer = nullptr;
    bool wasValid = true;
    timer = arm(1, 0, [&] { wasValid = timer->isValid(); });
    EXPECT_TRUE(timer->isValid());
    clock.advanceBy(1);
    EXPECT_FALSE(wasValid);
}

TEST_F(RunLoopTest, ARepeatingTimerSkipsWhatItMissed) {
    int fired = 0;
    RunLoopTimer* timer = arm(1, 2, [&] { ++fired; });
    const double start = clock.now();
    clock.advanceBy(5);
    EXPECT_EQ(fired, 3);
    clock.jumpTo(start + 20.5);
    loop.turn();
    EXPECT_EQ(fired, 4);
    EXPECT_EQ(timer->getNextFireDate(), start + 21);
}

TEST_F(RunLoopTest, WhatATimerArmsForNowWaitsForTheNextTurn) {
    arm(1, 0, [&] {
        notes.push_back("first");
        at(0, "second");
        notes.push_back("end of first");
    });
    clock.advanceBy(1);
    EXPECT_EQ(noted(), Notes({"first", "end of first", "second"}));
}

TEST_F(RunLoopTest, AnInvalidatedTimerDoesNotFire) {
    RunLoopTimer* second = nullptr;
    arm(1, 0, [&] { second->invalidate(); });
    second = at(1, "second");
    clock.advanceBy(2);
    EXPECT_EQ(noted(), Notes());
    EXPECT_EQ(loop.getNextFireDate(), kForever);
}

TEST_F(RunLoopTest, ATimerMayInvalidateItself) {
    RunLoopTimer* timer = nullptr;
    timer = arm(1, 1, [&] {
        notes.push_back("once");
        timer->invalidate();
    });
    clock.advanceBy(5);
    EXPECT_EQ(noted(), Notes({"once"}));
}

TEST_F(RunLoopTest, ReportsWhatATimerThrowsAndGoesOn) {
    LogCapture log;
    arm(1, 0, [] { throw std::runtime_error("bad"); });
    at(1, "next");
    clock.advanceBy(1);
    EXPECT_TRUE(log.contains("std::runtime_error \"bad\" caught in"));
    EXPECT_EQ(noted(), Notes({"next"}));
}

TEST_F(RunLoopTest, ARunInAPrivateModeServesOnlyThatModeAndTheCommonOnes) {
    at(1, "default", RunLoop::kDefaultMode);
    at(1, "private", "private");
    at(1, "common");
    clock.setAdvancesWhenIdle(true);
    EXPECT_EQ(loop.runInMode("private", 2, false), RunLoop::Result::TimedOut);
    EXPECT_EQ(noted(), Notes({"private", "common"}));
    loop.turn();
    EXPECT_EQ(noted(), Notes({"default"}));
}

TEST_F(RunLoopTest, ABlockingRunEndsAtItsDeadlineOnTheClock) {
    clock.setAdvancesWhenIdle(true);
    const double start = clock.now();
    EXPECT_EQ(loop.runInMode("private", 30, true), RunLoop::Result::TimedOut);
    EXPECT_EQ(clock.now(), start + 30);
}

TEST_F(RunLoopTest, ARunOfZeroSecondsServesWhatIsReady) {
    at(0, "now");
    at(1, "later");
    EXPECT_EQ(loop.runInMode(RunLoop::kDefaultMode, 0, false), RunLoop::Result::TimedOut);
    EXPECT_EQ(noted(), Notes({"now"}));
}

TEST_F(RunLoopTest, StopEndsTheInnermostRun) {
    clock.setAdvancesWhenIdle(true);
    RunLoop::Result inner = RunLoop::Result::TimedOut;
    arm(1, 0, [&] {
        arm(1, 0, [&] { loop.stop(); });
        inner = loop.runInMode("private", kForever, false);
        at(1, "after the inner run");
    });
    EXPECT_EQ(loop.runInMode(RunLoop::kDefaultMode, 10, false), RunLoop::Result::TimedOut);
    EXPECT_EQ(inner, RunLoop::Result::Stopped);
    EXPECT_EQ(noted(), Notes({"after the inner run"}));
}

TEST_F(RunLoopTest, AFiringTimerDoesNotFireAgainInARunInsideIt) {
    clock.setAdvancesWhenIdle(true);
    int depth = 0;
    int deepest = 0;
    arm(1, 1, [&] {
        deepest = std::max(deepest, ++depth);
        loop.runInMode(RunLoop::kDefaultMode, 5, false);
        --depth;
    });
    at(3, "other");
    loop.runInMode(RunLoop::kDefaultMode, 6, false);
    EXPECT_EQ(deepest, 1);
    EXPECT_EQ(noted(), Notes({"other"}));
}

TEST_F(RunLoopTest, ReadsWheneverThereIsSomethingToRead) {
    Pipe pipe;
    FileDescriptorSource source(pipe.fds[0]);
    source.setReadHandler([&] {
        char c;
        EXPECT_EQ(read(pipe.fds[0], &c, 1), 1);
        notes.push_back(std::string(1, c));
    });
    source.addTo(loop, RunLoop::kCommonModes);
    EXPECT_EQ(write(pipe.fds[1], "xy", 2), 2);
    loop.turn();
    EXPECT_EQ(noted(), Notes({"x", "y"}));
    EXPECT_EQ(write(pipe.fds[1], "z", 1), 1);
    source.removeFromLoop();
    loop.turn();
    EXPECT_EQ(noted(), Notes());
}

TEST_F(RunLoopTest, TellsOnceThatItCanWrite) {
    Pipe pipe;
    pipe.fill();
    FileDescriptorSource source(pipe.fds[1]);
    source.addTo(loop, RunLoop::kDefaultMode);
    source.awaitWritable([&] { notes.push_back("writable"); });
    loop.turn();
    EXPECT_EQ(noted(), Notes());
    pipe.empty();
    loop.turn();
    EXPECT_EQ(noted(), Notes({"writable"}));
    loop.turn();
    EXPECT_EQ(noted(), Notes());
    source.awaitWritable([&] { notes.push_back("again"); });
    loop.turn();
    EXPECT_EQ(noted(), Notes({"again"}));
}

TEST_F(RunLoopTest, ASourceInAPrivateModeWaitsForItsMode) {
    Pipe pipe;
    FileDescriptorSource source(pipe.fds[0]);
    source.setReadHandler([&] {
        pipe.empty();
        notes.push_back("read");
    });
    source.addTo(loop, "private");
    EXPECT_EQ(write(pipe.fds[1], "x", 1), 1);
    loop.turn();
    EXPECT_EQ(noted(), Notes());
    EXPECT_EQ(loop.runInMode("private", 10, true), RunLoop::Result::HandledSource);
    EXPECT_EQ(noted(), Notes({"read"}));
}

TEST_F(RunLoopTest, ASourceMayEndInItsOwnHandler) {
    Pipe pipe;
    auto source = std::make_unique<FileDescriptorSource>(pipe.fds[0]);
    source->setReadHandler([&] { source.reset(); });
    source->addTo(loop, RunLoop::kCommonModes);
    EXPECT_EQ(write(pipe.fds[1], "x", 1), 1);
    loop.turn();
    EXPECT_EQ(source, nullptr);
}

TEST_F(RunLoopTest, PerformsTheCallsOfOtherThreadsInOrder) {
    std::thread other([&] {
        for (int i = 0; i < 100; ++i) {
            loop.perform([this, i] { notes.push_back(std::to_string(i)); });
        }
        loop.perform([this] { loop.stop(); });
    });
    EXPECT_EQ(loop.runInMode(RunLoop::kDefaultMode, kForever, false), RunLoop::Result::Stopped);
    other.join();
    ASSERT_EQ(notes.size(), 100u);
    EXPECT_EQ(notes.front(), "0");
    EXPECT_EQ(notes.back(), "99");
}

TEST_F(RunLoopTest, ServesTimersInTheLoopOfTheApplication) {
    GMainLoop* main = g_main_loop_new(nullptr, FALSE);
    arm(0, 0, [&] {
        notes.push_back("fired");
        g_main_loop_quit(main);
    });
    g_main_loop_run(main);
    g_main_loop_unref(main);
    EXPECT_EQ(noted(), Notes({"fired"}));
}

TEST_F(RunLoopTest, StopOutsideOfARunDoesNothing) {
    clock.setAdvancesWhenIdle(true);
    loop.stop();
    EXPECT_EQ(loop.runInMode("private", 1, false), RunLoop::Result::TimedOut);
}

TEST_F(RunLoopTest, ATimerWaitsForItsDateAfterTheClockWasSetBack) {
    const double start = clock.now();
    at(10, "on its date");
    clock.jumpTo(start - 3600);
    clock.advanceTo(start + 9);
    EXPECT_EQ(noted(), Notes());
    clock.advanceTo(start + 10);
    EXPECT_EQ(noted(), Notes({"on its date"}));
}

TEST_F(RunLoopTest, ARunEndsWhenTheClockIsSetPastItsDeadline) {
    arm(0, 0, [&] { clock.jumpTo(clock.now() + 3600); });
    EXPECT_EQ(loop.runInMode("private", 30, false), RunLoop::Result::TimedOut);
}

TEST_F(RunLoopTest, ARunInsideAHandlerDoesNotCallItAgainInAnyMode) {
    Pipe pipe;
    FileDescriptorSource source(pipe.fds[0]);
    clock.setAdvancesWhenIdle(true);
    source.setReadHandler([&] {
        notes.push_back("begins");
        loop.runInMode("private", 1, false);
        loop.runInMode(RunLoop::kDefaultMode, 1, false);
        pipe.empty();
        notes.push_back("ends");
    });
    source.addTo(loop, RunLoop::kCommonModes);
    EXPECT_EQ(write(pipe.fds[1], "x", 1), 1);
    loop.turn();
    EXPECT_EQ(noted(), Notes({"begins", "ends"}));
    EXPECT_EQ(write(pipe.fds[1], "x", 1), 1);
    loop.turn("private");
    EXPECT_EQ(noted(), Notes({"begins", "ends"}));
}

TEST_F(RunLoopTest, AReadHandlerMayEndTheSourceBeforeItsWriteHandler) {
    int fds[2];
    ASSERT_EQ(socketpair(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0, fds), 0);
    EXPECT_EQ(write(fds[1], "x", 1), 1);
    auto source = std::make_unique<FileDescriptorSource>(fds[0]);
    source->awaitWritable([&] { notes.push_back("write"); });
    source->setReadHandler([&] {
        notes.push_back("read");
        source.reset();
    });
    source->addTo(loop, RunLoop::kDefaultMode);
    loop.turn();
    EXPECT_EQ(noted(), Notes({"read"}));

    source = std::make_unique<FileDescriptorSource>(fds[0]);
    source->awaitWritable([&] { notes.push_back("write"); });
    source->setReadHandler([&] {
        notes.push_back("read");
        source->removeFromLoop();
    });
    source->addTo(loop, RunLoop::kDefaultMode);
    loop.turn();
    EXPECT_EQ(noted(), Notes({"read"}));
    close(fds[0]);
    close(fds[1]);
}

TEST_F(RunLoopTest, ARunInsideAPerformedCallServesTheCallsBehindIt) {
    loop.perform([this] {
        notes.push_back("outer begins");
        loop.runInMode("private", kForever, false);
        notes.push_back("outer ends");
    });
    loop.perform([this] { notes.push_back("second"); });
    loop.perform([this] { loop.stop(); });
    loop.turn();
    EXPECT_EQ(noted(), Notes({"outer begins", "second", "outer ends"}));
}

TEST_F(RunLoopTest, AThreadThatEndsLeavesItsSourcesAndTimersInNoLoop) {
    Pipe pipe;
    FileDescriptorSource source(pipe.fds[0]);
    const Ref<RunLoopTimer> timer(new RunLoopTimer(clock.now() + 1, 0, [] {}));
    std::thread other([&] {
        RunLoop& mine = RunLoop::current();
        source.addTo(mine, RunLoop::kCommonModes);
        mine.addTimer(timer, "private");
        mine.turn("private");
    });
    other.join();
    EXPECT_EQ(source.getLoop(), nullptr);
    EXPECT_FALSE(timer->isValid());
    EXPECT_EQ(timer->getRefCount(), 1u);
}

TEST_F(RunLoopTest, EachThreadHasALoopOfItsOwn) {
    RunLoop* others = nullptr;
    std::thread other([&] {
        others = &RunLoop::current();
        EXPECT_EQ(others, &RunLoop::current());
    });
    other.join();
    EXPECT_NE(others, &loop);
    EXPECT_EQ(&RunLoop::current(), &loop);
}

namespace {

/// Counts how often its loop asks before it waits.
class AskedSource : public RunLoopSource {
 public:
    int asked = 0;

 private:
    Interest interest() noexcept override {
        ++asked;
        return {};
    }
    void ready(short) override {}
};

}  // namespace

TEST(RunLoop, ALoopInsideARunThatIsOverdueWaits) {
    RunLoop& loop = RunLoop::current();
    AskedSource source;
    GMainLoop* inner = g_main_loop_new(nullptr, FALSE);
    const auto runInner = [&] {
        source.addTo(loop, RunLoop::kDefaultMode);
        g_timeout_add(
            20,
            [](gpointer main) -> gboolean {
                g_main_loop_quit(static_cast<GMainLoop*>(main));
                return G_SOURCE_REMOVE;
            },
            inner);
        g_main_loop_run(inner);
    };
    const Ref<RunLoopTimer> timer(new RunLoopTimer(Clock::current().now(), 0, runInner));
    loop.addTimer(timer, RunLoop::kDefaultMode);
    EXPECT_EQ(loop.runInMode(RunLoop::kDefaultMode, 0, false), RunLoop::Result::TimedOut);
    EXPECT_GT(source.asked, 0);
    EXPECT_LT(source.asked, 20);
    g_main_loop_unref(inner);
}

TEST(RunLoop, WaitsForTheMachinesClock) {
    RunLoop& loop = RunLoop::current();
    const double start = Clock::current().now();
    int fired = 0;
    Ref<RunLoopTimer> timer(new RunLoopTimer(start + 0.02, 0, [&] { ++fired; }));
    loop.addTimer(timer, RunLoop::kCommonModes);
    EXPECT_EQ(loop.runInMode(RunLoop::kDefaultMode, 0.05, false), RunLoop::Result::TimedOut);
    EXPECT_EQ(fired, 1);
    EXPECT_GE(Clock::current().now(), start + 0.05);
}
