#include "Foundation/Date.h"

#include "Foundation/Bundle.h"
#include "Foundation/Clock.h"
#include "Foundation/CurrentLocale.h"
#include "Foundation/DateFormatter.h"
#include "Foundation/DateParser.h"
#include "Foundation/GregorianDate.h"
#include "Foundation/Logger.h"
#include "Foundation/String.h"

#include <cmath>
#include <functional>
#include <map>
#include <string>

namespace Foundation {

namespace {

/// A formatter for the current locale, made anew when that has become another one.
struct LocalFormatter {
    std::string locale;
    std::string pattern;
    Ref<DateFormatter> formatter;
};

std::string formatByKey(const char* key, double time) {
    static std::map<std::string, LocalFormatter> sFormatters;
    LocalFormatter& cached = sFormatters[key];
    const std::string locale = currentTimeLocale();
    const std::string pattern = localizedText(key);
    if (cached.locale != locale || cached.pattern != pattern) {
        cached.formatter = DateFormatter::localized(pattern, locale);
        cached.locale = locale;
        cached.pattern = pattern;
    }
    return cached.formatter->format(time);
}

int dayOfYear(const GregorianDate& date) {
    GregorianDate start;
    start.year = date.year;
    start.month = 1;
    start.day = 1;
    constexpr double kSecondsPerDay = 86400;
    const double days = date.getAbsoluteTimeInGMT() - start.getAbsoluteTimeInGMT();
    return static_cast<int>(days / kSecondsPerDay);
}

const char* relativeFormatKey(const GregorianDate& date, const GregorianDate& today) {
    if (date.year != today.year) return "PastYearFmt";
    const int daysAgo = dayOfYear(today) - dayOfYear(date);
    if (daysAgo == 0) return "TodayFmt";
    if (daysAgo == 1) return "YesterdayFmt";
    if (daysAgo >= 2 && daysAgo <= 6) return "ThisWeekFmt";
    return "ThisYearFmt";
}

}  // namespace

DateReturner Date::date(double absoluteTime) {
    if (absoluteTime == 0.0 || std::isnan(absoluteTime)) return nullptr;
    return DateReturner(new Date(absoluteTime));
}

DateReturner Date::now() {
    return nowPlus(0);
}

DateReturner Date::nowPlus(double seconds) {
    return date(Clock::current().now() + seconds);
}

DateReturner Date::addTime(double seconds) const {
    return date(mAbsoluteTime + seconds);
}

DateReturner Date::parseDate(const String* text) {
    Ref<Date> date;
    Ref<TimeZone> zone;
    if (!parseDateText(text ? text->utf8().c_str() : nullptr, date, zone)) {
        gWarn.log("Date::parseDate failed on '%@'", text);
    }
    return date;
}

StringReturner Date::toStringUsingFormat(DateFormatter* formatter) const {
    if (!formatter) return nullptr;
    std::string text = formatter->format(mAbsoluteTime);
    if (formatter == getAtomFormat() && text.size() >= 2) text.insert(text.size() - 2, ":");
    return String::string(std::move(text));
}

DateFormatter* Date::getAtomFormat() {
    static const Ref<DateFormatter> sFormat = DateFormatter::fixed("yyyy-MM-dd'T'HH:mm:ss.SSSZ");
    return sFormat;
}

DateFormatter* Date::getHTTPFormat() {
    static const Ref<DateFormatter> sFormat =
        DateFormatter::fixedInGMT("EEE, dd MMM yyyy kk:mm:ss zzz");
    return sFormat;
}

StringReturner Date::dateToString(const Date* date) {
    if (!date) return nullptr;
    static LocalFormatter sFormatter;
    const std::string locale = currentTimeLocale();
    if (sFormatter.locale != locale) {
        sFormatter.formatter = DateFormatter::shortDateLongTime(locale);
        sFormatter.locale = locale;
    }
    return String::string(sFormatter.formatter->format(date->mAbsoluteTime));
}

StringReturner Date::getLocalizedRelativeString() const {
    const char* key =
        relativeFormatKey(GregorianDate(mAbsoluteTime), GregorianDate(Clock::current().now()));
    return String::string(formatByKey(key, mAbsoluteTime));
}

double Date::getTimeAgo(const Date* date) {
    return Clock::current().now() - getAbsoluteTime(date);
}

int Date::compare(const Date& other) const {
    return (mAbsoluteTime > other.mAbsoluteTime) - (mAbsoluteTime < other.mAbsoluteTime);
}

std::size_t Date::getHash() const {
    return std::hash<double>()(mAbsoluteTime);
}

bool Date::isEqual(const PFRefCounted* other) const {
    const auto* date = dynamic_cast<const Date*>(other);
    return date && date->mAbsoluteTime == mAbsoluteTime;
}

StringReturner Date::toString() const {
    const GregorianDate d = GregorianDate::inGMT(mAbsoluteTime);
    return String::stringWithFormat("%04d-%02d-%02d %02d:%02d:%02d +0000", d.year, d.month, d.day,
                                    d.hour, d.minute, static_cast<int>(d.second));
}

}  // namespace Foundation
