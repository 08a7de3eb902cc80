#pragma once

#include <string_view>

namespace Orvane::FeedParser {

/// A cheap look at markup, before it is tidied.
struct MarkupLook {
    /// Whether it is so small, and its elements so little nested, that tidying it can't take much.
    static bool isSmallAndShallow(std::string_view markup);
    /// Whether it is HTML of the plainest: properly nested, of common elements with no block in an
    /// inline one. On other HTML, however small, Tidy may never end.
    static bool isPlainHTML(std::string_view markup);
    /// Whether its first element is one of HTML's.
    static bool isPage(std::string_view markup);
};

}  // namespace Orvane::FeedParser
