#include "Foundation/DateWords.h"

namespace Foundation {

namespace {

using Class = DateTokenClass;

struct Row {
    std::string_view word;
    DateToken token;
};

// In this order: of the rows that begin with the word, the first counts.
constexpr Row kMonthsAndDays[] = {
    {"JANUARY", {Class::Month, 1}},    {"FEBRUARY", {Class::Month, 2}},
    {"MARCH", {Class::Month, 3}},      {"APRIL", {Class::Month, 4}},
    {"MAY", {Class::Month, 5}},        {"JUNE", {Class::Month, 6}},
    {"JULY", {Class::Month, 7}},       {"AUGUST", {Class::Month, 8}},
    {"SEPTEMBER", {Class::Month, 9}},  {"OCTOBER", {Class::Month, 10}},
    {"NOVEMBER", {Class::Month, 11}},  {"DECEMBER", {Class::Month, 12}},
    {"SUNDAY", {Class::Weekday, 0}},   {"MONDAY", {Class::Weekday, 1}},
    {"TUESDAY", {Class::Weekday, 2}},  {"WEDNESDAY", {Class::Weekday, 3}},
    {"THURSDAY", {Class::Weekday, 4}}, {"FRIDAY", {Class::Weekday, 5}},
    {"SATURDAY", {Class::Weekday, 6}},
};

// A zone's value is its way west of Greenwich as the formats' authors noted it. Nothing reads it: a
// zone counts by its class and its name, and `TimeZone` knows where it lies.
constexpr Row kWords[] = {
    {"ST", {Class::OrdinalSuffix, 0}},
    {"ND", {Class::OrdinalSuffix, 0}},
    {"RD", {Class::OrdinalSuffix, 0}},
    {"TH", {Class::OrdinalSuffix, 0}},
    {"AM", {Class::Meridian, 0}},
    {"PM", {Class::Meridian, 12}},
    {"YEAR", {Class::MonthsUnit, 12}},
    {"MONTH", {Class::MonthsUnit, 1}},
    {"WEEK", {Class::SecondsUnit, 604800}},
    {"DAY", {Class::SecondsUnit, 86400}},
    {"HOUR", {Class::SecondsUnit, 3600}},
    {"MINUTE", {Class::SecondsUnit, 60}},
    {"MIN", {Class::SecondsUnit, 60}},
    {"SECOND", {Class::SecondsUnit, 1}},
    {"SEC", {Class::SecondsUnit, 1}},
    {"T", {Class::TimeMark, 0}},
    {"GMT", {Class::StandardZone, 0}},
    {"UT", {Class::StandardZone, 0}},
    {"UTC", {Class::StandardZone, 0}},
    {"CUT", {Class::StandardZone, 0}},
    {"Z", {Class::StandardZone, 0}},
    {"WET", {Class::StandardZone, 0}},
    {"BST", {Class::DaylightZone, 0}},
    {"NST", {Class::StandardZone, 210}},
    {"NDT", {Class::DaylightZone, 210}},
    {"AST", {Class::StandardZone, 240}},
    {"AST4", {Class::StandardZone, 240}},
    {"ADT", {Class::DaylightZone, 240}},
    {"AST4ADT", {Class::DaylightZone, 240}},
    {"EST", {Class::StandardZone, 300}},
    {"EST5", {Class::StandardZone, 300}},
    {"EDT", {Class::DaylightZone, 300}},
    {"EST5EDT", {Class::DaylightZone, 300}},
    {"CST", {Class::StandardZone, 360}},
    {"CST6", {Class::StandardZone, 360}},
    {"CDT", {Class::DaylightZone, 360}},
    {"CST6CDT", {Class::DaylightZone, 360}},
    {"MST", {Class::StandardZone, 420}},
    {"MST7", {Class::StandardZone, 420}},
    {"MDT", {Class::DaylightZone, 420}},
    {"MST7MDT", {Class::DaylightZone, 420}},
    {"PST", {Class::StandardZone, 480}},
    {"PST8", {Class::StandardZone, 480}},
    {"PDT", {Class::DaylightZone, 480}},
    {"PST8PDT", {Class::DaylightZone, 480}},
    {"YST", {Class::StandardZone, 560}},
    {"YST9", {Class::StandardZone, 560}},
    {"YDT", {Class::DaylightZone, 560}},
    {"YST9YDT", {Class::DaylightZone, 560}},
    {"AKST", {Class::StandardZone, 560}},
    {"AKDT", {Class::DaylightZone, 560}},
    {"HST", {Class::StandardZone, 600}},
    {"HST10", {Class::StandardZone, 600}},
    {"HAST", {Class::StandardZone, 600}},
    {"HADT", {Class::DaylightZone, 600}},
    {"CES", {Class::DaylightZone, -60}},
    {"CEST", {Class::DaylightZone, -60}},
    {"MEZ", {Class::StandardZone, -60}},
    {"MEZT", {Class::DaylightZone, -60}},
    {"CET", {Class::StandardZone, -60}},
    {"MET", {Class::StandardZone, -60}},
    {"EET", {Class::StandardZone, -120}},
    {"MSK", {Class::StandardZone, -180}},
    {"MSD", {Class::DaylightZone, -180}},
    {"WAST", {Class::StandardZone, -480}},
    {"WADT", {Class::DaylightZone, -480}},
    {"HKT", {Class::StandardZone, -480}},
    {"CCT", {Class::StandardZone, -480}},
    {"JST", {Class::StandardZone, -560}},
    {"KST", {Class::StandardZone, -560}},
    {"KDT", {Class::StandardZone, -560}},
    {"CAST", {Class::StandardZone, -590}},
    {"CADT", {Class::DaylightZone, -590}},
    {"EAST", {Class::StandardZone, -600}},
    {"EADT", {Class::DaylightZone, -600}},
    {"NZST", {Class::StandardZone, -720}},
    {"NZDT", {Class::DaylightZone, -720}},
};

constexpr std::size_t longestWord() {
    std::size_t longest = 0;
    for (const Row& row : kMonthsAndDays)
        longest = row.word.size() > longest ? row.word.size() : longest;
    for (const Row& row : kWords)
        longest = row.word.size() > longest ? row.word.size() : longest;
    return longest;
}
static_assert(longestWord() == kLongestDateWord);

}  // namespace

DateToken findDateWord(std::string_view word) noexcept {
    if (word.size() >= 3) {
        for (const Row& row : kMonthsAndDays) {
            if (row.word[0] == word[0] && row.word.starts_with(word)) return row.token;
        }
    }
    for (const Row& row : kWords) {
        if (row.word == word) return row.token;
    }
    return {DateTokenClass::Unknown, 0};
}

}  // namespace Foundation
