#include "TextLayout.h"

#include <glib.h>

#include <memory>
#include <sstream>

namespace Commands {

namespace {

constexpr const char* kEllipsis = "\u2026";

bool isDropped(gunichar c) {
    // Other characters that a terminal obeys, and those that turn the direction of what follows.
    return c < 0x20 || (c >= 0x7F && c < 0xA0) || (c >= 0x202A && c <= 0x202E) ||
           (c >= 0x2066 && c <= 0x2069);
}

std::size_t widthOf(gunichar c) {
    if (g_unichar_iszerowidth(c)) return 0;
    return g_unichar_iswide(c) ? 2 : 1;
}

}  // namespace

std::string TextLayout::clean(std::string_view text) {
    const std::unique_ptr<char, decltype(&g_free)> valid(
        g_utf8_make_valid(text.data(), static_cast<gssize>(text.size())), g_free);
    std::string result;
    for (const char* at = valid.get(); *at; at = g_utf8_next_char(at)) {
        const gunichar c = g_utf8_get_char(at);
        if (c == '\n' || c == '\r' || c == '\t' || c == 0x2028 || c == 0x2029 || c == 0x85) {
            result += ' ';
        } else if (!isDropped(c)) {
            result.append(at, static_cast<const char*>(g_utf8_next_char(at)));
        }
    }
    return result;
}

std::size_t TextLayout::width(std::string_view text) {
    std::size_t columns = 0;
    for (const char *at = text.data(), *end = at + text.size(); at < end;
         at = g_utf8_next_char(at)) {
        columns += widthOf(g_utf8_get_char(at));
    }
    return columns;
}

std::string TextLayout::fit(std::string_view text, std::size_t columns) {
    if (width(text) <= columns) return std::string(text);
    if (columns == 0) return {};
    std::size_t used = 1;
    const char* at = text.data();
    for (; used + widthOf(g_utf8_get_char(at)) <= columns; at = g_utf8_next_char(at)) {
        used += widthOf(g_utf8_get_char(at));
    }
    return std::string(text.data(), at) + kEllipsis;
}

std::string TextLayout::pad(std::string_view text, std::size_t columns, bool toTheRight) {
    const std::size_t taken = width(text);
    const std::string blanks(taken < columns ? columns - taken : 0, ' ');
    return toTheRight ? blanks + std::string(text) : std::string(text) + blanks;
}

std::string TextLayout::wrap(std::string_view text, std::size_t columns, std::size_t indent) {
    std::istringstream words{std::string(text)};
    std::string all;
    std::size_t used = 0;
    for (std::string word; words >> word;) {
        const std::size_t taken = width(word);
        if (used == 0) {
            all += std::string(indent, ' ');
        } else if (used + 1 + taken > columns) {
            all += '\n' + std::string(indent, ' ');
            used = 0;
        } else {
            all += ' ';
            ++used;
        }
        all += word;
        used += taken;
    }
    return all;
}

std::string TextLayout::folded(std::string_view text) {
    const std::string cleaned = clean(text);
    const std::unique_ptr<char, decltype(&g_free)> result(
        g_utf8_casefold(cleaned.data(), static_cast<gssize>(cleaned.size())), g_free);
    return result.get();
}

std::string TextLayout::capitalised(std::string_view text) {
    std::string result(text);
    if (!result.empty()) result[0] = g_ascii_toupper(result[0]);
    return result;
}

}  // namespace Commands
