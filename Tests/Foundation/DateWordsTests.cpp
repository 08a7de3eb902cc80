#include "Foundation/DateWords.h"

#include <gtest/gtest.h>

#include <tuple>

using namespace Foundation;

namespace {

/// A word, its class and its value.
using Known = std::tuple<const char*, int, int>;
class DateWord : public testing::TestWithParam<Known> {};

}  // namespace

TEST_P(DateWord, IsClassified) {
    const auto& [word, kind, value] = GetParam();
    const DateToken token = findDateWord(word);
    EXPECT_EQ(static_cast<int>(token.kind), kind) << word;
    EXPECT_EQ(token.value, value) << word;
}

INSTANTIATE_TEST_SUITE_P(
    MonthsAndDays, DateWord,
    testing::Values(Known{"JANUARY", 8, 1}, Known{"FEBRUARY", 8, 2}, Known{"MARCH", 8, 3},
                    Known{"APRIL", 8, 4}, Known{"MAY", 8, 5}, Known{"JUNE", 8, 6},
                    Known{"JULY", 8, 7}, Known{"AUGUST", 8, 8}, Known{"SEPTEMBER", 8, 9},
                    Known{"OCTOBER", 8, 10}, Known{"NOVEMBER", 8, 11}, Known{"DECEMBER", 8, 12},
                    Known{"SUNDAY", 1, 0}, Known{"MONDAY", 1, 1}, Known{"TUESDAY", 1, 2},
                    Known{"WEDNESDAY", 1, 3}, Known{"THURSDAY", 1, 4}, Known{"FRIDAY", 1, 5},
                    Known{"SATURDAY", 1, 6}));

INSTANTIATE_TEST_SUITE_P(
    Beginnings, DateWord,
    testing::Values(Known{"JAN", 8, 1}, Known{"SEPT", 8, 9}, Known{"MAR", 8, 3}, Known{"JUN", 8, 6},
                    Known{"JUL", 8, 7}, Known{"THU", 1, 4}, Known{"WEDNES", 1, 3},
                    Known{"MON", 1, 1}, Known{"SATURDA", 1, 6},
                    // Two letters, and more than the name has, are too few and too many.
                    Known{"JA", -1, 0}, Known{"MA", -1, 0}, Known{"SU", -1, 0},
                    Known{"MONDAYX", -1, 0}, Known{"MAYO", -1, 0}, Known{"ANUARY", -1, 0}));

INSTANTIATE_TEST_SUITE_P(
    Exact, DateWord,
    testing::Values(Known{"ST", 13, 0}, Known{"ND", 13, 0}, Known{"RD", 13, 0}, Known{"TH", 13, 0},
                    Known{"AM", 5, 0}, Known{"PM", 5, 12}, Known{"YEAR", 10, 12},
                    Known{"MONTH", 10, 1}, Known{"WEEK", 9, 604800}, Known{"DAY", 9, 86400},
                    Known{"HOUR", 9, 3600}, Known{"MINUTE", 9, 60}, Known{"MIN", 9, 60},
                    Known{"SECOND", 9, 1}, Known{"SEC", 9, 1}, Known{"T", 17, 0},
                    Known{"WEE", -1, 0}, Known{"MINUT", -1, 0}, Known{"", -1, 0},
                    Known{"THIS", -1, 0}, Known{"NEXT", -1, 0}, Known{"GM", -1, 0}));

INSTANTIATE_TEST_SUITE_P(
    WesternZones, DateWord,
    testing::Values(Known{"NST", 6, 210}, Known{"NDT", 7, 210}, Known{"AST", 6, 240},
                    Known{"AST4", 6, 240}, Known{"ADT", 7, 240}, Known{"AST4ADT", 7, 240},
                    Known{"EST", 6, 300}, Known{"EST5", 6, 300}, Known{"EDT", 7, 300},
                    Known{"EST5EDT", 7, 300}, Known{"CST", 6, 360}, Known{"CST6", 6, 360},
                    Known{"CDT", 7, 360}, Known{"CST6CDT", 7, 360}, Known{"MST", 6, 420},
                    Known{"MST7", 6, 420}, Known{"MDT", 7, 420}, Known{"MST7MDT", 7, 420},
                    Known{"PST", 6, 480}, Known{"PST8", 6, 480}, Known{"PDT", 7, 480},
                    Known{"PST8PDT", 7, 480}, Known{"YST", 6, 560}, Known{"YST9", 6, 560},
                    Known{"YDT", 7, 560}, Known{"YST9YDT", 7, 560}, Known{"AKST", 6, 560},
                    Known{"AKDT", 7, 560}, Known{"HST", 6, 600}, Known{"HST10", 6, 600},
                    Known{"HAST", 6, 600}, Known{"HADT", 7, 600}));

INSTANTIATE_TEST_SUITE_P(
    OtherZones, DateWord,
    testing::Values(Known{"GMT", 6, 0}, Known{"UT", 6, 0}, Known{"UTC", 6, 0}, Known{"CUT", 6, 0},
                    Known{"Z", 6, 0}, Known{"WET", 6, 0}, Known{"BST", 7, 0}, Known{"CES", 7, -60},
                    Known{"CEST", 7, -60}, Known{"MEZ", 6, -60}, Known{"MEZT", 7, -60},
                    Known{"CET", 6, -60}, Known{"MET", 6, -60}, Known{"EET", 6, -120},
                    Known{"MSK", 6, -180}, Known{"MSD", 7, -180}, Known{"WAST", 6, -480},
                    Known{"WADT", 7, -480}, Known{"HKT", 6, -480}, Known{"CCT", 6, -480},
                    Known{"JST", 6, -560}, Known{"KST", 6, -560}, Known{"KDT", 6, -560},
                    Known{"CAST", 6, -590}, Known{"CADT", 7, -590}, Known{"EAST", 6, -600},
                    Known{"EADT", 7, -600}, Known{"NZST", 6, -720}, Known{"NZDT", 7, -720}));
