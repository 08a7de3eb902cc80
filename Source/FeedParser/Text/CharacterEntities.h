#pragma once

#include <cstddef>
#include <string_view>

namespace Orvane {

/// The characters that HTML has names for: the 252 of HTML 4.01, and XML's "apos".
struct CharacterEntities {
    static constexpr std::size_t kLongestName = 8;

    /// The character of a name without "&" and ";"; U+0000 if there is none.
    ///
    /// A name that HTML has in one form counts in any case. Of two that differ by case, the one in
    /// lower case stands for itself, and all other spellings for the one with capitals. The one
    /// exception is "tau", which is the capital too: feeds are stored so, and no spelling gives
    /// the small letter.
    static char16_t find(std::string_view name);
};

}  // namespace Orvane
