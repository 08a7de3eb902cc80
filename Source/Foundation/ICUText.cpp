#include "Foundation/ICUText.h"

#include "Foundation/AssertionFailure.h"

#include <unicode/bytestream.h>
#include <unicode/casemap.h>
#include <unicode/stringpiece.h>

namespace Foundation {

namespace {

icu::StringPiece piece(std::string_view utf8) {
    OV_ASSERT_MESSAGE(utf8.size() <= INT32_MAX, "a text of %zu bytes is too long", utf8.size());
    return {utf8.data(), static_cast<int32_t>(utf8.size())};
}

template <class Map>
std::string mapped(std::string_view utf8, Map map) {
    std::string result;
    icu::StringByteSink<std::string> sink(&result, static_cast<int32_t>(utf8.size()));
    UErrorCode status = U_ZERO_ERROR;
    map(piece(utf8), sink, status);
    OV_ASSERT_MESSAGE(U_SUCCESS(status), "case mapping failed: %s", u_errorName(status));
    return result;
}

}  // namespace

icu::UnicodeString ICUText::wide(std::string_view utf8) {
    return icu::UnicodeString::fromUTF8(piece(utf8));
}

std::string ICUText::toUpper(std::string_view utf8) {
    return mapped(utf8, [](icu::StringPiece text, icu::ByteSink& sink, UErrorCode& status) {
        icu::CaseMap::utf8ToUpper("", 0, text, sink, nullptr, status);
    });
}

std::string ICUText::toLower(std::string_view utf8) {
    return mapped(utf8, [](icu::StringPiece text, icu::ByteSink& sink, UErrorCode& status) {
        icu::CaseMap::utf8ToLower("", 0, text, sink, nullptr, status);
    });
}

std::string ICUText::foldCase(std::string_view utf8) {
    return mapped(utf8, [](icu::StringPiece text, icu::ByteSink& sink, UErrorCode& status) {
        icu::CaseMap::utf8Fold(0, text, sink, nullptr, status);
    });
}

}  // namespace Foundation
