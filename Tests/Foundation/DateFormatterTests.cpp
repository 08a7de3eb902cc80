#include "Foundation/DateFormatter.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Date.h"
#include "Foundation/GregorianDate.h"
#include "Foundation/Ref.h"
#include "Foundation/String.h"
#include "Support/DefaultZone.h"
#include "Support/EnvVar.h"
#include "Support/GMT.h"
#include "Support/Language.h"
#include "Support/LogCapture.h"
#include "Support/ManualClock.h"

#include <gtest/gtest.h>

#include <limits>

using namespace Foundation;
using Support::DefaultZone;
using Support::EnvVar;
using Support::inGMT;
using Support::Language;
using Support::LogCapture;
using Support::ManualClock;

namespace {

std::string format(double time, DateFormatter* formatter) {
    const Ref<Date> date = Date::date(time);
    return Ref<String>(date->toStringUsingFormat(formatter))->utf8();
}

std::string atom(double time) {
    return format(time, Date::getAtomFormat());
}
std::string http(double time) {
    return format(time, Date::getHTTPFormat());
}

/// The relative text of a time in GMT, with the clock at 2026-03-10 12:00:00 GMT.
std::string relative(double time, double now = inGMT(2026, 3, 10, 12)) {
    const ManualClock clock(now);
    const Ref<Date> date = Date::date(time);
    return Ref<String>(date->getLocalizedRelativeString())->utf8();
}

}  // namespace

TEST(DateFormatter, ForAtomHasAZoneWithAColon) {
    const DefaultZone berlin("Europe/Berlin");
    EXPECT_EQ(atom(inGMT(2005, 1, 2, 3, 4, 5)), "2005-01-02T04:04:05.000+01:00");
    EXPECT_EQ(atom(inGMT(2005, 7, 2, 3, 4, 5.25)), "2005-07-02T05:04:05.250+02:00");
}

TEST(DateFormatter, FollowsTheDefaultZone) {
    EXPECT_EQ(atom(inGMT(2005, 1, 2, 3, 4, 5)), "2005-01-02T03:04:05.000+00:00");
    {
        const DefaultZone newYork("America/New_York");
        EXPECT_EQ(atom(inGMT(2005, 1, 2, 3, 4, 5)), "2005-01-01T22:04:05.000-05:00");
    }
    EXPECT_EQ(atom(inGMT(2005, 1, 2, 3, 4, 5)), "2005-01-02T03:04:05.000+00:00");
}

TEST(DateFormatter, GivesNoOtherFormatAColon) {
    const Ref<DateFormatter> same = DateFormatter::fixed("yyyy-MM-dd'T'HH:mm:ss.SSSZ");
    EXPECT_EQ(format(inGMT(2005, 1, 2, 3, 4, 5), same), "2005-01-02T03:04:05.000+0000");
}

TEST(DateFormatter, ForAtomKeepsMilliseconds) {
    for (const int milliseconds : {1, 123, 250, 499, 999}) {
        const std::string text = atom(inGMT(2005, 10, 21, 1, 2, 3 + milliseconds / 1000.0));
        EXPECT_EQ(text.substr(20, 3), OVFormat("%03d", milliseconds));
    }
}

TEST(DateFormatter, ForHTTPIsInGMTWithHoursFrom1To24) {
    const DefaultZone berlin("Europe/Berlin");
    EXPECT_EQ(http(inGMT(2005, 1, 2, 13, 4, 5)), "Sun, 02 Jan 2005 13:04:05 GMT");
    EXPECT_EQ(http(inGMT(2005, 1, 2, 0, 4, 5)), "Sun, 02 Jan 2005 24:04:05 GMT");
}

TEST(DateFormatter, OfAFixedFormatIsTheSameInEveryLocale) {
    const EnvVar locale("LC_ALL", "de_DE.UTF-8");
    EXPECT_EQ(http(inGMT(2005, 3, 6, 13, 4, 5)), "Sun, 06 Mar 2005 13:04:05 GMT");
}

TEST(DateFormatter, HasTheGregorianCalendarInAllYears) {
    EXPECT_EQ(atom(inGMT(1582, 10, 10)), "1582-10-10T00:00:00.000+00:00");
    EXPECT_EQ(atom(inGMT(1000, 3, 1)), "1000-03-01T00:00:00.000+00:00");
    const Ref<DateFormatter> german = DateFormatter::localized("y-MM-dd", "de_DE");
    EXPECT_EQ(german->format(inGMT(1000, 3, 1)), "1000-03-01");
}

TEST(DateFormatter, SurvivesAnyTime) {
    constexpr double kInfinity = std::numeric_limits<double>::infinity();
    for (const double time : {kInfinity, -kInfinity, 1e300, -1e300, 1e17, -1e17}) {
        EXPECT_FALSE(atom(time).empty());
        EXPECT_FALSE(http(time).empty());
        const Ref<Date> date = Date::date(time);
        EXPECT_FALSE(Ref<String>(date->getLocalizedRelativeString())->utf8().empty());
        EXPECT_FALSE(Ref<String>(Date::dateToString(date))->utf8().empty());
        EXPECT_FALSE(Ref<String>(date->toString())->utf8().empty());
    }
}

TEST(DateFormatter, OfNullGivesNull) {
    const Ref<Date> date = Date::date(1);
    EXPECT_EQ(Ref<String>(date->toStringUsingFormat(nullptr)).get(), nullptr);
}

TEST(Date, HasAShortDateAndLongTimeInTheLocale) {
    const Ref<Date> date = Date::date(inGMT(2005, 7, 2, 13, 4, 5));
    {
        const EnvVar locale("LC_ALL", "de_DE.UTF-8");
        EXPECT_EQ(Ref<String>(Date::dateToString(date))->utf8(), "02.07.05, 13:04:05 UTC");
    }
    {
        const EnvVar locale("LC_ALL", "sv_SE.UTF-8");
        EXPECT_EQ(Ref<String>(Date::dateToString(date))->utf8(), "2005-07-02 13:04:05 UTC");
    }
    EXPECT_EQ(Ref<String>(Date::dateToString(nullptr)).get(), nullptr);
}

TEST(Date, IsShownRelativeToToday) {
    EXPECT_EQ(relative(inGMT(2026, 3, 10, 0, 1)), "Today, 12:01 AM");
    EXPECT_EQ(relative(inGMT(2026, 3, 10, 23, 59)), "Today, 11:59 PM");
    EXPECT_EQ(relative(inGMT(2026, 3, 9, 23, 59)), "Yesterday, 11:59 PM");
    EXPECT_EQ(relative(inGMT(2026, 3, 8, 15)), "Sunday, 3:00 PM");
    EXPECT_EQ(relative(inGMT(2026, 3, 4, 15)), "Wednesday, 3:00 PM");
    EXPECT_EQ(relative(inGMT(2026, 3, 3, 15)), "Mar 3, 3:00 PM");
    EXPECT_EQ(relative(inGMT(2026, 1, 1, 15)), "Jan 1, 3:00 PM");
    EXPECT_EQ(relative(inGMT(2025, 12, 31, 15)), "Dec 31, 2025, 3:00 PM");
}

TEST(Date, ToComeIsShownByItsYearOnly) {
    EXPECT_EQ(relative(inGMT(2026, 3, 11, 15)), "Mar 11, 3:00 PM");
    EXPECT_EQ(relative(inGMT(2026, 12, 31, 15)), "Dec 31, 3:00 PM");
    EXPECT_EQ(relative(inGMT(2027, 1, 1, 15)), "Jan 1, 2027, 3:00 PM");
}

TEST(Date, OfLastYearIsNotYesterdays) {
    EXPECT_EQ(relative(inGMT(2025, 12, 31, 23), inGMT(2026, 1, 1, 1)), "Dec 31, 2025, 11:00 PM");
    EXPECT_EQ(relative(inGMT(2024, 3, 1, 15), inGMT(2024, 3, 2)), "Yesterday, 3:00 PM");
    EXPECT_EQ(relative(inGMT(2024, 2, 28, 15), inGMT(2024, 3, 1)), "Wednesday, 3:00 PM");
}

TEST(Date, IsShownRelativeToTodayInTheDefaultZone) {
    const DefaultZone berlin("Europe/Berlin");
    EXPECT_EQ(relative(inGMT(2026, 3, 9, 23, 30)), "Today, 12:30 AM");
}

TEST(Date, IsShownInTheUsersLanguage) {
    const EnvVar locale("LC_ALL", "de_DE.UTF-8");
    const Language german("de");
    EXPECT_EQ(relative(inGMT(2026, 3, 10, 15, 4)), "Heute, 15:04");
    EXPECT_EQ(relative(inGMT(2026, 3, 9, 15, 4)), "Gestern, 15:04");
    EXPECT_EQ(relative(inGMT(2026, 3, 8, 15, 4)), "Sonntag, 15:04");
    EXPECT_EQ(relative(inGMT(2026, 1, 2, 15, 4)), "2. Jan., 15:04");
    EXPECT_EQ(relative(inGMT(2025, 12, 2, 15, 4)), "2. Dez. 2025, 15:04");
}

TEST(Date, IsParsedFromAText) {
    const LogCapture log;
    const Ref<String> text = String::string("Sat, 07 Sep 2002 00:00:01 +0100");
    const Ref<Date> date = Date::parseDate(text);
    ASSERT_TRUE(date);
    EXPECT_EQ(date->getAbsoluteTime(), inGMT(2002, 9, 6, 23, 0, 1));
    EXPECT_TRUE(log.lines().empty());
}

TEST(Date, WarnsAboutATextThatIsNone) {
    LogCapture log;
    const AutoreleasePool pool;
    const Ref<String> text = String::string("next week");
    EXPECT_EQ(Ref<Date>(Date::parseDate(text)).get(), nullptr);
    EXPECT_TRUE(log.contains("Date::parseDate failed on 'next week'"));
    EXPECT_EQ(Ref<Date>(Date::parseDate(nullptr)).get(), nullptr);
}
