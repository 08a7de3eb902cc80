#include "Foundation/Clock.h"

#include "Support/ManualClock.h"

#include <gtest/gtest.h>

#include <ctime>

using Foundation::Clock;
using Support::ManualClock;

TEST(Clock, CountsSecondsFrom2001) {
    std::tm start = {};
    start.tm_year = 2001 - 1900;
    start.tm_mday = 1;
    const auto before = static_cast<double>(std::time(nullptr) - timegm(&start));
    const double now = Clock::current().now();
    const auto after = static_cast<double>(std::time(nullptr) - timegm(&start));
    EXPECT_GE(now, before);
    EXPECT_LT(now, after + 1);
    EXPECT_TRUE(Clock::current().runsByItself());
}

TEST(Clock, DoesNotSleepForNoTime) {
    Clock::current().sleep(0);
    Clock::current().sleep(-1e300);
}

TEST(Clock, IsReplacedForTheProcess) {
    Clock& machine = Clock::current();
    {
        const ManualClock manual(5);
        EXPECT_EQ(&Clock::current(), &manual);
        EXPECT_EQ(Clock::current().now(), 5);
        Clock::current().sleep(2.5);
        EXPECT_EQ(manual.now(), 7.5);
        EXPECT_EQ(manual.slept(), 2.5);
    }
    EXPECT_EQ(&Clock::current(), &machine);
}
