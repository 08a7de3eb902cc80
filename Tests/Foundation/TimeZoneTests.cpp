#include "Foundation/TimeZone.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Data.h"
#include "Foundation/Date.h"
#include "Foundation/FormatObjects.h"
#include "Foundation/GregorianDate.h"
#include "Foundation/Ref.h"
#include "Foundation/String.h"
#include "Support/DefaultZone.h"
#include "Support/GMT.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <limits>
#include <tuple>

using namespace Foundation;
using Support::DefaultZone;
using Support::inGMT;

namespace {

const double kWinter = inGMT(2005, 1, 15);
const double kSummer = inGMT(2005, 7, 15);

Ref<TimeZone> zone(std::string_view name) {
    return TimeZone::timeZone(name);
}

/// A name, and how far it is ahead of GMT in minutes in winter and in summer.
using Ahead = std::tuple<const char*, int, int>;
class TimeZoneName : public testing::TestWithParam<Ahead> {};

}  // namespace

TEST_P(TimeZoneName, IsKnown) {
    const auto& [name, winter, summer] = GetParam();
    const Ref<TimeZone> known = zone(name);
    ASSERT_TRUE(known) << name;
    EXPECT_EQ(known->getSecondsFromGMT(kWinter), winter * 60) << name;
    EXPECT_EQ(known->getSecondsFromGMT(kSummer), summer * 60) << name;
    EXPECT_EQ(known->getAbsoluteTime(kWinter), kWinter - winter * 60) << name;
    EXPECT_EQ(known->getAbsoluteTime(kSummer), kSummer - summer * 60) << name;
}

INSTANTIATE_TEST_SUITE_P(
    All, TimeZoneName,
    testing::Values(Ahead{"GMT", 0, 0}, Ahead{"UTC", 0, 0}, Ahead{"UT", 0, 0}, Ahead{"CUT", 0, 0},
                    Ahead{"Z", 0, 0}, Ahead{"WET", 0, 0}, Ahead{"Etc/UTC", 0, 0},
                    Ahead{"BST", 60, 60}, Ahead{"NST", -210, -210}, Ahead{"NDT", -150, -150},
                    Ahead{"AST", -240, -240}, Ahead{"ADT", -180, -180}, Ahead{"EST", -300, -300},
                    Ahead{"EDT", -240, -240}, Ahead{"CST", -360, -360}, Ahead{"CDT", -300, -300},
                    Ahead{"MST", -420, -420}, Ahead{"MDT", -360, -360}, Ahead{"PST", -480, -480},
                    Ahead{"PDT", -420, -420}, Ahead{"YST", -540, -540}, Ahead{"YDT", -480, -480},
                    Ahead{"AKST", -540, -540}, Ahead{"AKDT", -480, -480}, Ahead{"HST", -600, -600},
                    Ahead{"HAST", -600, -600}, Ahead{"HADT", -540, -540}, Ahead{"CES", 120, 120},
                    Ahead{"CEST", 120, 120}, Ahead{"MEZ", 60, 60}, Ahead{"MEZT", 120, 120},
                    Ahead{"CET", 60, 60}, Ahead{"MET", 60, 60}, Ahead{"EET", 120, 120},
                    Ahead{"MSK", 180, 180}, Ahead{"MSD", 240, 240}));

INSTANTIATE_TEST_SUITE_P(East, TimeZoneName,
                         testing::Values(Ahead{"WAST", 480, 480}, Ahead{"WADT", 540, 540},
                                         Ahead{"HKT", 480, 480}, Ahead{"CCT", 480, 480},
                                         Ahead{"JST", 540, 540}, Ahead{"KST", 540, 540},
                                         Ahead{"KDT", 600, 600}, Ahead{"CAST", 570, 570},
                                         Ahead{"CADT", 630, 630}, Ahead{"EAST", 600, 600},
                                         Ahead{"EADT", 660, 660}, Ahead{"NZST", 720, 720},
                                         Ahead{"NZDT", 780, 780}));

INSTANTIATE_TEST_SUITE_P(WithHours, TimeZoneName,
                         testing::Values(Ahead{"AST4", -240, -240}, Ahead{"EST5", -300, -300},
                                         Ahead{"CST6", -360, -360}, Ahead{"MST7", -420, -420},
                                         Ahead{"PST8", -480, -480}, Ahead{"YST9", -540, -540},
                                         Ahead{"HST10", -600, -600}));

INSTANTIATE_TEST_SUITE_P(Rules, TimeZoneName,
                         testing::Values(Ahead{"AST4ADT", -240, -180}, Ahead{"EST5EDT", -300, -240},
                                         Ahead{"CST6CDT", -360, -300}, Ahead{"MST7MDT", -420, -360},
                                         Ahead{"PST8PDT", -480, -420}, Ahead{"YST9YDT", -540, -480},
                                         Ahead{"Europe/Berlin", 60, 120},
                                         Ahead{"Asia/Kolkata", 330, 330},
                                         Ahead{"Australia/Sydney", 660, 600}));

INSTANTIATE_TEST_SUITE_P(Distances, TimeZoneName,
                         testing::Values(Ahead{"GMT+1", 60, 60}, Ahead{"GMT-01", -60, -60},
                                         Ahead{"GMT+0130", 90, 90}, Ahead{"GMT+130", 90, 90},
                                         Ahead{"GMT-05:30", -330, -330},
                                         Ahead{"GMT+25:00", 1500, 1500}));

TEST(TimeZone, OfAnUnknownNameIsNull) {
    const std::string tooLong(1000, 'A');
    for (std::string_view name : {"", "ET", "est", "Mars/Olympus", "Etc/Unknown", "GMT+", "GMT+1:3",
                                  "GMT+01:60", "GMTX", "GMT+0160", "GMT+12345", "GMT+01:00:00:00",
                                  "GMT+999999:00", "\xff\xfe", "Europe/Berlin ", tooLong.c_str()}) {
        EXPECT_EQ(zone(name).get(), nullptr) << name;
    }
    EXPECT_EQ(zone(std::string_view("GMT\0", 4)).get(), nullptr);
    EXPECT_EQ(Ref<TimeZone>(TimeZone::timeZone(static_cast<const String*>(nullptr))).get(),
              nullptr);
}

TEST(TimeZone, TakesItsNameAsAString) {
    const Ref<String> name = String::string("Europe/Berlin");
    const Ref<TimeZone> berlin = TimeZone::timeZone(name.get());
    ASSERT_TRUE(berlin);
    EXPECT_EQ(berlin->getName(), "Europe/Berlin");
    EXPECT_FALSE(berlin->isFixed());
}

TEST(TimeZone, HasANameThatIsReadBack) {
    for (const std::int32_t seconds : {0, 3600, -3600, 19800, -16200, 1, -1, 59, 86399, 90000,
                                       2000000000, INT32_MAX, INT32_MIN}) {
        const Ref<TimeZone> fixed = TimeZone::fixedZone(seconds);
        EXPECT_EQ(fixed->getSecondsFromGMT(kWinter), seconds);
        const Ref<TimeZone> again = zone(fixed->getName());
        ASSERT_TRUE(again) << fixed->getName();
        EXPECT_EQ(again->getSecondsFromGMT(kWinter), seconds) << fixed->getName();
        EXPECT_TRUE(IsEqual(fixed.get(), again.get()));
    }
    EXPECT_EQ(Ref<TimeZone>(TimeZone::fixedZone(-16200))->getName(), "GMT-04:30");
    EXPECT_EQ(Ref<TimeZone>(TimeZone::fixedZone(1))->getName(), "GMT+00:00:01");
    EXPECT_EQ(zone("EST")->getName(), "GMT-05:00");
}

TEST(TimeZone, OfACommonDistanceIsMadeOnce) {
    for (const std::int32_t seconds : {0, 900, -900, 3600, -16200, 64800, -64800}) {
        const Ref<TimeZone> first = TimeZone::fixedZone(seconds);
        EXPECT_EQ(first.get(), Ref<TimeZone>(TimeZone::fixedZone(seconds)).get()) << seconds;
        EXPECT_EQ(first->getSecondsFromGMT(kWinter), seconds);
    }
    for (const std::int32_t seconds : {1, -899, 65700, -65700, INT32_MAX, INT32_MIN}) {
        const Ref<TimeZone> first = TimeZone::fixedZone(seconds);
        EXPECT_NE(first.get(), Ref<TimeZone>(TimeZone::fixedZone(seconds)).get()) << seconds;
    }
}

TEST(TimeZone, IsReadBackFromItsData) {
    for (const char* name : {"Europe/Berlin", "GMT", "EST", "GMT-04:30", "EST5EDT"}) {
        const Ref<TimeZone> original = zone(name);
        const Ref<Data> data = original->getData();
        const Ref<TimeZone> again = TimeZone::timeZoneWithData(data);
        EXPECT_TRUE(IsEqual(original.get(), again.get())) << name;
    }
    const DefaultZone cet("CET");
    const Ref<Data> data = TimeZone::defaultZone()->getData();
    EXPECT_EQ(data->view(), "CET");
    EXPECT_EQ(Ref<TimeZone>(TimeZone::timeZoneWithData(data))->getSecondsFromGMT(kSummer), 7200);
}

TEST(TimeZone, OfDataThatIsNoneIsNull) {
    EXPECT_EQ(Ref<TimeZone>(TimeZone::timeZoneWithData(nullptr)).get(), nullptr);
    for (const char* bytes : {"", "Mars/Olympus", "EST ", "\xff"}) {
        const Ref<Data> data = Data::data(bytes, std::strlen(bytes));
        EXPECT_EQ(Ref<TimeZone>(TimeZone::timeZoneWithData(data)).get(), nullptr) << bytes;
    }
}

TEST(TimeZone, EqualsByName) {
    const Ref<TimeZone> berlin = zone("Europe/Berlin");
    EXPECT_TRUE(berlin->isEqual(zone("Europe/Berlin").get()));
    EXPECT_FALSE(berlin->isEqual(zone("Europe/Paris").get()));
    EXPECT_FALSE(berlin->isEqual(nullptr));
    EXPECT_EQ(zone("EST")->getHash(), zone("GMT-5")->getHash());
    const AutoreleasePool pool;
    EXPECT_EQ(OVFormat("%@", berlin), "Europe/Berlin");
}

TEST(TimeZone, CountsASkippedTimeAsIfTheClockHadNotBeenPutForward) {
    const Ref<TimeZone> berlin = zone("Europe/Berlin");
    // At 02:00 of this day clocks went to 03:00, which was 01:00 GMT.
    const double local = inGMT(2005, 3, 27, 2, 30);
    EXPECT_EQ(berlin->getAbsoluteTime(local), inGMT(2005, 3, 27, 1, 30));
    const GregorianDate shown = GregorianDate::inZone(berlin->getAbsoluteTime(local), berlin.get());
    EXPECT_EQ(shown.hour, 3);
    EXPECT_EQ(shown.minute, 30);
}

TEST(TimeZone, TakesTheEarlierOfATimeThatComesTwice) {
    const Ref<TimeZone> berlin = zone("Europe/Berlin");
    // At 03:00 of this day clocks went back to 02:00, which was 01:00 GMT.
    EXPECT_EQ(berlin->getAbsoluteTime(inGMT(2005, 10, 30, 2, 30)), inGMT(2005, 10, 30, 0, 30));
    EXPECT_EQ(berlin->getAbsoluteTime(inGMT(2005, 10, 30, 3, 0)), inGMT(2005, 10, 30, 2, 0));
}

TEST(TimeZone, SurvivesAnyTime) {
    const Ref<TimeZone> berlin = zone("Europe/Berlin");
    constexpr double kInfinity = std::numeric_limits<double>::infinity();
    for (const double time : {kInfinity, -kInfinity, 1e300, -1e300, 1e17, -1e17, 8.64e12, -8.64e12,
                              std::nan(""), 5e-324}) {
        EXPECT_LE(std::abs(berlin->getSecondsFromGMT(time)), 86400) << time;
        berlin->getAbsoluteTime(time);
        GregorianDate::inZone(time, berlin);
    }
}

TEST(TimeZone, OfTheProcessIsThatOfTheVariable) {
    {
        const DefaultZone berlin("Europe/Berlin");
        EXPECT_EQ(TimeZone::defaultZone()->getName(), "Europe/Berlin");
        EXPECT_EQ(TimeZone::defaultZone()->getSecondsFromGMT(kSummer), 7200);
    }
    {
        const DefaultZone tokyo("Asia/Tokyo");
        EXPECT_EQ(TimeZone::defaultZone()->getName(), "Asia/Tokyo");
    }
    EXPECT_EQ(TimeZone::defaultZone()->getName(), "GMT");
    EXPECT_TRUE(TimeZone::defaultZone()->isFixed());
}

TEST(TimeZone, KeepsThePlaceThatEveryNameOfTheVariableStandsFor) {
    // As the name of a default zone "CET" has rules; as an abbreviation it has none.
    const DefaultZone cet("CET");
    EXPECT_EQ(TimeZone::defaultZone()->getSecondsFromGMT(kSummer), 7200);
    EXPECT_EQ(zone("CET")->getSecondsFromGMT(kSummer), 3600);
}

TEST(GregorianDate, IsInTheDefaultTimeZone) {
    const DefaultZone berlin("Europe/Berlin");
    GregorianDate date(inGMT(2005, 7, 15, 23, 30));
    EXPECT_EQ(date.day, 16);
    EXPECT_EQ(date.hour, 1);
    EXPECT_EQ(date.getAbsoluteTime(), inGMT(2005, 7, 15, 23, 30));
    EXPECT_EQ(Ref<Date>(date.getDate())->getAbsoluteTime(), inGMT(2005, 7, 15, 23, 30));
    date.setAbsoluteTime(kWinter);
    EXPECT_EQ(date.hour, 1);
    EXPECT_EQ(GregorianDate(Ref<Date>(Date::date(kSummer)).get()).hour, 2);
    EXPECT_EQ(GregorianDate(static_cast<const Date*>(nullptr)).year, 2001);
}

TEST(GregorianDate, CountsOnInTheDefaultTimeZone) {
    const DefaultZone berlin("Europe/Berlin");
    GregorianDate date(inGMT(2005, 3, 1, 11));
    date.day = static_cast<std::int8_t>(date.day + 30);  // noon by summer time
    EXPECT_EQ(date.getAbsoluteTime(), inGMT(2005, 3, 31, 10));
    GregorianDate start(0.0);
    start.hour = 1;
    EXPECT_EQ(Ref<Date>(start.getDate()).get(), nullptr);
}
