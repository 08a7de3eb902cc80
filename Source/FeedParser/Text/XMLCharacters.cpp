#include "FeedParser/Text/XMLCharacters.h"

#include <algorithm>
#include <cstdint>
#include <optional>

namespace Orvane::FeedParser {

namespace {

constexpr std::size_t kLongestReference = 40;

bool isControl(char c) {
    return static_cast<unsigned char>(c) < 0x20 && c != '\t' && c != '\n' && c != '\r';
}

/// Whether U+FFFE or U+FFFF, which are no characters, begins at `i`.
bool isNoncharacter(std::string_view text, std::size_t i) {
    const std::string_view three = text.substr(i, 3);
    return three == "\xEF\xBF\xBE" || three == "\xEF\xBF\xBF";
}

int digitValue(char c) {
    if (XMLCharacters::isDigit(c)) return c - '0';
    const char lower = XMLCharacters::toLower(c);
    return lower >= 'a' && lower <= 'f' ? lower - 'a' + 10 : 99;
}

bool isCharacter(std::uint32_t c) {
    if (c < 0x20) return c == 9 || c == 10 || c == 13;
    return c < 0xD800 || (c > 0xDFFF && c < 0xFFFE) || (c > 0xFFFF && c < 0x110000);
}

/// The number that `text` is, decimal or, behind an "x", hexadecimal.
std::optional<std::uint32_t> readNumber(std::string_view text) {
    const bool isHex = text.starts_with('x') || text.starts_with('X');
    if (isHex) text.remove_prefix(1);
    if (text.empty()) return std::nullopt;
    std::uint32_t number = 0;
    for (const char c : text) {
        const int value = digitValue(c);
        if (value >= (isHex ? 16 : 10)) return std::nullopt;
        constexpr std::uint32_t kLargest = 0x110000;
        number = std::min(number * (isHex ? 16 : 10) + static_cast<std::uint32_t>(value), kLargest);
    }
    return number;
}

bool isName(std::string_view text) {
    return !text.empty() && XMLCharacters::isLetter(text[0]) &&
           std::all_of(text.begin(), text.end(), [](char c) {
               return XMLCharacters::isLetter(c) || XMLCharacters::isDigit(c);
           });
}

}  // namespace

std::string XMLCharacters::toLower(std::string_view text) {
    std::string lower(text);
    for (char& c : lower)
        c = toLower(c);
    return lower;
}

void XMLCharacters::scrub(std::string& text) {
    std::size_t end = 0;
    for (std::size_t i = 0; i < text.size(); ++i) {
        if (isControl(text[i])) continue;
        if (text[i] == '\xEF' && isNoncharacter(text, i)) {
            i += 2;
            continue;
        }
        text[end++] = text[i];
    }
    text.resize(end);
}

XMLCharacters::Reference XMLCharacters::readReference(std::string_view text) {
    const std::size_t end = text.substr(0, kLongestReference).find(';');
    if (end == std::string_view::npos || end < 2 || text[0] != '&') return {};
    const std::string_view inside = text.substr(1, end - 1);
    if (inside[0] != '#') return isName(inside) ? Reference{end + 1, true} : Reference();
    const std::optional<std::uint32_t> number = readNumber(inside.substr(1));
    return number ? Reference{end + 1, ::Orvane::FeedParser::isCharacter(*number)} : Reference();
}

}  // namespace Orvane::FeedParser
