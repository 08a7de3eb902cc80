// The operations of String that look at its characters.

#include "Foundation/ICUText.h"
#include "Foundation/String.h"
#include "Foundation/UTF8.h"

#include <unicode/uchar.h>
#include <unicode/utf8.h>
#include <cstdlib>

namespace Foundation {

namespace {

constexpr std::size_t kLongestNumber = 31;

/// The character at `place`, which moves behind it.
UChar32 nextCharacter(std::string_view text, std::size_t& place) {
    UChar32 c = 0;
    U8_NEXT(text, place, text.size(), c);
    return c;
}

/// `text` without white space at both ends.
std::string_view trimmed(std::string_view text) {
    std::size_t start = text.size();
    std::size_t end = text.size();
    for (std::size_t place = 0; place < text.size();) {
        const std::size_t character = place;
        if (u_isUWhiteSpace(nextCharacter(text, place))) continue;
        if (start == text.size()) start = character;
        end = place;
    }
    return text.substr(start, end - start);
}

}  // namespace

std::size_t String::getLength() const {
    return UTF8::count(mText);
}

StringReturner String::getSubstring(std::size_t start) const {
    return string(mText.substr(UTF8::offset(mText, start)));
}

StringReturner String::getSubstring(std::size_t start, std::size_t length) const {
    const std::string_view rest = view().substr(UTF8::offset(mText, start));
    return string(std::string(rest.substr(0, UTF8::offset(rest, length))));
}

StringReturner String::getStringByAppendingString(const String* other) const {
    return string(mText + std::string(view(other)));
}

StringReturner String::getUpperCaseString() const {
    return string(ICUText::toUpper(mText));
}

StringReturner String::getLowerCaseString() const {
    return string(ICUText::toLower(mText));
}

StringReturner String::getTrimmedString() const {
    return string(std::string(trimmed(mText)));
}

std::optional<TextRange> String::findWord(const String* word, CompareOptions options,
                                          bool wholeWord) const {
    return findWordInText(mText, view(word), options, wholeWord);
}

long long String::toLongLong() const {
    if (mText.size() > kLongestNumber) return 0;
    return std::strtoll(mText.c_str(), nullptr, 10);
}

}  // namespace Foundation
