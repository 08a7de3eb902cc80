// ParserUtils::decodeEntities.

#include "FeedParser/Text/Blanks.h"
#include "FeedParser/Text/CharacterEntities.h"
#include "FeedParser/Text/ParserUtils.h"
#include "Foundation/Utils.h"

#include <algorithm>
#include <array>
#include <cstring>

namespace Orvane {

namespace {

constexpr bool isDigit(char c) {
    return c >= '0' && c <= '9';
}
constexpr bool isLetter(char c) {
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z');
}
constexpr bool isHexDigit(char c) {
    return isDigit(c) || (c >= 'a' && c <= 'f') || (c >= 'A' && c <= 'F');
}

constexpr unsigned kFirstExtra = 130;
/// What Windows-1252 has from 130 on, where Unicode has control characters. 142 and 158 are rare
/// enough in feeds to be left to Unicode, as 128 in front of them is.
constexpr std::array<char16_t, 30> kWindowsExtras = {
    0x201A, 0x0192, 0x201E, 0x2026, 0x2020, 0x2021, 0x02C6, 0x2030, 0x0160, 0x2039,
    0x0152, 0,      0,      0,      0,      0x2018, 0x2019, 0x201C, 0x201D, 0x2022,
    0x2013, 0x2014, 0x02DC, 0x2122, 0x0161, 0x203A, 0x0153, 0,      0,      0x0178,
};

/// A reference: the character, and where the text goes on. No place if it is none.
struct Reference {
    const char* end = nullptr;
    char16_t character = 0;
};

/// A reference by number, at what follows "&#".
Reference readNumber(const char* text) {
    const bool isHex = *text == 'x' || *text == 'X';
    if (isHex) ++text;
    const std::ptrdiff_t most = isHex ? 4 : 5;
    const char* end = text;
    while (end - text <= most && (isHex ? isHexDigit(*end) : isDigit(*end))) {
        ++end;
    }
    if (end == text || end - text > most || *end != ';') return {};
    const auto number = static_cast<unsigned>(Compatibility::Utils::str2int(text, isHex));
    const bool isShort = end - text == (isHex ? 2 : 3);
    if (isShort && number >= kFirstExtra && number - kFirstExtra < kWindowsExtras.size()) {
        const char16_t extra = kWindowsExtras[number - kFirstExtra];
        if (extra) return {end + 1, extra};
    }
    return {end + 1, static_cast<char16_t>(number)};
}

/// A reference by name, at what follows "&".
Reference readName(const char* text) {
    const char* end = text;
    const char* limit = text + CharacterEntities::kLongestName;
    while (end < limit && (isLetter(*end) || isDigit(*end))) {
        ++end;
    }
    if (*end != ';') return {};
    const char16_t character =
        CharacterEntities::find({text, static_cast<std::size_t>(end - text)});
    return character ? Reference{end + 1, character} : Reference{};
}

/// Writes a character in UTF-8, unless it is a surrogate or the terminator, and gives the place
/// behind it. A reference is never shorter than that: "&ne;" has four bytes for three.
char* writeCharacter(char16_t character, char* dst) {
    const unsigned c = character;
    if (c == 0 || (c >= 0xD800 && c <= 0xDFFF)) return dst;
    if (c < 0x80) {
        *dst++ = static_cast<char>(c);
        return dst;
    }
    if (c < 0x800) {
        *dst++ = static_cast<char>(0xC0 | c >> 6);
    } else {
        *dst++ = static_cast<char>(0xE0 | c >> 12);
        *dst++ = static_cast<char>(0x80 | (c >> 6 & 0x3F));
    }
    *dst++ = static_cast<char>(0x80 | (c & 0x3F));
    return dst;
}

/// Copies up to `end`, which may overlap, and gives the place behind the copy.
char* copyText(const char* src, const char* end, char* dst) {
    const auto length = static_cast<std::size_t>(end - src);
    if (dst != src) std::memmove(dst, src, length);
    return dst + length;
}

}  // namespace

std::size_t ParserUtils::decodeEntities(const char* src, char* dst, bool trim) {
    if (!src || !dst) return 0;
    char* out = dst;
    for (;;) {
        while (trim && out == dst && isBlank(*src)) {
            ++src;
        }
        const char* ampersand = strchrnul(src, '&');
        out = copyText(src, ampersand, out);
        if (*ampersand == '\0') break;
        const char* name = ampersand + 1;
        const Reference found = *name == '#' ? readNumber(name + 1) : readName(name);
        if (found.end) {
            out = writeCharacter(found.character, out);
        } else {
            *out++ = '&';
        }
        src = found.end ? found.end : name;
    }
    while (trim && out > dst && isBlank(out[-1])) {
        --out;
    }
    *out = '\0';
    return static_cast<std::size_t>(out - dst);
}

}  // namespace Orvane
