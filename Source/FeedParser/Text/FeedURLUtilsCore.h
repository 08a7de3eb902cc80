#pragma once

#include "Foundation/ArrayOf.h"
#include "Foundation/Ref.h"
#include "Foundation/URL.h"

#include <string>
#include <string_view>

namespace Orvane {

/// The forms of URLs that name feeds for a browser: "feed:" wraps the source of one feed, "feeds:"
/// names a set of them. Arguments may be null.
struct FeedURLUtilsCore {
    using String = Foundation::String;
    using URL = Foundation::URL;
    using URLs = Foundation::ArrayOf<URL>;

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
    /// The other way. A URL of one of the forms, and null, come back as they are.
    static Foundation::URLReturner feedURLForSourceURL(URL* url);

    // Sets of feeds: "feeds:Name&example.org/a&example.org/b&uuid:1&filter:words". Feeds lose their
    // schemes in it, so all of them come back as of HTTP. An older form begins with "multi:" or
    // "feed:multi:".

    /// The URL of a set: the same for the same feeds in any order. All but `urls` may be null, and
    /// that is empty then.
    static Foundation::URLReturner aggregateFeedURLFromComponents(const URLs* urls,
                                                                  const String* name,
                                                                  const String* uuid,
                                                                  const String* filter);
    /// The feeds of a set, with the rest of what it says, null for what it does not; the name is
    /// empty if it cannot be read. Null for a URL that stands for no set; an empty list for null.
    /// Throws `AssertionFailure` for a "feed:" URL that names one feed, and for other schemes.
    static Foundation::Returner<URLs> urlsFromAggregateFeedURL(URL* url,
                                                               Foundation::Ref<String>& name,
                                                               Foundation::Ref<String>& uuid,
                                                               Foundation::Ref<String>& filter);
    /// A "feeds:" URL without its filter; any other as it is.
    static Foundation::URLReturner unfilteredAggregateURL(URL* url);
    static std::string unfilteredAggregateURLString(std::string_view text);
};

}  // namespace Orvane
