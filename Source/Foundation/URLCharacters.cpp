#include "Foundation/URLCharacters.h"

#include <utility>

namespace Foundation {

namespace {

constexpr auto npos = std::string_view::npos;

constexpr int hexValue(char digit) {
    if (isURLDigit(digit)) return digit - '0';
    return (digit | 0x20) - 'a' + 10;
}

bool isIn(char c, std::string_view set) {
    return set.find(c) != npos;
}

/// Where the authority of a text stands that may not be a URL yet: behind "//", at its start or
/// behind something like a scheme. Empty if there is none.
std::string_view findAuthority(std::string_view text) {
    const std::size_t colon = text.find_first_of(":/?#");
    std::size_t start = colon != npos && text[colon] == ':' ? colon + 1 : 0;
    if (text.substr(start, 2) != "//") return {};
    start += 2;
    return text.substr(start, text.find_first_of("/?#", start) - start);
}

/// The "[...]" of a host that is an address, or nothing.
std::string_view findAddressLiteral(std::string_view authority) {
    const std::size_t at = authority.rfind('@');
    const std::string_view host = at == npos ? authority : authority.substr(at + 1);
    const std::size_t close = host.find(']');
    if (!host.starts_with('[') || close == npos) return {};
    const std::string_view rest = host.substr(close + 1);
    return rest.empty() || rest.front() == ':' ? host.substr(0, close + 1) : std::string_view();
}

}  // namespace

void appendURLEscape(std::string& text, char byte) {
    constexpr char kDigits[] = "0123456789ABCDEF";
    const auto value = static_cast<unsigned char>(byte);
    text += '%';
    text += kDigits[value >> 4];
    text += kDigits[value & 15];
}

std::string escapeURLText(std::string_view bytes, std::string_view also) {
    std::string result;
    result.reserve(bytes.size());
    for (const char c : bytes) {
        if ((isURLPathCharacter(c) || c == '/' || c == '?') && !isIn(c, also)) {
            result += c;
        } else {
            appendURLEscape(result, c);
        }
    }
    return result;
}

std::optional<std::string> unescapeURLText(std::string_view text, std::string_view leave) {
    std::string result;
    result.reserve(text.size());
    for (std::size_t i = 0; i < text.size(); ++i) {
        if (text[i] != '%') {
            result += text[i];
            continue;
        }
        if (!isURLEscape(text, i)) return std::nullopt;
        const char byte = static_cast<char>(hexValue(text[i + 1]) * 16 + hexValue(text[i + 2]));
        if (isIn(byte, leave)) {
            result += text.substr(i, 3);
        } else {
            result += byte;
        }
        i += 2;
    }
    return result;
}

std::string cleanURLText(std::string_view text) {
    const std::string_view authority = findAuthority(text);
    const std::string_view literal = findAddressLiteral(authority);
    const std::size_t userEnd = authority.rfind('@');
    const char* const lastAt = userEnd == npos ? nullptr : authority.data() + userEnd;
    bool seenFragment = false;

    const auto isHeld = [&](std::size_t i) {
        const char c = text[i];
        const char* const at = &text[i];
        if (c == '%') return isURLEscape(text, i);
        if (c == '#') return !std::exchange(seenFragment, true);
        if (isURLBracket(c)) {
            const bool isInHost =
                at >= authority.data() && at < authority.data() + authority.size();
            return !isInHost ||
                   (!literal.empty() && (at == &literal.front() || at == &literal.back()));
        }
        if (c == '@' && lastAt && at >= authority.data() && at <= lastAt) return at == lastAt;
        return isURLPathCharacter(c) || c == '/' || c == '?';
    };
    std::string result;
    result.reserve(text.size() + 16);
    for (std::size_t i = 0; i < text.size(); ++i) {
        if (isHeld(i)) {
            result += text[i];
        } else {
            appendURLEscape(result, text[i]);
        }
    }
    return result;
}

}  // namespace Foundation
