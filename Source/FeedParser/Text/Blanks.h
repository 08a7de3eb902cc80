#pragma once

#include <string_view>

namespace Orvane {

/// Whether a byte is what the text routines call a blank.
constexpr bool isBlank(char c) {
    return c == ' ' || c == '\t' || c == '\n' || c == '\r';
}

/// The text without the blanks around it.
constexpr std::string_view withoutOuterBlanks(std::string_view text) {
    while (!text.empty() && isBlank(text.front()))
        text.remove_prefix(1);
    while (!text.empty() && isBlank(text.back()))
        text.remove_suffix(1);
    return text;
}

}  // namespace Orvane
