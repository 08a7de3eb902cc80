#include "Foundation/UTF8.h"

#include <unicode/utf8.h>
#include <algorithm>
#include <cstdint>

namespace Foundation {

bool UTF8::isValid(std::string_view bytes) {
    const std::size_t length = bytes.size();
    for (std::size_t i = 0; i < length;) {
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
