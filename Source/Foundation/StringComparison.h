#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string_view>

namespace Foundation {

class String;

/// What a comparison or a search overlooks. Joined by "|".
enum class CompareOptions : std::uint32_t {
    None = 0,
    CaseInsensitive = 1,
    DiacriticInsensitive = 2,
    Numeric = 4,  ///< digits count as the numbers that they form: "9" is before "10"
};
constexpr CompareOptions operator|(CompareOptions a, CompareOptions b) {
    return static_cast<CompareOptions>(static_cast<std::uint32_t>(a) |
                                       static_cast<std::uint32_t>(b));
}
constexpr bool operator&(CompareOptions a, CompareOptions b) {
    return (static_cast<std::uint32_t>(a) & static_cast<std::uint32_t>(b)) != 0;
}

/// A stretch of a text, counted in characters.
struct TextRange {
    std::size_t start;
    std::size_t length;
    bool operator==(const TextRange&) const = default;
};

/// -1, 0 or 1 as `a` is before, equal to or after `b`. Null is equal to null and before all else.
///
/// Without options, and with `CaseInsensitive` alone, the order is that of the code points, of the
/// case-folded texts in the second case. With others it is that of the Unicode Collation Algorithm
/// with its default table. None depends on the user's language.
int Compare(const String* a, const String* b, CompareOptions options = CompareOptions::None);

/// Where `word` first stands in `text`, both UTF-8: see `String::findWord`.
std::optional<TextRange> findWordInText(std::string_view text, std::string_view word,
                                        CompareOptions options, bool wholeWord);

}  // namespace Foundation
