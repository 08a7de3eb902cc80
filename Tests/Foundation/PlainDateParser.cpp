#include "Foundation/PlainDateParser.h"

#include "Foundation/DateTokens.h"

using Foundation::DateParts;
using Foundation::DateTokens;

namespace {

constexpr std::string_view kFormats[] = {
    "[A][,] B d[,] H:M:S [p] Y[,] [Z]",
    "[A][,] B d[,] [Y][,] H:M:S [p] [Z]",
    "[A][,] B d[,] [Y][,] H:M [p][,] [Z]",
    "[A][,] B d[,] [Y][,] H [p][,] [Z]",
    "[A][,] B d[,] H:M [p][,] [Y] [Z]",
    "[A][,] d B[,] [Y][,] H:M [p][,] [Z]",
    "[A][,] d B[,] [Y][,] H:M:S [p][,] [Z]",
    "[A][,] d B[,] H:M:S [Y][,] [p][,] [Z]",
    "[A][,] d B[,] H:M [p][,] [Y][,] [Z]",
    "d.m.y[,] H:M:S [p] [Z]",
    "d.m.y[,] H:M [p] [Z]",
    "d.m.y",
    "[A][,] m-d-y[,] [H][:][M] [p]",
    "[A][,] m-d[,] H:M [p]",
    "[A][,] m-d[,] H[p]",
    "[A][,] m-d",
    "[A][,] B d[,] Y",
    "[A][,] H:M [p]",
    "[A][,] H [p]",
    "H:M [p][,] [A]",
    "H [p][,] [A]",
    "[A][,] B d[,] H:M:S [p] [Z] [Y]",
    "[A][,] B d[,] H:M [p] [Z] [Y]",
    "[A][,] d B [,] H:M:S [p] [Z] [Y]",
    "[A][,] d B [,] H:M [p] [Z] [Y]",
    "[A][,] d-B-Y H:M:S [p] [Z]",
    "[A][,] d-B-Y H:M [p] [Z]",
    "d B Y H:M:S [Z]",
    "d B Y H:M [Z]",
    "y-m-d",
    "y-m-d [t] H:M:S [p] [Z]",
    "y-m-d [t] H:M [p] [Z]",
    "m-d-y H[p]",
    "m-d-y H:M[p]",
    "m-d-y H:M:S[p]",
    "H[p][,] m-d-y",
    "H:M[p][,] m-d-y",
    "H:M:S[p][,] m-d-y",
    "H[p][,] d-m-y",
    "H:M[p][,] d-m-y",
    "H:M:S[p][,] d-m-y",
    "A[,] H:M:S [p] [Z]",
    "A[,] H:M [p] [Z]",
    "H:M:S [p] [Z]",
    "H:M [p] [Z]",
    "A[,] [B] [d] [Y]",
    "A[,] [d] [B] [Y]",
    "B d[,][Y] H[p][,] [Z]",
    "B d[,] H[p]",
    "B d [,] H:M [p]",
    "d B [,][Y] H [p] [Z]",
    "d B [,] H:M [p]",
    "B d [,][Y]",
    "B d [,] H:M [p][,] [Y]",
    "B d [,] H [p][,] [Y]",
    "d B [,][Y]",
    "H[p] [,] B d",
    "H:M[p] [,] B d",
    "H [p]",
    "[A][,] d B[,] H:M:S [Y][,] [p][,] [Z]",
};

std::int32_t wrapped(std::int64_t value) {
    return static_cast<std::int32_t>(static_cast<std::uint32_t>(value));
}

}  // namespace

std::span<const std::string_view> PlainDateParser::formats() {
    return kFormats;
}

std::optional<DateParts> PlainDateParser::parse(std::string_view text) {
    DateTokens read;
    char zoneName[1];
    if (!read.read(text, zoneName, 0) || !read.isComplete()) return std::nullopt;
    std::vector<Token> tokens;
    for (std::size_t i = 0; i < read.count(); ++i)
        tokens.push_back({static_cast<int>(read.at(i).kind), read.at(i).value});
    for (const std::string_view format : kFormats) {
        PlainDateParser parser(format, tokens);
        if (parser.match()) return parser.mParts;
    }
    return std::nullopt;
}

bool PlainDateParser::match() {
    bool isOptional = false;
    for (const char item : mFormat) {
        if (item == '[' || item == ']') {
            isOptional = item == '[';
        } else if (item != ' ' && !take(item) && !isOptional) {
            return false;
        }
    }
    return mAt == mTokens.size() && isValid();
}

int PlainDateParser::kind(std::size_t ahead) const {
    return mAt + ahead < mTokens.size() ? mTokens[mAt + ahead].kind : 0;
}

bool PlainDateParser::skip(int wanted) {
    if (kind() != wanted) return false;
    ++mAt;
    return true;
}

bool PlainDateParser::number(std::int32_t& part) {
    if (kind() != 2) return false;
    part = mTokens[mAt++].value;
    return true;
}

bool PlainDateParser::take(char item) {
    switch (item) {
        case 'A':
            return skip(1);
        case 'B':
            if (kind() == 8) mTokens[mAt].kind = 2;
            return number(mParts.month);
        case 'm':
            return number(mParts.month);
        case 'd':
            if (!number(mParts.day)) return false;
            skip(13);
            return true;
        case 'H':
            return number(mParts.hour);
        case 'M':
            return number(mParts.minute);
        case 'S':
            if (!number(mParts.second)) return false;
            if (kind() == 12 && kind(1) == 2) mAt += 2;
            return true;
        case 'Y':
        case 'y':
            if (!number(mParts.year)) return false;
            if (mParts.year < 38) mParts.year += 2000;
            return true;
        case 'p':
            if (kind() != 5) return false;
            mParts.meridian = mTokens[mAt++].value;
            return true;
        case 't':
            return skip(17);
        case ',':
            return skip(11);
        case '.':
            return skip(12);
        case ':':
            return skip(4);
        case '-':
        case '+':
            return takeSign(item);
        default:
            return takeZone();
    }
}

bool PlainDateParser::takeSign(char item) {
    if (skip(item == '-' ? 14 : 15)) return true;
    if (item == '-') {
        if ((kind() != 3 && kind() != 16) || mTokens[mAt].value > 0) return false;
        mTokens[mAt].value = wrapped(-static_cast<std::int64_t>(mTokens[mAt].value));
    } else if (kind() != 3 || mTokens[mAt].value < 0) {
        return false;
    }
    mTokens[mAt].kind = 2;
    return true;
}

bool PlainDateParser::takeZone() {
    if (kind() != 2 && kind() != 3 && kind() != 16) {
        if (skip(6)) {
            skip(7);
        } else if (!skip(7)) {
            return false;
        }
    }
    if (kind() == 2 || kind() == 3 || kind() == 16) takeOffset();
    return true;
}

void PlainDateParser::takeOffset() {
    const std::int32_t value = mTokens[mAt++].value;
    if (value < -12 || value > 12) {
        mParts.offsetMinutes = value % 100 + value / 100 * 60;
        return;
    }
    mParts.offsetMinutes = value * 60;
    if (kind() == 4 && kind(1) == 2 && mTokens[mAt + 1].value < 60) {
        mParts.offsetMinutes = wrapped(std::int64_t{mParts.offsetMinutes} + mTokens[mAt + 1].value);
        mAt += 2;
    }
}

bool PlainDateParser::isValid() const {
    if (mParts.hour >= 13 && mParts.meridian != -1) return false;
    if (mParts.hour > 23 || mParts.minute > 59 || mParts.second > 59) return false;
    if (mParts.month != -1 && (mParts.month < 1 || mParts.month > 12)) return false;
    const std::int32_t y = mParts.year < 1901 ? mParts.year : mParts.year - 1900;
    if (y < -1 || y > 300) return false;
    if (mParts.month == -1 || mParts.year == -1) return true;
    const int days[] = {31, 31, 28, 31, 30, 31, 30, 31, 31, 30, 31, 30, 31};
    const bool isLeapDay = mParts.month == 2 && mParts.year % 4 == 0;
    return mParts.day <= days[mParts.month] + (isLeapDay ? 1 : 0);
}
