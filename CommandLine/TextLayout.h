#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace Commands::TextLayout {

/// The text on one line, harmless to a terminal: line ends and tabs become blanks, other control
/// characters go, and what is no UTF-8 becomes U+FFFD.
std::string clean(std::string_view text);

/// How many columns of a terminal a text takes. `text` is clean.
std::size_t width(std::string_view text);

/// The text in at most so many columns, with "…" where the rest was.
std::string fit(std::string_view text, std::size_t columns);

/// The text in exactly so many columns, with blanks behind it, or in front of it.
std::string pad(std::string_view text, std::size_t columns, bool toTheRight = false);

/// The words of a text in lines of at most `columns`, each behind `indent` blanks. Words that are
/// longer have a line for themselves.
std::string wrap(std::string_view text, std::size_t columns, std::size_t indent);

/// The text without regard to case, to compare.
std::string folded(std::string_view text);

/// The text with a capital letter in front. Its first letter is of ASCII.
std::string capitalised(std::string_view text);

}  // namespace Commands::TextLayout
