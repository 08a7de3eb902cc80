#include "Foundation/DateFormat.h"

#include <gtest/gtest.h>

#include <string>

using namespace Foundation;

namespace {

/// What a format takes from a text, as letters with numbers; "none" if it does not match.
std::string take(const DateFormat& format, std::string_view text) {
    DateTokens tokens;
    char zoneName[16] = {};
    if (!tokens.read(text, zoneName, sizeof zoneName)) return "failed";
    DateParts parts;
    if (!format.match(tokens, parts)) return "none";
    std::string list;
    const auto add = [&list](char letter, std::int32_t part) {
        if (part != -1) list += letter + std::to_string(part) + ' ';
    };
    add('Y', parts.year);
    add('m', parts.month);
    add('d', parts.day);
    add('H', parts.hour);
    add('M', parts.minute);
    add('S', parts.second);
    add('p', parts.meridian);
    add('Z', parts.offsetMinutes);
    if (!list.empty()) list.pop_back();
    return list;
}

}  // namespace

TEST(DateFormat, TakesEachItem) {
    EXPECT_EQ(take(DateFormat("A B d H M S Y p"), "Fri Jan 2 3 4 5 2006 pm"),
              "Y2006 m1 d2 H3 M4 S5 p12");
    EXPECT_EQ(take(DateFormat("a b d I M S y p"), "Fri Jan 2 3 4 5 2006 am"),
              "Y2006 m1 d2 H3 M4 S5 p0");
    EXPECT_EQ(take(DateFormat("m t d,H.M:S"), "1 T 2,3.4:5"), "m1 d2 H3 M4 S5");
    EXPECT_EQ(take(DateFormat("B"), "11"), "m11");
    EXPECT_EQ(take(DateFormat("m"), "Jan"), "none");
    EXPECT_EQ(take(DateFormat("A"), "Jan"), "none");
}

TEST(DateFormat, TakesTheTextWhole) {
    EXPECT_EQ(take(DateFormat("H:M"), "10:30"), "H10 M30");
    EXPECT_EQ(take(DateFormat("H:M"), "10:30 5"), "none");
    EXPECT_EQ(take(DateFormat("H:M"), "10:"), "none");
    EXPECT_EQ(take(DateFormat("[H]"), ""), "none");
}

TEST(DateFormat, PassesOverAnOptionalItem) {
    EXPECT_EQ(take(DateFormat("[A][,] d"), "Fri, 5"), "d5");
    EXPECT_EQ(take(DateFormat("[A][,] d"), "Fri 5"), "d5");
    EXPECT_EQ(take(DateFormat("[A][,] d"), ", 5"), "d5");
    EXPECT_EQ(take(DateFormat("[A][,] d"), "5"), "d5");
    EXPECT_EQ(take(DateFormat("d [Y]"), "5"), "d5");
}

TEST(DateFormat, SkipsADaysSuffix) {
    EXPECT_EQ(take(DateFormat("d B"), "3rd Mar"), "m3 d3");
    EXPECT_EQ(take(DateFormat("m d"), "3rd 4"), "none");
}

TEST(DateFormat, DropsTheFractionOfASecond) {
    EXPECT_EQ(take(DateFormat("S"), "5.25"), "S5");
    EXPECT_EQ(take(DateFormat("S."), "5."), "S5");
    EXPECT_EQ(take(DateFormat("M"), "5.25"), "none");
}

TEST(DateFormat, ReadsYearsBelow38AsOfThisCentury) {
    EXPECT_EQ(take(DateFormat("Y"), "0"), "Y2000");
    EXPECT_EQ(take(DateFormat("Y"), "37"), "Y2037");
    EXPECT_EQ(take(DateFormat("Y"), "38"), "Y38");
    EXPECT_EQ(take(DateFormat("Y"), "99"), "Y99");
}

TEST(DateFormat, TakesADashFromTheNumbersSign) {
    EXPECT_EQ(take(DateFormat("y-m-d"), "2005-10-12"), "Y2005 m10 d12");
    EXPECT_EQ(take(DateFormat("y-m-d"), "2005/10/12"), "Y2005 m10 d12");
    EXPECT_EQ(take(DateFormat("y-m-d"), "2005 - 10 - 12"), "Y2005 m10 d12");
    EXPECT_EQ(take(DateFormat("y-m-d"), "2005-10-0"), "Y2005 m10 d0");
    EXPECT_EQ(take(DateFormat("y-m-d"), "2005+10-12"), "none");
    EXPECT_EQ(take(DateFormat("m-d"), "1 2"), "none");
    EXPECT_EQ(take(DateFormat("m--d"), "1-2"), "none");
}

TEST(DateFormat, TakesAPlusFromTheNumbersSign) {
    EXPECT_EQ(take(DateFormat("m+d"), "1+2"), "m1 d2");
    EXPECT_EQ(take(DateFormat("m+d"), "1+ 2"), "m1 d2");
    EXPECT_EQ(take(DateFormat("m+d"), "1+0"), "m1 d0");
    EXPECT_EQ(take(DateFormat("m+d"), "1-2"), "none");
    EXPECT_EQ(take(DateFormat("m+d"), "1-0"), "none");
    EXPECT_EQ(take(DateFormat("m+H"), "1/2"), "none");
}

TEST(DateFormat, TakesAZoneByName) {
    EXPECT_EQ(take(DateFormat("H Z"), "5 GMT"), "H5");
    EXPECT_EQ(take(DateFormat("H Z"), "5 EST EDT"), "H5");
    EXPECT_EQ(take(DateFormat("H Z"), "5 EDT"), "H5");
    EXPECT_EQ(take(DateFormat("H Z"), "5 EDT EST"), "none");
    EXPECT_EQ(take(DateFormat("H Z"), "5 EST EST"), "none");
    EXPECT_EQ(take(DateFormat("H Z"), "5 Jan"), "none");
    EXPECT_EQ(take(DateFormat("H Z"), "5"), "none");
}

TEST(DateFormat, TakesAZoneByOffset) {
    EXPECT_EQ(take(DateFormat("H Z"), "5 +0130"), "H5 Z90");
    EXPECT_EQ(take(DateFormat("H Z"), "5 -0130"), "H5 Z-90");
    EXPECT_EQ(take(DateFormat("H Z"), "5 0130"), "H5 Z90");
    EXPECT_EQ(take(DateFormat("H Z"), "5 -0000"), "H5 Z0");
    EXPECT_EQ(take(DateFormat("H Z"), "5 +12"), "H5 Z720");
    EXPECT_EQ(take(DateFormat("H Z"), "5 -12"), "H5 Z-720");
    EXPECT_EQ(take(DateFormat("H Z"), "5 +13"), "H5 Z13");
    EXPECT_EQ(take(DateFormat("H Z"), "5 -13"), "H5 Z-13");
    EXPECT_EQ(take(DateFormat("H Z"), "5 GMT+0100"), "H5 Z60");
    EXPECT_EQ(take(DateFormat("H Z"), "5 EST EDT -4"), "H5 Z-240");
}

TEST(DateFormat, AddsTheMinutesOfAnOffsetWhateverItsSign) {
    EXPECT_EQ(take(DateFormat("H Z"), "5 +05:30"), "H5 Z330");
    EXPECT_EQ(take(DateFormat("H Z"), "5 -05:30"), "H5 Z-270");
    EXPECT_EQ(take(DateFormat("H Z"), "5 -00:30"), "H5 Z30");
    EXPECT_EQ(take(DateFormat("H Z"), "5 +05:60"), "none");
    EXPECT_EQ(take(DateFormat("H Z"), "5 +13:30"), "none");
}

TEST(DateFormat, TakesAnOffsetOfMinusOneMinuteForNone) {
    EXPECT_EQ(take(DateFormat("H Z"), "5 -1:59"), "H5");
}

TEST(DateFormat, RefusesHoursFrom13WithAMOrPM) {
    EXPECT_EQ(take(DateFormat("H[p]"), "12 pm"), "H12 p12");
    EXPECT_EQ(take(DateFormat("H[p]"), "13 pm"), "none");
    EXPECT_EQ(take(DateFormat("H[p]"), "13 am"), "none");
    EXPECT_EQ(take(DateFormat("H[p]"), "13"), "H13");
}

TEST(DateFormat, RefusesTimesThatDoNotExist) {
    EXPECT_EQ(take(DateFormat("H:M:S"), "23:59:59"), "H23 M59 S59");
    EXPECT_EQ(take(DateFormat("H:M:S"), "24:00:00"), "none");
    EXPECT_EQ(take(DateFormat("H:M:S"), "23:60:00"), "none");
    EXPECT_EQ(take(DateFormat("H:M:S"), "23:59:60"), "none");
}

TEST(DateFormat, RefusesMonthsThatDoNotExist) {
    EXPECT_EQ(take(DateFormat("m"), "12"), "m12");
    EXPECT_EQ(take(DateFormat("m"), "13"), "none");
    EXPECT_EQ(take(DateFormat("m"), "0"), "none");
}

TEST(DateFormat, TakesTheYears38To300And1901To2200) {
    EXPECT_EQ(take(DateFormat("Y"), "300"), "Y300");
    EXPECT_EQ(take(DateFormat("Y"), "301"), "none");
    EXPECT_EQ(take(DateFormat("Y"), "1900"), "none");
    EXPECT_EQ(take(DateFormat("Y"), "1901"), "Y1901");
    EXPECT_EQ(take(DateFormat("Y"), "2200"), "Y2200");
    EXPECT_EQ(take(DateFormat("Y"), "2201"), "none");
    EXPECT_EQ(take(DateFormat("Y"), "2147483648"), "none");
}

TEST(DateFormat, RefusesDaysThatAMonthDoesNotHave) {
    const char* last[] = {"1-31", "2-28", "3-31", "4-30",  "5-31",  "6-30",
                          "7-31", "8-31", "9-30", "10-31", "11-30", "12-31"};
    for (const std::string day : last) {
        EXPECT_NE(take(DateFormat("y-m-d"), "2005-" + day), "none") << day;
        std::string next = day;
        ++next.back();
        EXPECT_EQ(take(DateFormat("y-m-d"), "2005-" + next), "none") << next;
    }
}

TEST(DateFormat, HasALeapDayEveryFourthYear) {
    EXPECT_EQ(take(DateFormat("y-m-d"), "2004-2-29"), "Y2004 m2 d29");
    EXPECT_EQ(take(DateFormat("y-m-d"), "2004-2-30"), "none");
    EXPECT_EQ(take(DateFormat("y-m-d"), "2003-2-29"), "none");
    EXPECT_EQ(take(DateFormat("y-m-d"), "2100-2-29"), "Y2100 m2 d29");
    EXPECT_EQ(take(DateFormat("y-m-d"), "100-2-29"), "Y100 m2 d29");
}

TEST(DateFormat, DoesNotTestTheDayWithoutMonthOrYear) {
    EXPECT_EQ(take(DateFormat("m-d"), "2-31"), "m2 d31");
    EXPECT_EQ(take(DateFormat("d Y"), "99 2005"), "Y2005 d99");
}
