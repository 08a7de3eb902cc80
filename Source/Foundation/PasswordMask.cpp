#include "Foundation/PasswordMask.h"

#include <algorithm>
#include <string_view>

namespace Foundation {

namespace {

constexpr std::string_view kMark = "://";
constexpr std::string_view kMask = "***";
/// What ends the part of a URL that names user and host, or the URL.
constexpr std::string_view kEnds = "/?#<>\" \t\r\n";

}  // namespace

void maskPasswords(std::string& text) {
    std::size_t place = text.find(kMark);
    while (place != std::string::npos) {
        const std::size_t begin = place + kMark.size();
        const std::size_t end = std::min(text.find_first_of(kEnds, begin), text.size());
        const std::size_t at = std::string_view(text).substr(0, end).rfind('@');
        const std::size_t colon = text.find(':', begin);
        if (at != std::string::npos && colon < at) {
            text.replace(colon + 1, at - colon - 1, kMask);
        }
        place = text.find(kMark, begin);
    }
}

}  // namespace Foundation
