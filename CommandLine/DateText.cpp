#include "DateText.h"

#include "Failure.h"
#include "TimeText.h"

#include <chrono>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <optional>
#include <vector>

namespace Commands {

namespace {

constexpr double kMinute = 60;
constexpr double kHour = 60 * kMinute;
constexpr double kDay = 24 * kHour;
constexpr double kWeek = 7 * kDay;

struct Unit {
    const char* name;  ///< in full and in the plural
    const char* sign;  ///< the short form
    double seconds;
};

constexpr Unit kUnits[] = {{"weeks", "w", kWeek},
                           {"days", "d", kDay},
                           {"hours", "h", kHour},
                           {"minutes", "min", kMinute},
                           {"seconds", "s", 1}};

std::time_t unixTime(const OVDate& date) {
    return std::chrono::system_clock::to_time_t(date.timePoint());
}

OVDate dateOf(std::time_t time) {
    return OVDate(std::chrono::system_clock::from_time_t(time));
}

/// The start of the local day that a point in time is in, and that many days later.
OVDate startOfDay(const OVDate& date, int daysLater = 0) {
    const std::time_t time = unixTime(date);
    std::tm local{};
    localtime_r(&time, &local);
    local.tm_hour = local.tm_min = local.tm_sec = 0;
    local.tm_mday += daysLater;
    local.tm_isdst = -1;
    return dateOf(std::mktime(&local));
}

std::string dayOf(const OVDate& date) {
    const std::time_t time = unixTime(date);
    std::tm local{};
    localtime_r(&time, &local);
    char text[16];
    std::strftime(text, sizeof text, "%Y-%m-%d", &local);
    return text;
}

std::string count(double number, const char* unit) {
    return std::to_string(std::llround(std::floor(number))) + ' ' + unit;
}

/// "5 min" and so on; empty for what is too long for that.
std::string shortDuration(double seconds) {
    if (seconds < kHour) return count(seconds / kMinute, "min");
    if (seconds < kDay) return count(seconds / kHour, "h");
    if (seconds < 2 * kDay) return "1 day";
    if (seconds < kWeek) return count(seconds / kDay, "days");
    return {};
}

std::optional<double> secondsOf(const std::string& unit) {
    for (const Unit& each : kUnits) {
        const std::string name = each.name;
        if (unit == each.sign || unit == name || unit == name.substr(0, name.size() - 1)) {
            return each.seconds;
        }
    }
    return std::nullopt;
}

/// A number and a unit, with a blank in between or not.
std::optional<double> lengthOf(const std::string& text) {
    char* end = nullptr;
    const double number = std::strtod(text.c_str(), &end);
    if (end == text.c_str() || number < 0 || !std::isfinite(number)) return std::nullopt;
    while (*end == ' ') {
        ++end;
    }
    const std::optional<double> unit = secondsOf(end);
    if (!unit) return std::nullopt;
    return number * *unit;
}

std::optional<OVDate> calendarDate(const std::string& text) {
    constexpr const char* kFormats[] = {"%Y-%m-%d", "%Y-%m-%dT%H:%M", "%Y-%m-%dT%H:%M:%S",
                                        "%Y-%m-%d %H:%M", "%Y-%m-%d %H:%M:%S"};
    for (const char* format : kFormats) {
        std::tm time{};
        time.tm_isdst = -1;
        const char* end = strptime(text.c_str(), format, &time);
        if (end && *end == 0) return dateOf(std::mktime(&time));
        if (end && *end == 'Z' && end[1] == 0) {
            time.tm_isdst = 0;
            return dateOf(timegm(&time));
        }
    }
    return std::nullopt;
}

}  // namespace

OVDate DateText::now() {
    return OVDate(std::chrono::system_clock::now());
}

std::string DateText::iso8601(const OVDate& date) {
    return TimeText::iso8601(std::chrono::floor<std::chrono::seconds>(date.timePoint()));
}

std::string DateText::relative(const OVDate& date, const OVDate& now) {
    const double ago = now.absoluteTime() - date.absoluteTime();
    if (std::fabs(ago) < kMinute) return ago < 0 ? "in a moment" : "just now";
    const std::string length = shortDuration(std::fabs(ago));
    if (length.empty()) return dayOf(date);
    if (ago < 0) return "in " + length;
    return length == "1 day" ? "yesterday" : length + " ago";
}

OVDate DateText::parse(const std::string& text, const OVDate& now) {
    if (text == "now") return now;
    if (text == "today") return startOfDay(now);
    if (text == "yesterday") return startOfDay(now, -1);
    const std::string ago = " ago";
    const bool hasAgo = text.ends_with(ago);
    const std::string rest = hasAgo ? text.substr(0, text.size() - ago.size()) : text;
    if (const std::optional<double> seconds = lengthOf(rest)) return now.addingSeconds(-*seconds);
    if (const std::optional<OVDate> date = calendarDate(text)) return *date;
    throw Failure(ExitStatus::Usage,
                  "\"" + text +
                      "\" is no time: write a day such as 2026-11-21, \"today\", \"yesterday\", or "
                      "how long ago it is, such as 12h or 3d");
}

std::string DateText::duration(double seconds) {
    if (seconds < 0) return "never";
    for (const Unit& unit : kUnits) {
        const double number = seconds / unit.seconds;
        if (number < 1 || number != std::floor(number)) continue;
        const std::string name = unit.name;
        return count(number, (number == 1 ? name.substr(0, name.size() - 1) : name).c_str());
    }
    return count(seconds, "seconds");
}

double DateText::parseDuration(const std::string& text) {
    const bool isBare = text.find_first_not_of("0123456789") == std::string::npos;
    if (const auto seconds = lengthOf(isBare ? text + "s" : text)) return *seconds;
    throw Failure(ExitStatus::Usage, "\"" + text +
                                         "\" is no length of time: write seconds, or 30min, 12h, "
                                         "14d, 2w");
}

}  // namespace Commands
