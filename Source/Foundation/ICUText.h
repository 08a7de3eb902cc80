#pragma once

#include <unicode/unistr.h>
#include <string>
#include <string_view>

namespace Foundation {

/// Texts for ICU, and what it makes of them. For sources only: it brings ICU's headers. All throw
/// `AssertionFailure` for a text of 2 GB or more, which ICU cannot count.
struct ICUText {
    static icu::UnicodeString wide(std::string_view utf8);

    /// Unicode's case mappings, those that hold for no language in particular.
    static std::string toUpper(std::string_view utf8);
    static std::string toLower(std::string_view utf8);
    /// The form in which texts that differ by case alone are the same.
    static std::string foldCase(std::string_view utf8);
};

}  // namespace Foundation
