#pragma once

#include <optional>
#include <string>
#include <string_view>

/// The characters of URLs by their part in RFC 3986, and percent escapes (section 2.1). Works on
/// bytes: what a byte above 127 means is for the caller to know.

namespace Foundation {

constexpr bool isURLAlpha(char c) {
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z');
}
constexpr bool isURLDigit(char c) {
    return c >= '0' && c <= '9';
}
constexpr bool isURLHexDigit(char c) {
    return isURLDigit(c) || (c >= 'a' && c <= 'f') || (c >= 'A' && c <= 'F');
}
constexpr bool isURLUnreserved(char c) {
    return isURLAlpha(c) || isURLDigit(c) || c == '-' || c == '.' || c == '_' || c == '~';
}
constexpr bool isURLSubDelimiter(char c) {
    return c != '\0' && std::string_view("!$&'()*+,;=").find(c) != std::string_view::npos;
}
/// A character of a path's segment.
constexpr bool isURLPathCharacter(char c) {
    return isURLUnreserved(c) || isURLSubDelimiter(c) || c == ':' || c == '@';
}
/// Kept for addresses in the host, but used everywhere behind it, and sent as they are by whoever
/// reads URLs as browsers do.
constexpr bool isURLBracket(char c) {
    return c == '[' || c == ']';
}

/// Whether a "%" with two hexadecimal digits stands at `index`.
constexpr bool isURLEscape(std::string_view text, std::size_t index) {
    return text.size() - index >= 3 && text[index] == '%' && isURLHexDigit(text[index + 1]) &&
           isURLHexDigit(text[index + 2]);
}

/// Appends `byte` to `text` as "%" and two upper-case hexadecimal digits.
void appendURLEscape(std::string& text, char byte);

/// Escapes every byte but those that stand for themselves anywhere behind a URL's host (letters,
/// digits, "-._~!$&'()*+,;=:@/?") less those in `also`. "%" and "#" are escaped too, so that
/// `unescapeURLText` gives back exactly `bytes`.
std::string escapeURLText(std::string_view bytes, std::string_view also = {});

/// Undoes every percent escape but those of the bytes in `leave`; nothing if a "%" stands without
/// its two digits.
std::optional<std::string> unescapeURLText(std::string_view text, std::string_view leave = {});

/// Makes what people write for a URL into one as far as escapes can: every byte that a URL cannot
/// hold where it stands is escaped. Valid escapes stay, and so do "#" before the fragment and
/// brackets around and behind the host; a further "#", other brackets, "%" without two digits and
/// an "@" in a user's name are escaped.
std::string cleanURLText(std::string_view text);

}  // namespace Foundation
