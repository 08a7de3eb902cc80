#include "Foundation/GregorianDate.h"

#include "Foundation/Date.h"
#include "Foundation/TimeZone.h"

#include <algorithm>
#include <cmath>

namespace Foundation {

namespace {

constexpr std::int64_t kSecondsPerDay = 86400;
constexpr std::int64_t kSecondsPerHour = 3600;
constexpr std::int64_t kSecondsPerMinute = 60;
constexpr std::int64_t kDaysPer400Years = 146097;
constexpr std::int64_t kDaysPer100Years = 36524;
constexpr std::int64_t kDaysPer4Years = 1461;
constexpr std::int64_t kDaysPer5Months = 153;  // from March on, and again from August
/// Days from 0000-03-01 to 2001-01-01.
constexpr std::int64_t kStart = 730791;

constexpr std::int64_t divideDown(std::int64_t a, std::int64_t b) {
    return a / b - (a % b < 0);
}

/// Days from 2001-01-01 to a day. Inside, years begin in March: the leap day is then the last of
/// its year, and the lengths of the months before it repeat every five.
constexpr std::int64_t toDays(std::int64_t year, std::int64_t month, std::int64_t day) {
    const std::int64_t monthsFromMarch = year * 12 + month - 3;
    const std::int64_t y = divideDown(monthsFromMarch, 12);
    const std::int64_t m = monthsFromMarch - y * 12;
    const std::int64_t leapDays = divideDown(y, 4) - divideDown(y, 100) + divideDown(y, 400);
    return y * 365 + leapDays + (kDaysPer5Months * m + 2) / 5 + day - 1 - kStart;
}
static_assert(toDays(2001, 1, 1) == 0);
static_assert(toDays(1970, 1, 1) * kSecondsPerDay == -978307200);
static_assert(toDays(2000, 3, 1) - toDays(2000, 2, 28) == 2);
static_assert(toDays(1900, 3, 1) - toDays(1900, 2, 28) == 1);

constexpr double kFirst = static_cast<double>(toDays(INT32_MIN, 1, 1) * kSecondsPerDay);
// A double that far out has a resolution of 8 seconds.
constexpr double kLast = static_cast<double>(toDays(INT32_MAX, 12, 31) * kSecondsPerDay);

void setDay(GregorianDate& date, std::int64_t days) {
    days += kStart;
    const std::int64_t era = divideDown(days, kDaysPer400Years);
    std::int64_t rest = days - era * kDaysPer400Years;
    // The last day of a 400-year or 4-year stretch is its leap day, which belongs to the last
    // century or year and not to one of its own.
    const std::int64_t century = std::min<std::int64_t>(rest / kDaysPer100Years, 3);
    rest -= century * kDaysPer100Years;
    const std::int64_t leapCycle = rest / kDaysPer4Years;
    rest -= leapCycle * kDaysPer4Years;
    const std::int64_t yearOfCycle = std::min<std::int64_t>(rest / 365, 3);
    rest -= yearOfCycle * 365;
    const std::int64_t m = (5 * rest + 2) / kDaysPer5Months;
    date.day = static_cast<std::int8_t>(rest - (kDaysPer5Months * m + 2) / 5 + 1);
    date.month = static_cast<std::int8_t>(m < 10 ? m + 3 : m - 9);
    date.year = static_cast<std::int32_t>(era * 400 + century * 100 + leapCycle * 4 + yearOfCycle +
                                          (m < 10 ? 0 : 1));
}

}  // namespace

GregorianDate::GregorianDate(const Date* date) : GregorianDate(Date::getAbsoluteTime(date)) {}

void GregorianDate::setAbsoluteTime(double absoluteTime) {
    *this = inZone(absoluteTime, nullptr);
}

double GregorianDate::getAbsoluteTime() const {
    return getAbsoluteTimeInZone(nullptr);
}

DateReturner GregorianDate::getDate() const {
    return Date::date(getAbsoluteTime());
}

GregorianDate GregorianDate::inZone(double absoluteTime, const TimeZone* zone) {
    if (!zone) zone = TimeZone::defaultZone();
    return inGMT(absoluteTime + zone->getSecondsFromGMT(absoluteTime));
}

double GregorianDate::getAbsoluteTimeInZone(const TimeZone* zone) const {
    if (!zone) zone = TimeZone::defaultZone();
    return zone->getAbsoluteTime(getAbsoluteTimeInGMT());
}

GregorianDate GregorianDate::inGMT(double absoluteTime) {
    if (std::isnan(absoluteTime)) absoluteTime = 0;
    absoluteTime = std::clamp(absoluteTime, kFirst, kLast);
    double whole = std::floor(absoluteTime);
    double fraction = absoluteTime - whole;
    if (fraction >= 1) {  // a hair before a full second, which rounds up to it
        fraction = 0;
        whole += 1;
    }
    const auto seconds = static_cast<std::int64_t>(whole);
    const std::int64_t days = divideDown(seconds, kSecondsPerDay);
    const std::int64_t secondOfDay = seconds - days * kSecondsPerDay;

    GregorianDate date;
    setDay(date, days);
    date.hour = static_cast<std::int8_t>(secondOfDay / kSecondsPerHour);
    date.minute = static_cast<std::int8_t>(secondOfDay / kSecondsPerMinute % 60);
    date.second = static_cast<double>(secondOfDay % 60) + fraction;
    return date;
}

double GregorianDate::getAbsoluteTimeInGMT() const {
    const std::int64_t seconds = toDays(year, month, day) * kSecondsPerDay +
                                 hour * kSecondsPerHour + minute * kSecondsPerMinute;
    return static_cast<double>(seconds) + second;
}

}  // namespace Foundation
