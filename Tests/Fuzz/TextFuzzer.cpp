#include "FeedParser/Text/ParserUtils.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/UTF8.h"
#include "Fuzz/FuzzTarget.h"

#include <cstring>
#include <string>

using namespace Foundation;
using Orvane::ParserUtils;

namespace {

/// What a routine makes of a text, which must be the same elsewhere and in place, and no longer.
template <class Routine>
std::string resultOf(const std::string& text, Routine routine) {
    std::string elsewhere(text.size() + 1, 'x');
    elsewhere.resize(routine(text.c_str(), elsewhere.data()));
    require(elsewhere.size() <= text.size());
    require(std::strlen(elsewhere.c_str()) == elsewhere.size());
    require(!UTF8::isValid(text) || UTF8::isValid(elsewhere));
    std::string inPlace = text;
    inPlace.resize(routine(inPlace.c_str(), inPlace.data()));
    require(inPlace == elsewhere);
    return elsewhere;
}

std::string decode(const std::string& text, bool trim) {
    return resultOf(text, [trim](const char* src, char* dst) {
        return ParserUtils::decodeEntities(src, dst, trim);
    });
}

std::string plain(const std::string& text) {
    return resultOf(text, &ParserUtils::convertToPlainText);
}

/// With one space for each run of blanks.
std::string collapsed(const std::string& text) {
    std::string result;
    for (const char c : text) {
        const bool isBlank = std::strchr(" \t\r\n", c) != nullptr;
        if (!isBlank) result += c;
        if (isBlank && !result.ends_with(' ')) result += ' ';
    }
    return result;
}

void checkReferences(const std::string& text) {
    const std::string decoded = decode(text, false);
    require(text.find('&') != std::string::npos || decoded == text);
    const std::string trimmed = decode(text, true);
    require(trimmed.empty() || std::strchr(" \t\r\n", trimmed.back()) == nullptr);
    std::string copy = text;
    char* start = copy.data();
    ParserUtils::trim(&start);
    require(text.find('&') != std::string::npos || trimmed == start);
}

void checkPlainText(const std::string& text) {
    const std::string once = plain(plain(text));
    require(plain(once) == once);
}

/// A reader of HTML sees the text that it was made from.
void checkHTML(const std::string& text) {
    if (!UTF8::isValid(text)) return;
    const AutoreleasePool pool;
    const Ref<String> html = ParserUtils::convertToHTML(text.c_str());
    require(collapsed(decode(plain(html->utf8()), false)) == collapsed(text));
}

void checkBase64(const std::string& text) {
    char* bytes = nullptr;
    std::size_t length = 0;
    ParserUtils::decodeBase64(text.c_str(), &bytes, &length);
    require(bytes ? length > 0 && bytes[length] == '\0' : length == 0);
    std::free(bytes);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const unsigned char* bytes, std::size_t size) {
    // Up to the first zero, as these routines read it.
    const std::string text = std::string(reinterpret_cast<const char*>(bytes), size).c_str();
    checkReferences(text);
    checkPlainText(text);
    checkHTML(text);
    checkBase64(text);
    return 0;
}
