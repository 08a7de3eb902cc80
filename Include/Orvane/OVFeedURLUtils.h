#pragma once

#include <Orvane/OVBase.h>

#include <optional>
#include <string>
#include <vector>

/// The URLs by which browsers hand feeds to the system: "feed:" wraps the source of one feed, and
/// "feeds:" names a set of them, "feeds:Name&example.org/a&example.org/b&uuid:1&filter:words".
///
/// URLs are texts in UTF-8; what is no URL is like none. Failures are reported in the log, and give
/// none or false. Thread: see `OVObject`.
struct OVFeedURLUtils {
    /// In UTF-8; none where there is nothing.
    using Text = std::optional<std::string>;

    /// A set of feeds.
    struct Aggregate {
        /// Of the feeds.
        std::vector<std::string> urls;
        Text name;    ///< for people
        Text uuid;    ///< what tells it from other sets of this name
        Text filter;  ///< the words that entries must have
    };

    /// Whether it names one feed.
    OV_EXPORT static bool _webIsFeedProtocolURL(const Text& url);
    /// Whether it names a set of feeds.
    OV_EXPORT static bool _webIsFeedsProtocolURL(const Text& url);
    /// Whether it does either.
    OV_EXPORT static bool isKnownURL(const Text& url);

    /// The URL that names the feed of a source. One of these forms comes back as it is.
    OV_EXPORT static Text feedURLForSourceURL(const Text& url);
    /// The source of the feed that a "feed:" URL names; none for any other.
    OV_EXPORT static Text sourceURLForFeedURL(const Text& url);

    /// The URL of a set, which is the same for the same feeds in any order; none for no feeds.
    /// Schemes do not go into it: all feeds come back as of HTTP.
    OV_EXPORT static Text aggregateFeedURLForURLs(const std::vector<std::string>& urls,
                                                  const Text& name, const Text& uuid = {},
                                                  const Text& filter = {});
    /// What a set's URL says; none for what is no set.
    OV_EXPORT static std::optional<Aggregate> parseAggregateFeedURL(const Text& url);
    /// A "feeds:" URL without its filter; any other as it is.
    OV_EXPORT static Text unfilteredAggregateURL(const Text& url);
    /// The same for any text.
    OV_EXPORT static std::string unfilteredAggregateURLString(const std::string& text);
};
