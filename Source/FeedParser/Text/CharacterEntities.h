#pragma once

#include <cstddef>
#include <span>
#include <string_view>

namespace Orvane {

/// The characters that HTML has names for: the 252 of HTML 4.01, and XML's "apos".
struct CharacterEntities {
    static constexpr std::size_t kLongestName = 8;

    struct Entity {
        const char* name;
        char16_t character;
    };

    /// All names but "tau", in the order of their characters.
    static std::span<const Entity> all();

    /// The character of a name without "&" and ";"; U+0000 if there is none.
    ///
    /// A name that HTML has in one form counts in any case. Of two that differ by case, the one in
    /// lower case stands for itself, and all other spellings for the one with capitals. The one
    /// exception is "tau", which is the capital too: feeds are stored so, and no spelling gives
    /// the small letter.
    static char16_t find(std::string_view name);
};

}  // namespace Orvane
