#pragma once

#include "Foundation/DateTokens.h"

#include <cstddef>
#include <cstdint>
#include <string_view>

namespace Foundation {

/// What a format took from a text; -1 for what it did not.
struct DateParts {
    std::int32_t year = -1;
    std::int32_t month = -1;
    std::int32_t day = -1;
    std::int32_t hour = -1;
    std::int32_t minute = -1;
    std::int32_t second = -1;
    std::int32_t meridian = -1;  ///< 0 for AM, 12 for PM
    std::int32_t offsetMinutes = -1;
};

/// A format of dates, compiled from its text, in which each letter is an item:
///
/// | item | takes |
/// |---|---|
/// | A a | a weekday |
/// | B b | a month, by name or number |
/// | m | a month's number |
/// | d | a day, with a suffix ("1st") |
/// | H I M | hour, hour, minute |
/// | S | a second, with a fraction, which is dropped |
/// | Y y | a year; below 38 it is of this century |
/// | p t | AM or PM; the "T" of ISO 8601 |
/// | , . : | the mark itself |
/// | - | "-" or "/", or the sign of a negative number, which the next item takes |
/// | + | "+", or the sign of a positive number likewise |
/// | Z z | a zone: by name, by offset or by both |
///
/// Blanks are nothing; an item in brackets is optional.
class DateFormat {
 public:
    static constexpr std::size_t kCapacity = 16;

    /// A text that is no format does not compile.
    consteval explicit DateFormat(std::string_view text);

    /// Whether all tokens together are a date of this format. `parts` is what was taken up to the
    /// decision. REQUIRES: `tokens.isComplete()`.
    bool match(const DateTokens& tokens, DateParts& parts) const noexcept;

    /// The most tokens that it takes.
    constexpr std::size_t longest() const { return mLongest; }

 private:
    struct Item {
        char letter = 0;
        bool isOptional = false;
    };
    /// What tokens an item can take, for the cheap tests ahead of a try.
    struct Use {
        std::uint32_t first = 0;  ///< classes of the token at which it starts
        std::uint32_t more = 0;   ///< and of those that follow
        std::size_t shortest = 1;
        std::size_t longest = 1;
    };

    static consteval char plainLetter(char letter);
    static consteval Use useOf(char letter);
    consteval void add(Item item, bool& startIsOpen);
    bool mayMatch(const DateTokens& tokens) const noexcept;

    Item mItems[kCapacity];
    std::size_t mCount = 0;
    std::size_t mShortest = 0;
    std::size_t mLongest = 0;
    std::uint32_t mStarts = 0;  ///< classes that the first token may have
    std::uint32_t mTakes = 0;   ///< classes that any token may have
};

consteval char DateFormat::plainLetter(char letter) {
    switch (letter) {
        case 'a':
            return 'A';
        case 'b':
            return 'B';
        case 'I':
            return 'H';
        case 'y':
            return 'Y';
        case 'z':
            return 'Z';
        default:
            return letter;
    }
}

consteval DateFormat::Use DateFormat::useOf(char letter) {
    using Class = DateTokenClass;
    constexpr auto bit = DateTokens::bit;
    constexpr std::uint32_t kNumber = bit(Class::Number);
    constexpr std::uint32_t kSigned = bit(Class::SignedNumber);
    constexpr std::uint32_t kMinusZero = bit(Class::MinusZero);
    constexpr std::uint32_t kZones = bit(Class::StandardZone) | bit(Class::DaylightZone);
    switch (letter) {
        case 'A':
            return {.first = bit(Class::Weekday)};
        case 'B':
            return {.first = bit(Class::Month) | kNumber};
        case 'd':
            return {.first = kNumber, .more = bit(Class::OrdinalSuffix), .longest = 2};
        case 'm':
        case 'H':
        case 'M':
        case 'Y':
            return {.first = kNumber};
        case 'S':
            return {.first = kNumber, .more = bit(Class::Dot), .longest = 3};
        case 'p':
            return {.first = bit(Class::Meridian)};
        case 't':
            return {.first = bit(Class::TimeMark)};
        case ',':
            return {.first = bit(Class::Comma)};
        case '.':
            return {.first = bit(Class::Dot)};
        case ':':
            return {.first = bit(Class::Colon)};
        case '-':
            return {.first = bit(Class::Dash) | kSigned | kMinusZero, .shortest = 0};
        case '+':
            return {.first = bit(Class::Plus) | kSigned, .shortest = 0};
        case 'Z':
            return {.first = kNumber | kSigned | kMinusZero | kZones,
                    .more = bit(Class::Colon),
                    .longest = 5};
        default:
            throw "an item that no format has";
    }
}

consteval void DateFormat::add(Item item, bool& startIsOpen) {
    const Use use = useOf(item.letter);
    mItems[mCount++] = item;
    if (startIsOpen) mStarts |= use.first;
    mTakes |= use.first | use.more;
    mLongest += use.longest;
    if (item.isOptional) return;
    startIsOpen = false;
    mShortest += use.shortest;
}

consteval DateFormat::DateFormat(std::string_view text) {
    bool isOptional = false;
    bool startIsOpen = true;
    for (const char c : text) {
        if (c == '[' || c == ']') {
            isOptional = c == '[';
        } else if (c != ' ') {
            add({plainLetter(c), isOptional}, startIsOpen);
        }
    }
}

}  // namespace Foundation
