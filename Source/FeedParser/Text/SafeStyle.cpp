#include "FeedParser/Text/SafeStyle.h"

#include "FeedParser/Text/Blanks.h"
#include "FeedParser/Text/XMLCharacters.h"

#include <algorithm>
#include <iterator>

namespace Orvane::FeedParser {

namespace {

constexpr auto npos = std::string_view::npos;

// Sorted. Also those whose names begin with one of these and "-", as "border-left-color" does.
constexpr std::string_view kFamilies[] = {"border",  "font",    "list-style", "margin",
                                          "outline", "padding", "text"};
// Sorted.
constexpr std::string_view kProperties[] = {
    "aspect-ratio",   "background",   "background-color", "box-sizing",     "caption-side",
    "clear",          "color",        "column-count",     "column-gap",     "columns",
    "direction",      "display",      "empty-cells",      "fill",           "fill-opacity",
    "float",          "height",       "hyphens",          "letter-spacing", "line-height",
    "max-height",     "max-width",    "min-height",       "min-width",      "object-fit",
    "opacity",        "overflow",     "quotes",           "stop-color",     "stop-opacity",
    "stroke",         "stroke-width", "tab-size",         "table-layout",   "unicode-bidi",
    "vertical-align", "visibility",   "white-space",      "width",          "word-break",
    "word-spacing",   "word-wrap",    "writing-mode",
};
/// All the functions that a value may call.
constexpr std::string_view kFunctions[] = {"hsl", "hsla", "rgb", "rgba"};

bool isAllowedProperty(const std::string& name) {
    if (std::binary_search(std::begin(kProperties), std::end(kProperties), name)) return true;
    return std::any_of(
        std::begin(kFamilies), std::end(kFamilies), [&name](std::string_view family) {
            return name == family || (name.starts_with(family) && name[family.size()] == '-');
        });
}

bool isValueCharacter(char c) {
    return XMLCharacters::isLetter(c) || XMLCharacters::isDigit(c) ||
           std::string_view(" #%.,+-!()'\"/_").find(c) != npos ||
           static_cast<unsigned char>(c) >= 0x80;
}

bool callsOnlyAllowed(std::string_view value) {
    for (std::size_t i = value.find('('); i != npos; i = value.find('(', i + 1)) {
        std::size_t start = i;
        while (start > 0 && (XMLCharacters::isLetter(value[start - 1]) || value[start - 1] == '-'))
            --start;
        const std::string name = XMLCharacters::toLower(value.substr(start, i - start));
        const bool isKnown =
            std::find(std::begin(kFunctions), std::end(kFunctions), name) != std::end(kFunctions);
        if (!isKnown) return false;
    }
    return true;
}

/// Nothing that could be read as more than a list of words, numbers, colours and quoted names.
/// Backslashes and comments, which hide the rest, are out with every other odd character.
bool isAllowedValue(const std::string& property, std::string_view value) {
    if (value.empty() || !std::all_of(value.begin(), value.end(), isValueCharacter)) return false;
    if (value.find("/*") != npos || !callsOnlyAllowed(value)) return false;
    for (const char quote : {'"', '\''}) {
        if (std::count(value.begin(), value.end(), quote) % 2 != 0) return false;
    }
    const bool isMargin = property.starts_with("margin") || property == "text-indent";
    return !isMargin || value.find('-') == npos;
}

}  // namespace

std::string SafeStyle::make(std::string_view declarations) {
    std::string result;
    while (!declarations.empty()) {
        const std::size_t end = std::min(declarations.find(';'), declarations.size());
        const std::string_view declaration = declarations.substr(0, end);
        declarations.remove_prefix(std::min(end + 1, declarations.size()));
        const std::size_t colon = declaration.find(':');
        if (colon == npos) continue;
        const std::string property =
            XMLCharacters::toLower(withoutOuterBlanks(declaration.substr(0, colon)));
        const std::string_view value = withoutOuterBlanks(declaration.substr(colon + 1));
        if (!isAllowedProperty(property) || !isAllowedValue(property, value)) continue;
        if (!result.empty()) result += "; ";
        result += property;
        result += ": ";
        result += value;
    }
    return result;
}

}  // namespace Orvane::FeedParser
