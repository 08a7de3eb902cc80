#include <Orvane/OVFeedURLUtils.h>

#include "Foundation/Logger.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

using Utils = OVFeedURLUtils;
using Text = OVFeedURLUtils::Text;
using URLs = std::vector<std::string>;

TEST(OVFeedURLUtils, KnowsTheFormsInAnyCase) {
    EXPECT_TRUE(Utils::_webIsFeedProtocolURL("FEED://e.org/"));
    EXPECT_FALSE(Utils::_webIsFeedProtocolURL("feeds:a"));
    EXPECT_TRUE(Utils::_webIsFeedsProtocolURL("Feeds:a"));
    EXPECT_FALSE(Utils::_webIsFeedsProtocolURL("feed://e.org/"));
    EXPECT_TRUE(Utils::isKnownURL("feed://e.org/"));
    EXPECT_TRUE(Utils::isKnownURL("feeds:a"));
    EXPECT_FALSE(Utils::isKnownURL("http://e.org/"));
    EXPECT_FALSE(Utils::isKnownURL(std::nullopt));
    EXPECT_FALSE(Utils::_webIsFeedProtocolURL(std::nullopt));
    EXPECT_FALSE(Utils::_webIsFeedsProtocolURL(std::nullopt));
}

TEST(OVFeedURLUtils, WrapsASource) {
    EXPECT_EQ(Utils::feedURLForSourceURL("http://e.org/f?a=1"), "feed://e.org/f?a=1");
    EXPECT_EQ(Utils::feedURLForSourceURL("HTTP://e.org/f"), "feed://e.org/f");
    EXPECT_EQ(Utils::feedURLForSourceURL("http://local/f"), "feed:http://local/f");
    EXPECT_EQ(Utils::feedURLForSourceURL("https://e.org/f"), "feed:https://e.org/f");
    EXPECT_EQ(Utils::feedURLForSourceURL("feed://e.org/f"), "feed://e.org/f");
    EXPECT_EQ(Utils::feedURLForSourceURL("feeds:a&e.org"), "feeds:a&e.org");
    EXPECT_FALSE(Utils::feedURLForSourceURL(std::nullopt));
}

TEST(OVFeedURLUtils, UnwrapsASource) {
    EXPECT_EQ(Utils::sourceURLForFeedURL("feed://e.org/f"), "http://e.org/f");
    EXPECT_EQ(Utils::sourceURLForFeedURL("feed:https://e.org/f"), "https://e.org/f");
    EXPECT_FALSE(Utils::sourceURLForFeedURL("feeds:a&e.org"));
    EXPECT_FALSE(Utils::sourceURLForFeedURL("http://e.org/"));
}

TEST(OVFeedURLUtils, NamesASetOfFeedsInAnyOrder) {
    const Text set = Utils::aggregateFeedURLForURLs(
        {"http://B.org/f", "https://a.org/f?x=1&y=2", "feed:http://c.org/%20"}, "Name", "id", "w");
    EXPECT_EQ(set, "feeds:Name&a.org/f?x=1%26y=2&B.org/f&c.org/%20&uuid:id&filter:w");
    EXPECT_EQ(Utils::aggregateFeedURLForURLs(
                  {"feed:http://c.org/%20", "https://a.org/f?x=1&y=2", "http://B.org/f"}, "Name",
                  "id", "w"),
              set);
    EXPECT_EQ(Utils::aggregateFeedURLForURLs({"http://e.org/"}, std::nullopt), "feeds:&e.org/");
    EXPECT_FALSE(Utils::aggregateFeedURLForURLs({}, "Name"));
}

TEST(OVFeedURLUtils, ReadsASetOfFeeds) {
    const auto set = Utils::parseAggregateFeedURL(
        "feeds:My%20name&a.org/f?x=1%26y=2&https://b.org/&uuid:a%20b"
        "&filter:two%20words&&");
    ASSERT_TRUE(set);
    EXPECT_EQ(set->urls, (URLs{"http://a.org/f?x=1&y=2", "https://b.org/"}));
    EXPECT_EQ(set->name, "My name");
    EXPECT_EQ(set->uuid, "a%20b");
    EXPECT_EQ(set->filter, "two words");
}

TEST(OVFeedURLUtils, ReadsTheOlderForms) {
    for (const char* url : {"feed:multi:N&e.org/f", "multi:N&e.org/f", "FEEDS:N&e.org/f"}) {
        const auto set = Utils::parseAggregateFeedURL(url);
        ASSERT_TRUE(set) << url;
        EXPECT_EQ(set->name, "N");
        EXPECT_EQ(set->urls, URLs{"http://e.org/f"});
    }
}

TEST(OVFeedURLUtils, ReadsASetOfNone) {
    const auto named = Utils::parseAggregateFeedURL("feeds:Name");
    ASSERT_TRUE(named);
    EXPECT_TRUE(named->urls.empty());
    EXPECT_EQ(named->name, "Name");
    const auto none = Utils::parseAggregateFeedURL(std::nullopt);
    ASSERT_TRUE(none);
    EXPECT_TRUE(none->urls.empty());
    EXPECT_FALSE(none->name);
    EXPECT_EQ(Utils::parseAggregateFeedURL("feeds:%FF&e.org")->name, "");
}

TEST(OVFeedURLUtils, ReadsNoSetInWhatIsNone) {
    Support::LogCapture log;
    const Support::LoggingOn logging({&Foundation::gLog});
    EXPECT_FALSE(Utils::parseAggregateFeedURL("feeds://e.org"));
    EXPECT_TRUE(log.contains("Invalid URL <feeds://e.org>"));
    EXPECT_FALSE(Utils::parseAggregateFeedURL("feed://e.org"));
    EXPECT_TRUE(log.contains("urlString->hasPrefix(PFSTR(\"multi:\"))"));
    EXPECT_TRUE(log.contains("+[OVFeedURLUtils parseAggregateFeedURL:name:uuid:filter:]"));
}

TEST(OVFeedURLUtils, TakesTheFirstOfTwo) {
    Support::LogCapture log;
    const auto set = Utils::parseAggregateFeedURL("feeds:N&uuid:1&uuid:2&filter:a&filter:b");
    EXPECT_EQ(set->uuid, "1");
    EXPECT_EQ(set->filter, "a");
    EXPECT_TRUE(log.contains("FeedURLUtilsCore: Multiple UUIDs in <feeds:N"));
    EXPECT_TRUE(log.contains("FeedURLUtilsCore: Multiple filters in <feeds:N"));
}

TEST(OVFeedURLUtils, BringsNamesAndFiltersBackAsTheyWere) {
    for (const char* text : {"a & b", "100%", "%26", "#1", "ä", "x:y/z?"}) {
        const Text url = Utils::aggregateFeedURLForURLs({"http://e.org/"}, text, {}, text);
        const auto set = Utils::parseAggregateFeedURL(url);
        ASSERT_TRUE(set) << text;
        EXPECT_EQ(set->name, text);
        EXPECT_EQ(set->filter, text);
        EXPECT_EQ(set->urls, URLs{"http://e.org/"});
    }
}

TEST(OVFeedURLUtils, LeavesTheFilterOut) {
    EXPECT_EQ(Utils::unfilteredAggregateURL("feeds:N&e.org&filter:a"), "feeds:N&e.org");
    EXPECT_EQ(Utils::unfilteredAggregateURL("feeds:N&e.org"), "feeds:N&e.org");
    EXPECT_EQ(Utils::unfilteredAggregateURL("http://e.org/?a&filter:b"),
              "http://e.org/?a&filter:b");
    EXPECT_FALSE(Utils::unfilteredAggregateURL(std::nullopt));
    EXPECT_EQ(Utils::unfilteredAggregateURLString("FEEDS:N&filter:a"), "FEEDS:N");
    EXPECT_EQ(Utils::unfilteredAggregateURLString("x&filter:a"), "x&filter:a");
}

TEST(OVFeedURLUtils, ReportsWhatItCannotTake) {
    Support::LogCapture log;
    EXPECT_FALSE(Utils::isKnownURL("\xff"));
    EXPECT_TRUE(log.contains("+[OVFeedURLUtils isKnownURL:]"));
    EXPECT_FALSE(Utils::feedURLForSourceURL("\xff"));
    EXPECT_FALSE(Utils::parseAggregateFeedURL("\xff"));
    EXPECT_FALSE(Utils::aggregateFeedURLForURLs({"http://e.org/", "no url"}, "Name"));
    EXPECT_TRUE(log.contains("+[OVFeedURLUtils aggregateFeedURLForURLs:name:uuid:filter:]"));
    EXPECT_FALSE(Utils::aggregateFeedURLForURLs({"http://e.org/"}, "\xff"));
}

TEST(OVFeedURLUtils, SortsWhatDiffersByCaseAlone) {
    EXPECT_EQ(Utils::aggregateFeedURLForURLs({"http://e.org/a", "http://e.org/A"}, {}),
              "feeds:&e.org/A&e.org/a");
    EXPECT_EQ(Utils::aggregateFeedURLForURLs({"http://e.org/A", "http://e.org/a"}, {}),
              "feeds:&e.org/A&e.org/a");
}
