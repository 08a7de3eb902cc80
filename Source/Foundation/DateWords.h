#pragma once

#include <cstdint>
#include <string_view>

namespace Foundation {

/// What a piece of a date's text is. The numbers are the ones that the formats were written with.
enum class DateTokenClass : std::int8_t {
    Unknown = -1,  ///< a word of no table, or a character of no other use
    None = 0,      ///< no token: the end of the text
    Weekday = 1,
    Number = 2,
    SignedNumber = 3,
    Colon = 4,
    Meridian = 5,  ///< "AM", "PM"
    StandardZone = 6,
    DaylightZone = 7,
    Month = 8,
    SecondsUnit = 9,
    MonthsUnit = 10,
    Comma = 11,
    Dot = 12,
    OrdinalSuffix = 13,
    Dash = 14,  ///< "-" or "/" alone
    Plus = 15,  ///< "+" alone
    MinusZero = 16,
    TimeMark = 17,  ///< the "T" of ISO 8601
};

struct DateToken {
    DateTokenClass kind = DateTokenClass::None;
    std::int32_t value = 0;
};

/// The letters of the longest word that a table holds.
inline constexpr std::size_t kLongestDateWord = 9;

/// Classifies a word of letters in upper case: a weekday or month by any beginning of three letters
/// or more, every other word whole.
DateToken findDateWord(std::string_view word) noexcept;

}  // namespace Foundation
