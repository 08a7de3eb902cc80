#include "Support/LoopWatch.h"

#include "Foundation/RunLoop.h"
#include "Support/TurnUntil.h"

#include <gtest/gtest.h>
#include <time.h>

#include <functional>

using Foundation::RunLoop;
using Support::LoopWatch;

namespace {

constexpr double kSeconds = 0.05;

/// What a watch says of a loop that does this in one of its turns.
double measure(const std::function<void()>& body) {
    const LoopWatch watch;
    bool isDone = false;
    RunLoop::current().perform([&] {
        body();
        isDone = true;
    });
    EXPECT_TRUE(Support::turnUntil([&] { return isDone; }));
    // The next wait ends the measurement.
    int turns = 0;
    EXPECT_TRUE(Support::turnUntil([&] { return ++turns > 2; }));
    return watch.getLongestSeconds();
}

double ownTime() {
    timespec used{};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &used);
    return static_cast<double>(used.tv_sec) + static_cast<double>(used.tv_nsec) * 1e-9;
}

TEST(LoopWatch, MeasuresWork) {
    EXPECT_GE(measure([] {
                  const double end = ownTime() + kSeconds;
                  while (ownTime() < end) {
                  }
              }),
              kSeconds * 0.9);
}

TEST(LoopWatch, MeasuresWaiting) {
    EXPECT_GE(measure([] {
                  const timespec length{.tv_sec = 0, .tv_nsec = static_cast<long>(kSeconds * 1e9)};
                  clock_nanosleep(CLOCK_MONOTONIC, 0, &length, nullptr);
              }),
              kSeconds * 0.9);
}

}  // namespace
