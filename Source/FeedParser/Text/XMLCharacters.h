#pragma once

#include <string>
#include <string_view>

namespace Orvane::FeedParser {

/// What characters XML 1.0 knows ("Char", "Name"), as far as mending needs it.
struct XMLCharacters {
    static constexpr bool isLetter(char c) {
        return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z');
    }
    static constexpr bool isDigit(char c) { return c >= '0' && c <= '9'; }
    static constexpr char toLower(char c) {
        return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
    }
    static std::string toLower(std::string_view text);

    /// Takes out what no XML document may hold: control characters, and U+FFFE and U+FFFF.
    static void scrub(std::string& text);
    struct Reference {
        std::size_t length = 0;    ///< 0 for none
        bool isCharacter = false;  ///< its number, if it is one, is that of a character of XML
    };
    /// The complete reference at the start of `text`: "&lt;", "&#60;", "&#x3C;".
    static Reference readReference(std::string_view text);
};

}  // namespace Orvane::FeedParser
