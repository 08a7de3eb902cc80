#pragma once

#include <string>
#include <string_view>

namespace Orvane::FeedParser {

/// Makes the declarations of a "style" attribute such as may be shown: colours, type, and boxes
/// within the text. Nothing that loads, runs, or moves out of its place.
struct SafeStyle {
    /// The declarations that are safe, in their order; empty if none is. Twice gives the same as
    /// once.
    static std::string make(std::string_view declarations);
};

}  // namespace Orvane::FeedParser
