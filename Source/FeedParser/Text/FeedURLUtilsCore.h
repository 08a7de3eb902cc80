#pragma once

#include "Foundation/URL.h"

namespace Orvane {

/// The forms of URLs that name feeds for a browser: "feed:" wraps the source of one feed, "feeds:"
/// names a set of them. Arguments may be null.
struct FeedURLUtilsCore {
    using URL = Foundation::URL;

    /// Whether it names one feed, that is whether its scheme is "feed". False for null.
    static bool isFeedProtocolURL(const URL* url);
    /// Whether it names a set of feeds, that is whether its scheme is "feeds". False for null.
    static bool isFeedsProtocolURL(const URL* url);
    /// Whether it is either.
    static bool isKnownURL(const URL* url);

    /// Where the feed is that a "feed:" URL names. What stands there may be a URL or, without its
    /// scheme, one of HTTP, with more slashes in front than it should have. Null for any other URL
    /// and, with a warning, if there is no source in it.
    static Foundation::URLReturner sourceURLForFeedURL(const URL* url);
};

}  // namespace Orvane
