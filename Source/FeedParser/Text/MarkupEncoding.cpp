#include "FeedParser/Text/MarkupEncoding.h"

#include "FeedParser/Text/Blanks.h"
#include "FeedParser/Text/XMLCharacters.h"
#include "Foundation/StringEncoding.h"
#include "Foundation/UTF8.h"

#include <cstddef>
#include <iterator>
#include <optional>

namespace Orvane::FeedParser {

using Foundation::StringEncoding;

namespace {

/// Where declarations are looked for (HTML, "prescan a byte stream": the first 1024 bytes).
constexpr std::size_t kPrescan = 1024;

struct Mark {
    std::string_view bytes;
    const char* encoding;
};

// The longer ones first: the mark of UTF-32LE begins with that of UTF-16LE.
constexpr Mark kMarks[] = {
    {std::string_view("\xFF\xFE\0\0", 4), "UTF-32LE"},
    {std::string_view("\0\0\xFE\xFF", 4), "UTF-32BE"},
    {"\xEF\xBB\xBF", "UTF-8"},
    {"\xFF\xFE", "UTF-16LE"},
    {"\xFE\xFF", "UTF-16BE"},
};

/// The names of libxml2's numbers; null where the number alone does not tell.
constexpr const char* kNames[] = {
    nullptr,      "UTF-8",       "UTF-16LE",   "UTF-16BE",   "UTF-32LE",     "UTF-32BE",
    nullptr,      nullptr,       nullptr,      nullptr,      "windows-1252", "ISO-8859-2",
    "ISO-8859-3", "ISO-8859-4",  "ISO-8859-5", "ISO-8859-6", "ISO-8859-7",   "ISO-8859-8",
    "ISO-8859-9", "ISO-2022-JP", "Shift_JIS",  "EUC-JP",     "windows-1252",
};

/// What follows "=" in `text`, in quotes or not.
std::string valueIn(std::string_view text) {
    std::size_t start = 0;
    while (start < text.size() && isBlank(text[start]))
        ++start;
    if (start == text.size() || text[start] != '=') return {};
    ++start;
    while (start < text.size() &&
           (isBlank(text[start]) || text[start] == '"' || text[start] == '\''))
        ++start;
    const std::size_t end = text.find_first_of("\"' \t\r\n;/>?", start);
    return std::string(text.substr(start, end == std::string_view::npos ? end : end - start));
}

std::optional<StringEncoding> encodingOf(std::string_view bytes, int encoding) {
    for (const Mark& mark : kMarks) {
        if (bytes.starts_with(mark.bytes)) return StringEncoding::named(mark.encoding);
    }
    const bool isListed = encoding > 0 && encoding < static_cast<int>(std::size(kNames));
    if (isListed && kNames[encoding]) return StringEncoding::named(kNames[encoding]);
    const std::string declared = MarkupEncoding::getDeclared(bytes);
    if (!declared.empty()) {
        const std::optional<StringEncoding> named = StringEncoding::named(declared.c_str());
        // Markup whose declaration could be read is not in an encoding of two bytes.
        const bool isWide = named && std::string_view(named->getName()).starts_with("UTF-16");
        if (named == StringEncoding::kLatin1 || named == StringEncoding::kASCII)
            return StringEncoding::kWindows1252;
        if (named && !isWide) return named;
    }
    if (Foundation::UTF8::isValid(bytes)) return StringEncoding::kUTF8;
    return std::nullopt;
}

}  // namespace

std::string MarkupEncoding::getDeclared(std::string_view markup) {
    const std::string start = XMLCharacters::toLower(markup.substr(0, kPrescan));
    const bool isXML = start.find("<?xml") != std::string::npos;
    const std::size_t word = start.find(isXML ? "encoding" : "charset");
    if (word == std::string::npos) return {};
    return valueIn(std::string_view(start).substr(word + (isXML ? 8 : 7)));
}

MarkupEncoding::Text MarkupEncoding::toUTF8(std::string_view bytes, int encoding) {
    const std::optional<StringEncoding> known = encodingOf(bytes, encoding);
    if (!known) return {std::string(bytes), false};
    return {known->decodeLeniently(bytes), true};
}

}  // namespace Orvane::FeedParser
