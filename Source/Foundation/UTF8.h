#pragma once

#include <cstddef>
#include <string_view>

namespace Foundation {

/// UTF-8 (RFC 3629) and the characters, that is the code points, in it.
struct UTF8 {
    /// Whether all of the bytes are UTF-8. Zeros and noncharacters are.
    static bool isValid(std::string_view bytes);

    // REQUIRES for the rest: the text is valid.

    /// How many characters the text has.
    static std::size_t count(std::string_view text);
    /// Where the character of an index begins; the end of the text if there are not so many.
    static std::size_t offset(std::string_view text, std::size_t index);
};

}  // namespace Foundation
