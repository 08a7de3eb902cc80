#pragma once

#include <string>
#include <string_view>

namespace Foundation {

/// Base64 (RFC 4648, section 4), with "=" for padding and without line breaks.
struct Base64 {
    static std::string encode(std::string_view bytes);
    /// Ignores what is outside the alphabet and ends at the first "=". The last group may be
    /// short, with or without its padding: a lone character of it stands for no byte.
    static std::string decode(std::string_view text);
};

}  // namespace Foundation
