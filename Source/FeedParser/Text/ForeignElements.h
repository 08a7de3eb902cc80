#pragma once

#include <string_view>

namespace Orvane::FeedParser {

/// The elements of SVG and MathML that may be shown within HTML: those that draw, and lay out. None
/// that runs, moves, fetches, repeats others, or holds HTML.
struct ForeignElements {
    /// The spelling of a shown element of SVG whose name in lower case is `name`; empty if it is
    /// none.
    static std::string_view findSVG(std::string_view name);
    /// Whether MathML has such an element that may be shown.
    static bool isMathML(std::string_view name);
    /// Whether it is one of MathML's that nobody sees.
    static bool isLeftMathML(std::string_view name);
};

}  // namespace Orvane::FeedParser
