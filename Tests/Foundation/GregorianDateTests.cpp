#include "Foundation/GregorianDate.h"

#include "Support/GMT.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <string>

using namespace Foundation;
using Support::inGMT;

namespace {

std::string text(const GregorianDate& d) {
    char buffer[100];
    std::snprintf(buffer, sizeof buffer, "%d-%d-%d %d:%d:%g", d.year, d.month, d.day, d.hour,
                  d.minute, d.second);
    return buffer;
}

struct Known {
    double time;
    const char* text;
};

class GregorianDateInGMT : public testing::TestWithParam<Known> {};

}  // namespace

TEST_P(GregorianDateInGMT, IsReadOffAndCountedBack) {
    const GregorianDate date = GregorianDate::inGMT(GetParam().time);
    EXPECT_EQ(text(date), GetParam().text);
    EXPECT_EQ(date.getAbsoluteTimeInGMT(), GetParam().time);
}

INSTANTIATE_TEST_SUITE_P(
    All, GregorianDateInGMT,
    testing::Values(Known{0, "2001-1-1 0:0:0"}, Known{-978307200, "1970-1-1 0:0:0"},
                    Known{0.5, "2001-1-1 0:0:0.5"}, Known{-0.5, "2000-12-31 23:59:59.5"},
                    Known{-26524800, "2000-2-29 0:0:0"}, Known{-26438400, "2000-3-1 0:0:0"},
                    Known{3124137600, "2100-1-1 0:0:0"}, Known{3129148799, "2100-2-27 23:59:59"},
                    Known{3129235200, "2100-3-1 0:0:0"}, Known{-63113904000, "1-1-1 0:0:0"},
                    Known{-63113904001, "0-12-31 23:59:59"}, Known{-63145526400, "0-1-1 0:0:0"},
                    Known{-63145526401, "-1-12-31 23:59:59"}));

TEST(GregorianDate, RoundTripsEveryDayOfEightHundredYears) {
    constexpr int kDays = 800 * 365 + 200;
    const double first = inGMT(1599, 12, 31);
    for (int i = 0; i < kDays; ++i) {
        const double day = first + 86400.0 * i;
        const GregorianDate date = GregorianDate::inGMT(day + 3661);
        ASSERT_EQ(date.getAbsoluteTimeInGMT(), day + 3661) << text(date);
        const GregorianDate next = GregorianDate::inGMT(day + 86400);
        const bool isNextDay = next.day == date.day + 1 || (next.day == 1 && date.day >= 28);
        ASSERT_TRUE(isNextDay) << text(date) << " before " << text(next);
    }
}

TEST(GregorianDate, KeepsTheCenturyRule) {
    EXPECT_EQ(inGMT(1900, 3, 1) - inGMT(1900, 2, 28), 86400);
    EXPECT_EQ(inGMT(2000, 3, 1) - inGMT(2000, 2, 28), 2 * 86400);
    EXPECT_EQ(inGMT(2100, 3, 1) - inGMT(2100, 2, 28), 86400);
}

TEST(GregorianDate, CountsOnWithFieldsOutsideTheirRanges) {
    EXPECT_EQ(inGMT(2005, 1, 31, 24), inGMT(2005, 2, 1));
    EXPECT_EQ(inGMT(2005, 13, 1), inGMT(2006, 1, 1));
    EXPECT_EQ(inGMT(2005, 0, 1), inGMT(2004, 12, 1));
    EXPECT_EQ(inGMT(2005, -11, 1), inGMT(2004, 1, 1));
    EXPECT_EQ(inGMT(2005, 3, 0), inGMT(2005, 2, 28));
    EXPECT_EQ(inGMT(2005, 1, -30), inGMT(2004, 12, 1));
    EXPECT_EQ(inGMT(2005, 1, 1, -1, 90, -60), inGMT(2005, 1, 1, 0, 29));
    EXPECT_EQ(inGMT(2100, 2, 29), inGMT(2100, 3, 1));
}

TEST(GregorianDate, MovesWhatFitsNoYearToTheNearestYear) {
    constexpr double kInfinity = std::numeric_limits<double>::infinity();
    EXPECT_EQ(GregorianDate::inGMT(kInfinity).year, INT32_MAX);
    EXPECT_EQ(GregorianDate::inGMT(-kInfinity).year, INT32_MIN);
    EXPECT_EQ(GregorianDate::inGMT(1e300).year, INT32_MAX);
    EXPECT_EQ(text(GregorianDate::inGMT(std::nan(""))), "2001-1-1 0:0:0");
}

TEST(GregorianDate, NeverGivesASixtiethSecond) {
    EXPECT_EQ(text(GregorianDate::inGMT(-1e-17)), "2001-1-1 0:0:0");
}
