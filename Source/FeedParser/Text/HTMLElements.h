#pragma once

#include <string_view>

namespace Orvane::FeedParser {

/// The elements of HTML, and what mending and showing them has to know.
struct HTMLElement {
    enum Trait : unsigned {
        None = 0,
        Known = 1,       ///< Tidy knows it
        Empty = 2,       ///< has no content and no end tag
        ImpliedEnd = 4,  ///< ends by itself where the next of its kind begins
        Inline = 8,      ///< Tidy repeats it in each block that begins inside of it
        RawText = 16,    ///< its content is no markup
        Shown = 32,      ///< may be shown as it is
        Left = 64,       ///< left out with all its content, of which a reader sees nothing
    };

    std::string_view name;
    unsigned traits;

    bool is(Trait trait) const { return (traits & trait) != 0; }

    /// The element of a name in lower case; null if HTML has none.
    static const HTMLElement* find(std::string_view name);
};

}  // namespace Orvane::FeedParser
