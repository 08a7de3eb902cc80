#include "Foundation/ClockTrust.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Date.h"
#include "Support/ManualClock.h"

#include <gtest/gtest.h>

using Foundation::ClockTrust;
using Support::ManualClock;

TEST(ClockTrust, TakesADateOfMoreThanADayInTheFutureForNone) {
    const ManualClock clock;
    EXPECT_FALSE(ClockTrust::isFromWrongClock(ManualClock::kStart - 1e8));
    EXPECT_FALSE(ClockTrust::isFromWrongClock(ManualClock::kStart));
    EXPECT_FALSE(ClockTrust::isFromWrongClock(ManualClock::kStart + 86400));
    EXPECT_TRUE(ClockTrust::isFromWrongClock(ManualClock::kStart + 86400.001));
}

TEST(ClockTrust, JudgesDateObjectsAlike) {
    const ManualClock clock;
    const Foundation::AutoreleasePool pool;
    EXPECT_FALSE(ClockTrust::isFromWrongClock(nullptr));
    EXPECT_FALSE(ClockTrust::isFromWrongClock(Foundation::Date::nowPlus(86400)));
    EXPECT_TRUE(ClockTrust::isFromWrongClock(Foundation::Date::nowPlus(86401)));
}

TEST(ClockTrust, KnowsThatItCannotBeEarlierThanTheBuild) {
    const double built = ClockTrust::getBuildDate();
    ManualClock clock(built);
    EXPECT_FALSE(ClockTrust::isClockBehindBuild());
    clock.jumpTo(built - 1);
    EXPECT_TRUE(ClockTrust::isClockBehindBuild());
    ClockTrust::setBuildDate(built - 2);
    EXPECT_FALSE(ClockTrust::isClockBehindBuild());
    ClockTrust::setBuildDate(built);
}

TEST(ClockTrust, WasBuiltOnADayThatIsOver) {
    EXPECT_FALSE(ClockTrust::isClockBehindBuild());
    // 2024-01-01
    EXPECT_GT(ClockTrust::getBuildDate(), 725846400.0);
}
