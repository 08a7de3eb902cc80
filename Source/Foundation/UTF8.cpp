#include "Foundation/UTF8.h"

#include <unicode/utf8.h>
#include <algorithm>
#include <cstdint>
#include <cstring>

namespace Foundation {

namespace {

/// How many bytes at the start are ASCII, or a few less: looks at eight at a time.
std::size_t skipASCII(std::string_view bytes) {
    constexpr std::uint64_t kHighBits = 0x8080808080808080U;
    std::size_t i = 0;
    for (std::uint64_t word = 0; i + sizeof word <= bytes.size(); i += sizeof word) {
        std::memcpy(&word, bytes.data() + i, sizeof word);
        if (word & kHighBits) break;
    }
    return i;
}

}  // namespace

bool UTF8::isValid(std::string_view bytes) {
    const std::size_t length = bytes.size();
    for (std::size_t i = skipASCII(bytes); i < length;) {
        UChar32 character = 0;
        U8_NEXT(bytes, i, length, character);
        if (character < 0) return false;
    }
    return true;
}

std::size_t UTF8::count(std::string_view text) {
    return static_cast<std::size_t>(std::count_if(
        text.begin(), text.end(), [](char c) { return !U8_IS_TRAIL(static_cast<uint8_t>(c)); }));
}

std::size_t UTF8::offset(std::string_view text, std::size_t index) {
    std::size_t place = 0;
    for (; place < text.size(); ++place) {
        if (U8_IS_TRAIL(static_cast<uint8_t>(text[place]))) continue;
        if (index-- == 0) break;
    }
    return place;
}

}  // namespace Foundation
