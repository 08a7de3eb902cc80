#include "Foundation/TimeZoneNames.h"

#include <Orvane/OVFormat.h>

#include <cstdlib>

namespace Foundation {

namespace {

struct Abbreviation {
    std::string_view name;
    std::int32_t minutes;
};

// Zone databases give abbreviations other meanings (ICU's "AST" is Alaska's, its "BST" that of
// Bangladesh), or the rules of a place. Here they mean what they mean in dates of mail and feeds,
// and a daylight time stays one in winter.
constexpr Abbreviation kAbbreviations[] = {
    {"UT", 0},      {"UTC", 0},     {"CUT", 0},    {"Z", 0},        {"WET", 0},     {"BST", 60},
    {"CET", 60},    {"MET", 60},    {"MEZ", 60},   {"CES", 120},    {"CEST", 120},  {"MEZT", 120},
    {"EET", 120},   {"MSK", 180},   {"MSD", 240},  {"WAST", 480},   {"HKT", 480},   {"CCT", 480},
    {"WADT", 540},  {"JST", 540},   {"KST", 540},  {"KDT", 600},    {"CAST", 570},  {"CADT", 630},
    {"EAST", 600},  {"EADT", 660},  {"NZST", 720}, {"NZDT", 780},   {"NST", -210},  {"NDT", -150},
    {"AST", -240},  {"AST4", -240}, {"ADT", -180}, {"EST", -300},   {"EST5", -300}, {"EDT", -240},
    {"CST", -360},  {"CST6", -360}, {"CDT", -300}, {"MST", -420},   {"MST7", -420}, {"MDT", -360},
    {"PST", -480},  {"PST8", -480}, {"PDT", -420}, {"YST", -540},   {"YST9", -540}, {"YDT", -480},
    {"AKST", -540}, {"AKDT", -480}, {"HST", -600}, {"HST10", -600}, {"HAST", -600}, {"HADT", -540},
};

struct Rules {
    std::string_view name;
    std::string_view place;
};

constexpr Rules kRules[] = {
    {"AST4ADT", "America/Halifax"},     {"EST5EDT", "America/New_York"},
    {"CST6CDT", "America/Chicago"},     {"MST7MDT", "America/Denver"},
    {"PST8PDT", "America/Los_Angeles"}, {"YST9YDT", "America/Anchorage"},
};

/// A number and how many digits it has.
struct Digits {
    std::int64_t value = 0;
    std::size_t count = 0;
};

/// Takes the digits at the start of `text` off it, six at most.
Digits takeDigits(std::string_view& text) {
    Digits digits;
    while (!text.empty() && text[0] >= '0' && text[0] <= '9' && digits.count < 6) {
        digits.value = digits.value * 10 + (text[0] - '0');
        ++digits.count;
        text.remove_prefix(1);
    }
    return digits;
}

/// Takes ":" and two digits below 60 off `text`; 0 if there is no ":".
std::optional<std::int64_t> takeSixtieths(std::string_view& text) {
    if (!text.starts_with(':')) return 0;
    text.remove_prefix(1);
    const Digits digits = takeDigits(text);
    if (digits.count != 2 || digits.value >= 60) return std::nullopt;
    return digits.value;
}

/// Reads "1", "01", "0130", "01:30" or "01:30:15", in seconds.
std::optional<std::int64_t> readDistance(std::string_view text) {
    const Digits hours = takeDigits(text);
    if (hours.count == 0) return std::nullopt;
    if (text.empty() && hours.count > 2) {
        if (hours.count > 4 || hours.value % 100 >= 60) return std::nullopt;
        return hours.value / 100 * 3600 + hours.value % 100 * 60;
    }
    const std::optional<std::int64_t> minutes = takeSixtieths(text);
    if (!minutes) return std::nullopt;
    const std::optional<std::int64_t> seconds = takeSixtieths(text);
    if (!seconds || !text.empty()) return std::nullopt;
    return hours.value * 3600 + *minutes * 60 + *seconds;
}

}  // namespace

std::optional<std::int32_t> findZoneAbbreviation(std::string_view name) noexcept {
    for (const Abbreviation& row : kAbbreviations) {
        if (row.name == name) return row.minutes * 60;
    }
    return std::nullopt;
}

std::string_view findZoneOfRules(std::string_view name) noexcept {
    for (const Rules& row : kRules) {
        if (row.name == name) return row.place;
    }
    return {};
}

std::optional<std::int32_t> readGMTOffset(std::string_view name) noexcept {
    if (!name.starts_with("GMT")) return std::nullopt;
    name.remove_prefix(3);
    if (name.empty()) return 0;
    const bool isWest = name[0] == '-';
    if (!isWest && name[0] != '+') return std::nullopt;
    const std::optional<std::int64_t> distance = readDistance(name.substr(1));
    if (!distance) return std::nullopt;
    const std::int64_t seconds = isWest ? -*distance : *distance;
    if (seconds < INT32_MIN || seconds > INT32_MAX) return std::nullopt;
    return static_cast<std::int32_t>(seconds);
}

std::string nameOfGMTOffset(std::int32_t secondsFromGMT) {
    if (secondsFromGMT == 0) return "GMT";
    const char* sign = secondsFromGMT < 0 ? "-" : "+";
    const std::int64_t distance = std::abs(static_cast<std::int64_t>(secondsFromGMT));
    std::string name = OVFormat("GMT%s%02d:%02d", sign, distance / 3600, distance / 60 % 60);
    if (distance % 60 != 0) name += OVFormat(":%02d", distance % 60);
    return name;
}

}  // namespace Foundation
