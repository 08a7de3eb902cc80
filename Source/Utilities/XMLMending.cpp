#include "Utilities/XMLMending.h"

#include "Utilities/XMLNode.h"

#include <glib.h>
#include <libxml/HTMLparser.h>

#include <algorithm>
#include <utility>

namespace Orvane {

namespace {

constexpr bool isNameCharacter(char c) {
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || (c >= '0' && c <= '9') || c == '_' ||
           c == '-' || c == '.' || c == ':' || (c & 0x80) != 0;
}

/// What a reference, without "&" and ";", is to be in XML; "&amp;" with the rest for what is none.
std::string mendReference(std::string_view name, bool hasOwnEntities) {
    constexpr std::string_view kKnown[] = {"amp", "lt", "gt", "quot", "apos"};
    const std::string whole = "&" + std::string(name) + ";";
    const bool isKnown = std::find(std::begin(kKnown), std::end(kKnown), name) != std::end(kKnown);
    if (isKnown || hasOwnEntities) return whole;
    const htmlEntityDesc* entity = htmlEntityLookup(xmlChars(std::string(name)));
    return entity ? "&#" + std::to_string(entity->value) + ";" : "&amp;" + whole.substr(1);
}

/// Whether the text behind "&#" is a number and its ";".
bool isNumber(std::string_view text) {
    const bool isHex = text.starts_with('x');
    const std::string_view digits = isHex ? "0123456789abcdefABCDEF" : "0123456789";
    if (isHex) text.remove_prefix(1);
    const std::size_t end = text.find_first_not_of(digits);
    return end != 0 && end != std::string_view::npos && text[end] == ';';
}

/// Whether a document names an encoding that is not UTF-8.
bool hasOtherEncoding(std::string_view bytes) {
    if (!bytes.starts_with("<?xml")) return false;
    const std::string_view declaration = bytes.substr(0, bytes.find("?>"));
    const std::size_t name = declaration.find("encoding");
    if (name == std::string_view::npos) return false;
    const std::size_t start = declaration.find_first_of("'\"", name);
    if (start == std::string_view::npos) return false;
    const std::string encoding(declaration.substr(start + 1, 5));
    return xmlStrcasecmp(xmlChars(encoding), reinterpret_cast<const xmlChar*>("utf-8")) != 0;
}

/// How long the CDATA section or comment at the start of a text is; 0 if there is none.
std::size_t opaqueLength(std::string_view text) {
    const std::pair<std::string_view, std::string_view> kinds[] = {{"<![CDATA[", "]]>"},
                                                                   {"<!--", "-->"}};
    for (const auto& [start, end] : kinds) {
        if (!text.starts_with(start)) continue;
        const std::size_t found = text.find(end, start.size());
        return found == std::string_view::npos ? text.size() : found + end.size();
    }
    return 0;
}

}  // namespace

std::string mendUTF8(std::string_view bytes) {
    std::string mended;
    while (!bytes.empty()) {
        const char* validEnd = nullptr;
        g_utf8_validate_len(bytes.data(), bytes.size(), &validEnd);
        mended.append(bytes.data(), validEnd);
        bytes.remove_prefix(static_cast<std::size_t>(validEnd - bytes.data()));
        if (bytes.empty()) break;
        const auto byte = static_cast<unsigned char>(bytes.front());
        mended += static_cast<char>(0xC0 | byte >> 6);
        mended += static_cast<char>(0x80 | (byte & 0x3F));
        bytes.remove_prefix(1);
    }
    return mended;
}

bool isWideXML(std::string_view bytes) {
    using namespace std::string_view_literals;
    const std::string_view start = bytes.substr(0, 2);
    return start == "\xFE\xFF"sv || start == "\xFF\xFE"sv || start.find('\0') != start.npos;
}

std::string mendXML(std::string_view bytes) {
    if (isWideXML(bytes)) return std::string(bytes);
    const std::string allowed = allowedInXML(bytes);
    if (!hasOtherEncoding(bytes)) return mendReferences(mendUTF8(allowed));
    // Among escapes, "&" may be half of a character.
    const bool hasEscapes = bytes.find('\x1B') != bytes.npos;
    return hasEscapes ? std::string(bytes) : mendReferences(allowed);
}

std::string mendReferences(std::string_view bytes) {
    const bool hasOwnEntities = bytes.find("<!ENTITY") != std::string_view::npos;
    std::string mended;
    while (!bytes.empty()) {
        const std::size_t stop = std::min(bytes.find_first_of("&<"), bytes.size());
        mended += bytes.substr(0, stop);
        bytes.remove_prefix(stop);
        if (bytes.empty()) break;
        std::size_t taken = 1;
        if (bytes.front() == '<') {
            taken = std::max<std::size_t>(opaqueLength(bytes), 1);
            mended += bytes.substr(0, taken);
        } else {
            const auto* end = std::find_if_not(bytes.begin() + 1, bytes.end(), isNameCharacter);
            const std::string_view name(bytes.begin() + 1, end);
            const bool isNamed = !name.empty() && end != bytes.end() && *end == ';';
            const bool isNumbered = bytes.starts_with("&#") && isNumber(bytes.substr(2));
            if (isNamed) taken = name.size() + 2;
            if (isNamed) mended += mendReference(name, hasOwnEntities);
            if (!isNamed) mended += isNumbered ? "&" : "&amp;";
        }
        bytes.remove_prefix(taken);
    }
    return mended;
}

}  // namespace Orvane
