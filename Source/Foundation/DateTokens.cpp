#include "Foundation/DateTokens.h"

#include <algorithm>
#include <cstring>

namespace Foundation {

namespace {

// The C library's classes follow the locale; the tables are ASCII.
bool isSpace(char c) {
    return c == ' ' || (c >= '\t' && c <= '\r');
}
bool isDigit(char c) {
    return c >= '0' && c <= '9';
}
bool isLetter(char c) {
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z');
}
char toUpper(char c) {
    return c >= 'a' && c <= 'z' ? static_cast<char>(c - 'a' + 'A') : c;
}

std::int32_t negated(std::int32_t value) {
    return static_cast<std::int32_t>(0u - static_cast<std::uint32_t>(value));
}

/// A word without its dots. Letters that no table's word could still use are only counted.
class Word {
 public:
    void add(char letter) {
        if (mLength < sizeof mLetters) mLetters[mLength] = letter;
        ++mLength;
    }
    bool isTooLong() const { return mLength > sizeof mLetters; }
    std::string_view text() const { return {mLetters, mLength}; }
    /// The word to look up: plurals stand for their singulars.
    std::string_view singular() const {
        std::string_view word = text();
        if (word != "THIS" && word != "CES" && word.ends_with('S')) word.remove_suffix(1);
        return word;
    }

 private:
    char mLetters[kLongestDateWord + 1];  // and the S of a plural
    std::size_t mLength = 0;
};

}  // namespace

class DateTokens::Reader {
 public:
    Reader(DateTokens& tokens, std::string_view text, char* zoneName, std::size_t zoneNameSize)
        : mTokens(tokens),
          mNext(text.data()),
          mEnd(text.data() + text.size()),
          mZoneName(zoneName),
          mZoneNameSize(zoneNameSize) {}

    bool read() {
        for (;;) {
            while (mNext != mEnd && isSpace(*mNext))
                ++mNext;
            if (mNext == mEnd) return true;
            if (*mNext == '(') {
                if (!skipComment()) return false;
            } else {
                readToken();
            }
        }
    }

 private:
    char peek() const { return mNext != mEnd ? *mNext : '\0'; }

    bool skipComment() {
        int depth = 0;
        for (; mNext != mEnd; ++mNext) {
            switch (*mNext) {
                case '(':
                    ++depth;
                    break;
                case ')':
                    if (--depth == 0) {
                        ++mNext;
                        return true;
                    }
                    break;
                case '\\':
                    if (++mNext == mEnd) return false;
                    break;
                case '\r':
                    return false;
            }
        }
        return false;
    }

    void readToken() {
        const char c = *mNext;
        if (isDigit(c)) {
            mTokens.add(DateTokenClass::Number, readNumber());
        } else if (isLetter(c) || c == '.') {
            readWord();
        } else if (c == '+' || c == '-') {
            readSigned();
        } else {
            readMark();
        }
    }

    /// Numbers that pass 32 bits wrap around.
    std::int32_t readNumber() {
        std::uint32_t value = 0;
        for (; isDigit(peek()); ++mNext)
            value = value * 10 + static_cast<std::uint32_t>(*mNext - '0');
        return static_cast<std::int32_t>(value);
    }

    void readSigned() {
        const bool isMinus = *mNext++ == '-';
        if (peek() == '+' || peek() == '-') ++mNext;  // of two signs the first counts
        if (!isDigit(peek())) {
            mTokens.add(isMinus ? DateTokenClass::Dash : DateTokenClass::Plus);
            return;
        }
        const std::int32_t value = readNumber();
        if (isMinus && value == 0) {
            mTokens.add(DateTokenClass::MinusZero);
        } else {
            mTokens.add(DateTokenClass::SignedNumber, isMinus ? negated(value) : value);
        }
    }

    void readMark() {
        const char c = *mNext++;
        switch (c) {
            case ',':
                return mTokens.add(DateTokenClass::Comma);
            case '/':
                return mTokens.add(DateTokenClass::Dash);
            case ':':
                return mTokens.add(DateTokenClass::Colon);
            default:
                return mTokens.add(DateTokenClass::Unknown, static_cast<unsigned char>(c));
        }
    }

    void readWord() {
        const bool isDot = *mNext == '.';
        Word word;
        for (; isLetter(peek()) || peek() == '.'; ++mNext) {
            if (*mNext != '.') word.add(toUpper(*mNext));
        }
        if (isDot) return mTokens.add(DateTokenClass::Dot);
        if (word.isTooLong()) return mTokens.add(DateTokenClass::Unknown);
        const DateToken token = findDateWord(word.singular());
        mTokens.add(token.kind, token.value);
        if (token.kind == DateTokenClass::StandardZone ||
            token.kind == DateTokenClass::DaylightZone) {
            noteZone(word.text());
        }
    }

    void noteZone(std::string_view name) {
        if (mZoneNameSize == 0) return;
        const std::size_t length = std::min(name.size(), mZoneNameSize - 1);
        std::memcpy(mZoneName, name.data(), length);
        mZoneName[length] = '\0';
    }

    DateTokens& mTokens;
    const char* mNext;
    const char* mEnd;
    char* mZoneName;
    std::size_t mZoneNameSize;
};

bool DateTokens::read(std::string_view text, char* zoneName, std::size_t zoneNameSize) noexcept {
    mCount = 0;
    mClasses = 0;
    return Reader(*this, text, zoneName, zoneNameSize).read();
}

void DateTokens::add(DateTokenClass kind, std::int32_t value) noexcept {
    if (mCount < kCapacity) mTokens[mCount] = {kind, value};
    ++mCount;
    mClasses |= bit(kind);
}

}  // namespace Foundation
