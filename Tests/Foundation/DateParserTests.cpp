#include "Foundation/DateParser.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/String.h"
#include "Support/DefaultZone.h"
#include "Support/ManualClock.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <iterator>
#include <string>

using namespace Foundation;
using Support::DefaultZone;
using Support::ManualClock;

namespace {

/// What `parsedatelite` gives: the parts that the text gave as letters with numbers, zone, offset.
std::string parse(const std::string& text) {
    GregorianDate d;
    std::uint32_t mask = 0;
    char zone[256];
    std::int32_t offset = 0;
    const int result = parsedatelite(text.c_str(), d, mask, zone, sizeof zone, offset);
    if (result == 0) return "none";
    EXPECT_EQ(result, 1);
    std::string list;
    const auto add = [&](const char* name, std::uint32_t bit, int value) {
        if (mask & bit) {
            list += name + std::to_string(value);
        } else {
            EXPECT_EQ(value, 0) << text;
        }
    };
    add("y", 1, d.year);
    add("m", 2, d.month);
    add("d", 4, d.day);
    add(" H", 8, d.hour);
    add("M", 16, d.minute);
    add("S", 32, static_cast<int>(d.second));
    if (zone[0] != '\0') list += std::string(" ") + zone;
    if (offset != -1) list += " offset " + std::to_string(offset);
    return list;
}

struct Shape {
    const char* text;
    const char* parts;
};
class DateShape : public testing::TestWithParam<Shape> {};

}  // namespace

TEST_P(DateShape, IsRead) {
    EXPECT_EQ(parse(GetParam().text), GetParam().parts) << GetParam().text;
}

// One text at least for each format, in their order.
INSTANTIATE_TEST_SUITE_P(
    ByFormat, DateShape,
    testing::Values(
        Shape{"Fri Jan 2 03:04:05 pm 2004, GMT", "y2004m1d2 H15M4S5 GMT"},
        Shape{"Fri, Jan 2nd, 2004, 03:04:05 am EST", "y2004m1d2 H3M4S5 EST"},
        Shape{"January 2 2004 3:04 pm, +0100", "y2004m1d2 H15M4 offset 3600"},
        Shape{"Jan 2, 2004, 3pm, GMT", "y2004m1d2 H15 GMT"},
        Shape{"Jan 2, 3:04 pm, 2004 GMT", "y2004m1d2 H15M4 GMT"},
        Shape{"Fri, 2 Jan 2004, 3:04 pm, GMT", "y2004m1d2 H15M4 GMT"},
        Shape{"Sat, 07 Sep 2002 00:00:01 GMT", "y2002m9d7 H0M0S1 GMT"},
        Shape{"2 Jan, 3:04:05 2004, pm, GMT", "y2004m1d2 H15M4S5 GMT"},
        Shape{"2 Jan, 3:04 pm, 2004, GMT", "y2004m1d2 H15M4 GMT"},
        Shape{"2.1.2004, 3:04:05 pm GMT", "y2004m1d2 H15M4S5 GMT"},
        Shape{"2.1.2004 3:04 pm GMT", "y2004m1d2 H15M4 GMT"}, Shape{"2.1.2004", "y2004m1d2"},
        Shape{"Fri, 1/2/2004, 3:04 pm", "y2004m1d2 H15M4"}, Shape{"1/2 3:04 pm", "m1d2 H15M4"},
        Shape{"1/2 3 pm", "m1d2 H15"}, Shape{"Fri 1-2", "m1d2"},
        Shape{"Jan 2nd, 2004", "y2004m1d2"}, Shape{"Fri, 3:04 pm", " H15M4"},
        Shape{"Fri, 3 pm", " H15"}, Shape{"3:04 pm, Fri", " H15M4"}, Shape{"3 pm, Fri", " H15"},
        // A number behind a zone's name is its offset: the formats with the year there come later.
        Shape{"Fri Jan 2 03:04:05 EST 2004", "m1d2 H3M4S5 EST offset 72240"},
        Shape{"Fri Jan 2 03:04 EST 2004", "m1d2 H3M4 EST offset 72240"}));

INSTANTIATE_TEST_SUITE_P(
    ByFormatOn, DateShape,
    testing::Values(
        Shape{"Fri, 2-Jan-2004 03:04:05 GMT", "y2004m1d2 H3M4S5 GMT"},
        Shape{"Fri, 2-Jan-2004 03:04 GMT", "y2004m1d2 H3M4 GMT"},
        Shape{"2003-12-13", "y2003m12d13"}, Shape{"2003-12-13T18:30:02Z", "y2003m12d13 H18M30S2 Z"},
        Shape{"2003-12-13 6:30 pm +1", "y2003m12d13 H18M30 offset 3600"},
        // With seconds the day comes first, where it can.
        Shape{"1/2/2004 3:04:05 pm", "y2004m2d1 H15M4S5"},
        Shape{"1/31/2004 3:04:05 pm", "y2004m1d31 H15M4S5"},
        Shape{"3pm, 1/2/2004", "y2004m1d2 H15"}, Shape{"3:04pm, 1/2/2004", "y2004m1d2 H15M4"},
        Shape{"3:04:05pm, 1/2/2004", "y2004m1d2 H15M4S5"},
        Shape{"3pm, 31/12/2004", "y2004m12d31 H15"},
        Shape{"3:04pm, 31/12/2004", "y2004m12d31 H15M4"},
        Shape{"3:04:05pm, 31/12/2004", "y2004m12d31 H15M4S5"},
        Shape{"Fri, 3:04:05 pm EST", " H15M4S5 EST"}, Shape{"Fri, 3:04 pm EST", " H15M4 EST"},
        Shape{"3:04:05 Z", " H3M4S5 Z"}, Shape{"3:04 +0100", " H3M4 offset 3600"},
        Shape{"Tuesday", ""}, Shape{"Fri Jan", "m1"}, Shape{"Fri, Jan 2 2004", "y2004m1d2"},
        Shape{"Fri, 2 Jan 2004", "y2004m1d2"}));

// What the formats' order and their small rules decide.
INSTANTIATE_TEST_SUITE_P(
    Rules, DateShape,
    testing::Values(
        Shape{"Sat, 07 Sep 2002 00:00:01 +0100", "y2002m9d7 H0M0S1 offset 3600"},
        Shape{"Sat, 07 Sep 2002 00:00:01 GMT+0100", "y2002m9d7 H0M0S1 GMT offset 3600"},
        Shape{"2003-12-13T18:30:02.25+01:00", "y2003m12d13 H18M30S2 offset 3600"},
        Shape{"2003-12-13T18:30:02-05:30", "y2003m12d13 H18M30S2 offset -16200"},
        Shape{"2003-12-13T18:30:02-0530", "y2003m12d13 H18M30S2 offset -19800"},
        Shape{"2003-12-13T18:30Z", "y2003m12d13 H18M30 Z"}, Shape{"3/4/05", "y2005m3d4"},
        Shape{"13/4/05", "y2013m4d5"}, Shape{"31/12/2004", "none"}, Shape{"4/13/05", "y2005m4d13"},
        Shape{"01.02.03", "y2003m2d1"}, Shape{"01.02.99", "y99m2d1"}, Shape{"12:00 PM", " H24M0"},
        Shape{"12:00 AM", " H12M0"}, Shape{"11:59 p.m.", " H23M59"}, Shape{"13:00 PM", "none"},
        Shape{"24:00", "none"}, Shape{"10:60", "none"}, Shape{"Feb 29 2100", "y2100m2d29"},
        Shape{"Feb 30 2004", "none"}, Shape{"Feb 29 2003", "none"}, Shape{"TUES", ""},
        Shape{"Jan 5", "m1d5"}, Shape{"10:30", " H10M30"},
        Shape{"Mon (a comment (nested)) 5 Jan 2004", "y2004m1d5"},
        Shape{"Mon 5 Jan 2004 (open", "none"}));

INSTANTIATE_TEST_SUITE_P(
    NoDates, DateShape,
    testing::Values(Shape{"", "none"}, Shape{"   ", "none"}, Shape{"(only a comment)", "none"},
                    Shape{"next week", "none"}, Shape{"THIS", "none"}, Shape{"2 weeks", "none"},
                    Shape{"1 month", "none"}, Shape{"3 days ago", "none"},
                    Shape{"yesterday", "none"}, Shape{"5 Jan 2004 #", "none"},
                    Shape{"5 J\xc3\xa4nner 2004", "none"}, Shape{"20031213T183002Z", "none"}));

// Numbers wrap at 32 bits, so that some are what they do not look like.
INSTANTIATE_TEST_SUITE_P(Overflow, DateShape,
                         testing::Values(Shape{"4294969300-1-2", "y2004m1d2"},
                                         Shape{"99999999999999999999", "none"},
                                         Shape{"2004-4294967297-2", "y2004m1d2"},
                                         Shape{"1/200 10:00", "m1d-56 H10M0"},
                                         Shape{"10:00 -2147483648", " H10M0 offset -1152"}));

TEST(DateParser, FailsForTextsAbove32768Bytes) {
    const std::string date = "Mon 5 Jan 2004";
    EXPECT_EQ(parse(date + std::string(32768 - date.size(), ' ')), "y2004m1d5");
    EXPECT_EQ(parse(date + std::string(32769 - date.size(), ' ')), "none");
}

TEST(DateParser, FailsForLongTextsOfManyTokens) {
    for (const char* piece : {":", "5 ", "a", "(", ")", ".", "-", "+", "T ", "Jan "}) {
        std::string text;
        while (text.size() < 32760)
            text += piece;
        EXPECT_EQ(parse(text), "none") << piece;
    }
}

TEST(DateParser, ClearsWhatItGivesBack) {
    GregorianDate date(1e8);
    std::uint32_t mask = 0xff;
    char zone[256];
    std::fill(std::begin(zone), std::end(zone), 'x');
    std::int32_t offset = 5;
    EXPECT_EQ(parsedatelite("no date", date, mask, zone, sizeof zone, offset), 0);
    EXPECT_EQ(date.year, 0);
    EXPECT_EQ(date.second, 0);
    EXPECT_EQ(mask, 0u);
    EXPECT_EQ(std::count(std::begin(zone), std::end(zone), '\0'), 256);
    EXPECT_EQ(offset, -1);
    EXPECT_EQ(parsedatelite(nullptr, date, mask, zone, sizeof zone, offset), 0);
}

TEST(DateParser, WritesNoFurtherThanTheZonesBuffer) {
    GregorianDate date;
    std::uint32_t mask = 0;
    char zone[] = "xxxxxxxx";
    std::int32_t offset = 0;
    EXPECT_EQ(parsedatelite("10:00 AKST", date, mask, zone, 4, offset), 1);
    EXPECT_STREQ(zone, "AKS");
    EXPECT_EQ(zone[4], 'x');
    EXPECT_EQ(parsedatelite("10:00 AKST", date, mask, nullptr, 0, offset), 1);
}

namespace {

/// Parses texts at 2026-01-01 00:00:00 GMT, in a default zone of its own.
class DateReading : public testing::Test {
 protected:
    /// The date in GMT, or "none", and the zone's name.
    std::string read(const char* text) {
        const AutoreleasePool pool;
        const bool isDate = parseDateText(text, mDate, mZone);
        EXPECT_EQ(isDate, mDate.get() != nullptr);
        const std::string zone = mZone ? mZone->getName() : "no zone";
        return (mDate ? Ref<String>(mDate->toString())->utf8() : "none") + ", " + zone;
    }

    ManualClock mClock;
    DefaultZone mDefaultZone{"America/New_York"};
    Ref<Date> mDate;
    Ref<TimeZone> mZone;
};

}  // namespace

TEST_F(DateReading, IsInTheZoneOfItsOffset) {
    EXPECT_EQ(read("Sat, 07 Sep 2002 00:00:01 +0100"), "2002-09-06 23:00:01 +0000, GMT+01:00");
    EXPECT_EQ(read("Sat, 07 Sep 2002 00:00:01 GMT"), "2002-09-07 00:00:01 +0000, GMT");
    EXPECT_EQ(read("2003-12-13T18:30:02.25+01:00"), "2003-12-13 17:30:02 +0000, GMT+01:00");
    EXPECT_EQ(read("2003-12-13T18:30:02 EST-0800"), "2003-12-14 02:30:02 +0000, GMT-08:00");
}

TEST_F(DateReading, WithAZoneThatBeginsWithZIsInGMT) {
    EXPECT_EQ(read("2003-12-13T18:30:02Z"), "2003-12-13 18:30:02 +0000, GMT");
}

TEST_F(DateReading, IsInTheZoneOfItsName) {
    EXPECT_EQ(read("2003-12-13 18:30 EST"), "2003-12-13 23:30:00 +0000, GMT-05:00");
    EXPECT_EQ(read("2003-06-13 18:30 EST"), "2003-06-13 23:30:00 +0000, GMT-05:00");
    EXPECT_EQ(read("2003-06-13 18:30 JST"), "2003-06-13 09:30:00 +0000, GMT+09:00");
}

TEST_F(DateReading, WithAZoneThatNobodyKnowsIsInTheDefaultZone) {
    mZone = TimeZone::fixedZone(3600);
    EXPECT_EQ(read("2003-12-13 18:30 ESTS"), "2003-12-13 23:30:00 +0000, no zone");
}

TEST_F(DateReading, WithMonthAndHourButNoZoneIsInGMT) {
    EXPECT_EQ(read("2003-12-13 18:30"), "2003-12-13 18:30:00 +0000, GMT");
    EXPECT_EQ(read("Jan 5, 10:30"), "2026-01-05 10:30:00 +0000, GMT");
}

TEST_F(DateReading, WithoutHourOrZoneIsInTheDefaultZone) {
    EXPECT_EQ(read("2003-12-13"), "2003-12-13 05:00:00 +0000, no zone");
    EXPECT_EQ(read("2003-06-13"), "2003-06-13 04:00:00 +0000, no zone");
}

TEST_F(DateReading, WithoutHourOrZoneIsInTheZoneThatTheHolderHad) {
    mZone = TimeZone::fixedZone(3600);
    EXPECT_EQ(read("2003-12-13"), "2003-12-12 23:00:00 +0000, GMT+01:00");
    EXPECT_EQ(read("10:30"), "2026-01-01 09:30:00 +0000, GMT+01:00");
}

TEST_F(DateReading, TakesWhatItLacksFromToday) {
    // In the default zone it is still the last day of the year.
    EXPECT_EQ(read("10:30"), "2025-12-31 15:30:00 +0000, no zone");
    EXPECT_EQ(read("Tuesday"), "2025-12-31 05:00:00 +0000, no zone");
    EXPECT_EQ(read("TUES"), "2025-12-31 05:00:00 +0000, no zone");
    EXPECT_EQ(read("Jan 5"), "2025-01-05 05:00:00 +0000, no zone");
    EXPECT_EQ(read("10:30 GMT"), "2026-01-01 10:30:00 +0000, GMT");
}

TEST_F(DateReading, CountsOnFromHour24) {
    EXPECT_EQ(read("2003-12-13 12:00 PM"), "2003-12-14 00:00:00 +0000, GMT");
    EXPECT_EQ(read("Feb 29 2100 10:00"), "2100-03-01 10:00:00 +0000, GMT");
}

TEST_F(DateReading, ThatFailsLeavesNeitherDateNorZone) {
    mZone = TimeZone::fixedZone(3600);
    mDate = Date::date(5);
    EXPECT_EQ(read("next week"), "none, no zone");
    EXPECT_EQ(read(nullptr), "none, no zone");
}

TEST_F(DateReading, OfTheStartOfTheCountIsNoDate) {
    EXPECT_TRUE(parseDateText("2001-01-01T00:00:00Z", mDate, mZone));
    EXPECT_EQ(mDate.get(), nullptr);
    EXPECT_TRUE(mZone);
}

TEST_F(DateReading, NeedsNoPool) {
    mZone = TimeZone::fixedZone(3600);
    mDate = Date::date(5);
    EXPECT_TRUE(parseDateText("2003-12-13T18:30:02+02:00", mDate, mZone));
    EXPECT_FALSE(parseDateText("no date", mDate, mZone));
}
