#include "Foundation/DateFormat.h"

namespace Foundation {

namespace {

using Class = DateTokenClass;

constexpr std::int8_t kDaysOfMonth[] = {31, 31, 28, 31, 30, 31, 30, 31, 31, 30, 31, 30, 31};
constexpr std::int8_t kDaysOfMonthInLeapYear[] = {31, 31, 29, 31, 30, 31, 30,
                                                  31, 31, 30, 31, 30, 31};

// Sums of what a text says wrap around where they pass 32 bits.
std::int32_t sum(std::int32_t a, std::int32_t b) {
    return static_cast<std::int32_t>(static_cast<std::uint32_t>(a) + static_cast<std::uint32_t>(b));
}
std::int32_t negated(std::int32_t value) {
    return static_cast<std::int32_t>(0u - static_cast<std::uint32_t>(value));
}

/// One walk over a text's tokens.
class Walk {
 public:
    Walk(const DateTokens& tokens, DateParts& parts) : mTokens(tokens), mParts(parts) {}

    bool isAtEnd() const { return mIndex == mTokens.count(); }

    /// Takes what an item needs. If that is not at hand it takes nothing and gives false.
    bool take(char item) {
        switch (item) {
            case 'A':
                return skip(Class::Weekday);
            case 'B':
                return takeValue(Class::Month, mParts.month) || takeNumber(mParts.month);
            case 'm':
                return takeNumber(mParts.month);
            case 'd':
                return takeDay();
            case 'H':
                return takeNumber(mParts.hour);
            case 'M':
                return takeNumber(mParts.minute);
            case 'S':
                return takeSecond();
            case 'Y':
                return takeYear();
            case 'p':
                return takeValue(Class::Meridian, mParts.meridian);
            case 't':
                return skip(Class::TimeMark);
            case ',':
                return skip(Class::Comma);
            case '.':
                return skip(Class::Dot);
            case ':':
                return skip(Class::Colon);
            case '-':
                return takeSign(Class::Dash, -1);
            case '+':
                return takeSign(Class::Plus, 1);
            default:
                return takeZone();
        }
    }

 private:
    /// The class of the token at hand. A number whose sign was taken counts as one without.
    Class kind() const { return mSignIsTaken ? Class::Number : mTokens.classAt(mIndex); }
    std::int32_t value() const {
        const std::int32_t value = mTokens.at(mIndex).value;
        return mSignIsTaken && value < 0 ? negated(value) : value;
    }
    void advance() {
        ++mIndex;
        mSignIsTaken = false;
    }

    bool skip(Class wanted) {
        if (kind() != wanted) return false;
        advance();
        return true;
    }
    bool takeValue(Class wanted, std::int32_t& part) {
        if (kind() != wanted) return false;
        part = value();
        advance();
        return true;
    }
    bool takeNumber(std::int32_t& part) { return takeValue(Class::Number, part); }

    bool takeDay() {
        if (!takeNumber(mParts.day)) return false;
        skip(Class::OrdinalSuffix);
        return true;
    }

    bool takeSecond() {
        if (!takeNumber(mParts.second)) return false;
        if (kind() == Class::Dot && mTokens.classAt(mIndex + 1) == Class::Number) mIndex += 2;
        return true;
    }

    bool takeYear() {
        if (!takeNumber(mParts.year)) return false;
        if (mParts.year < 38) mParts.year += 2000;
        return true;
    }

    bool takeSign(Class alone, int sign) {
        if (skip(alone)) return true;
        const bool hasSign = kind() == Class::SignedNumber || kind() == Class::MinusZero;
        if (!hasSign || (kind() == Class::MinusZero && sign > 0)) return false;
        if (sign > 0 ? value() < 0 : value() > 0) return false;
        mSignIsTaken = true;
        return true;
    }

    bool takeZone() {
        if (isOffset()) {
            takeOffset();
            return true;
        }
        if (skip(Class::StandardZone)) {
            skip(Class::DaylightZone);
        } else if (!skip(Class::DaylightZone)) {
            return false;
        }
        if (isOffset()) takeOffset();
        return true;
    }

    bool isOffset() const {
        return kind() == Class::Number || kind() == Class::SignedNumber ||
               kind() == Class::MinusZero;
    }

    void takeOffset() {
        const std::int32_t hours = value();
        advance();
        if (hours < -12 || hours > 12) {
            // Hours and minutes in one number, as in "+0130".
            mParts.offsetMinutes = hours % 100 + hours / 100 * 60;
            return;
        }
        mParts.offsetMinutes = hours * 60;
        const bool hasMinutes = kind() == Class::Colon &&
                                mTokens.classAt(mIndex + 1) == Class::Number &&
                                mTokens.at(mIndex + 1).value < 60;
        if (!hasMinutes) return;
        // The minutes are added whatever the hours' sign, so "-05:30" is -270 minutes. Deliberate:
        // the dates in people's stores were read this way.
        mParts.offsetMinutes = sum(mParts.offsetMinutes, mTokens.at(mIndex + 1).value);
        mIndex += 2;
    }

    const DateTokens& mTokens;
    DateParts& mParts;
    std::size_t mIndex = 0;
    bool mSignIsTaken = false;
};

bool isYearInRange(std::int32_t year) {
    const std::int32_t y = year < 1901 ? year : year - 1900;
    return y >= -1 && y <= 300;
}

bool isDayInMonth(const DateParts& parts) {
    if (parts.month == -1 || parts.year == -1) return true;
    // Every fourth year, without the rule of centuries: 2100 has a 29 February.
    const std::int8_t* days = parts.year % 4 == 0 ? kDaysOfMonthInLeapYear : kDaysOfMonth;
    return parts.day <= days[parts.month];
}

bool areValid(const DateParts& parts) {
    if (parts.hour >= 13 && parts.meridian != -1) return false;
    if (parts.hour > 23 || parts.minute > 59 || parts.second > 59) return false;
    if (parts.month != -1 && (parts.month < 1 || parts.month > 12)) return false;
    return isYearInRange(parts.year) && isDayInMonth(parts);
}

}  // namespace

bool DateFormat::mayMatch(const DateTokens& tokens) const noexcept {
    return tokens.count() >= mShortest && tokens.count() <= mLongest &&
           (tokens.classes() & ~mTakes) == 0 && tokens.count() > 0 &&
           (DateTokens::bit(tokens.at(0).kind) & mStarts) != 0;
}

bool DateFormat::match(const DateTokens& tokens, DateParts& parts) const noexcept {
    if (!mayMatch(tokens)) return false;
    parts = DateParts();
    Walk walk(tokens, parts);
    for (std::size_t i = 0; i < mCount; ++i) {
        if (!walk.take(mItems[i].letter) && !mItems[i].isOptional) return false;
    }
    return walk.isAtEnd() && areValid(parts);
}

}  // namespace Foundation
