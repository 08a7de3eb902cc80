#include "Utilities/SafeFileName.h"

#include <algorithm>

namespace Orvane {

namespace {

constexpr std::size_t npos = std::string_view::npos;
constexpr std::size_t kMaxExtension = 32;  ///< bytes; what is longer is no extension

std::string_view lastComponent(std::string_view name) {
    const std::size_t end = name.find_last_not_of("/\\");
    name = name.substr(0, end == npos ? 0 : end + 1);
    return name.substr(name.find_last_of("/\\") + 1);
}

bool isContinuation(char byte) {
    return (static_cast<unsigned char>(byte) & 0xC0) == 0x80;
}

/// Whether a character, in UTF-8, is a control or makes a name look like another one.
bool isUnsafe(std::string_view character) {
    const auto first = static_cast<unsigned char>(character[0]);
    if (character.size() == 1) return first < 0x20 || first == 0x7F;
    if (first == 0xC2) return character < "\xC2\xA0";
    if (first != 0xE2) return false;
    const auto isIn = [&](std::string_view low, std::string_view high) {
        return character >= low && character <= high;
    };
    // Marks, separators of lines, embeddings and overrides; isolates.
    return isIn("\xE2\x80\x8E", "\xE2\x80\x8F") || isIn("\xE2\x80\xA8", "\xE2\x80\xAE") ||
           isIn("\xE2\x81\xA6", "\xE2\x81\xA9");
}

std::string withoutUnsafe(std::string_view name) {
    std::string result;
    for (std::size_t start = 0; start < name.size();) {
        std::size_t end = start + 1;
        while (end < name.size() && isContinuation(name[end]))
            ++end;
        const std::string_view character = name.substr(start, end - start);
        if (!isUnsafe(character)) result += character;
        start = end;
    }
    return result;
}

/// The longest start of a text of at most that many bytes that cuts no character.
std::string_view cut(std::string_view text, std::size_t maxBytes) {
    if (text.size() <= maxBytes) return text;
    while (maxBytes > 0 && isContinuation(text[maxBytes]))
        --maxBytes;
    return text.substr(0, maxBytes);
}

std::string shortened(std::string_view name, std::size_t maxBytes) {
    if (name.size() <= maxBytes) return std::string(name);
    const std::size_t dot = std::min(name.rfind('.'), name.size());
    const std::string_view extension = name.substr(dot);
    const bool keepsExtension = extension.size() <= kMaxExtension && extension.size() < maxBytes;
    if (!keepsExtension) return std::string(cut(name, maxBytes));
    return std::string(cut(name.substr(0, dot), maxBytes - extension.size())).append(extension);
}

}  // namespace

std::string SafeFileName::make(std::string_view name, std::size_t maxBytes) {
    const std::string safe = withoutUnsafe(lastComponent(name));
    const std::size_t start = safe.find_first_not_of(". ");
    if (start == npos) return {};
    return shortened(std::string_view(safe).substr(start), maxBytes);
}

}  // namespace Orvane
