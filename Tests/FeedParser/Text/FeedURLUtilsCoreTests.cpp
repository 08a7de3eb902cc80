#include "FeedParser/Text/FeedURLUtilsCore.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/String.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

#include <string>

using namespace Foundation;
using namespace Orvane;

namespace {

URL* urlOf(const char* text) {
    return URL::url(String::string(std::string(text)));
}

struct Form {
    const char* feedURL;
    const char* source;  ///< null for none
};

void PrintTo(const Form& form, std::ostream* out) {
    *out << form.feedURL;
}

class FeedURLForm : public testing::TestWithParam<Form> {};

}  // namespace

TEST_P(FeedURLForm, HasASource) {
    const AutoreleasePool pool;
    Support::LogCapture log;
    const URL* source = FeedURLUtilsCore::sourceURLForFeedURL(urlOf(GetParam().feedURL));
    EXPECT_EQ(source ? source->text() : "none", GetParam().source ? GetParam().source : "none");
}

INSTANTIATE_TEST_SUITE_P(
    All, FeedURLForm,
    testing::Values(Form{"feed://example.org/rss", "http://example.org/rss"},
                    Form{"FEED://example.org/rss", "http://example.org/rss"},
                    Form{"feed:example.org/rss", "http://example.org/rss"},
                    Form{"feed:https://example.org/rss", "https://example.org/rss"},
                    Form{"feed://https://example.org/rss", "https://example.org/rss"},
                    Form{"feed:http://localhost/rss", "http://localhost/rss"},
                    Form{"feed://example.org:8080/rss", "http://example.org:8080/rss"},
                    Form{"feed:///example.org/rss", "http://example.org/rss"},
                    Form{"feed:////example.org/rss", "http://example.org/rss"},
                    Form{"feed:///https://example.org/rss", "https://example.org/rss"},
                    Form{"feed://localhost/rss", "http://localhost/rss"},
                    Form{"feed://example.org/a:b", "http://example.org/a:b"},
                    Form{"feed:file:///home/ann/feed.xml", "file:///home/ann/feed.xml"},
                    Form{"feed://example.org/rss?a=b.c", "http://example.org/rss?a=b.c"},
                    Form{"feed:", nullptr}, Form{"feeds:name&example.org", nullptr},
                    Form{"http://example.org/rss", nullptr}, Form{"feed:%41:b", nullptr}));

TEST(FeedURLUtilsCore, KnowsTheSchemesInAnyCase) {
    const AutoreleasePool pool;
    EXPECT_TRUE(FeedURLUtilsCore::isFeedProtocolURL(urlOf("Feed:x")));
    EXPECT_FALSE(FeedURLUtilsCore::isFeedProtocolURL(urlOf("feeds:x")));
    EXPECT_TRUE(FeedURLUtilsCore::isFeedsProtocolURL(urlOf("FEEDS:x")));
    EXPECT_FALSE(FeedURLUtilsCore::isFeedsProtocolURL(urlOf("feed:x")));
    EXPECT_TRUE(FeedURLUtilsCore::isKnownURL(urlOf("feed:x")));
    EXPECT_TRUE(FeedURLUtilsCore::isKnownURL(urlOf("feeds:x")));
    EXPECT_FALSE(FeedURLUtilsCore::isKnownURL(urlOf("http://example.org/")));
}

TEST(FeedURLUtilsCore, TakesNull) {
    const AutoreleasePool pool;
    EXPECT_FALSE(FeedURLUtilsCore::isKnownURL(nullptr));
    const URL* none = FeedURLUtilsCore::sourceURLForFeedURL(nullptr);
    EXPECT_EQ(none, nullptr);
}

TEST(FeedURLUtilsCore, WarnsOfAFeedURLWithoutASource) {
    const AutoreleasePool pool;
    Support::LogCapture log;
    const URL* none = FeedURLUtilsCore::sourceURLForFeedURL(urlOf("feed:"));
    EXPECT_EQ(none, nullptr);
    EXPECT_TRUE(log.contains("FeedURLUtilsCore: Couldn't parse feed URL <feed:>"));
    const URL* bogus = FeedURLUtilsCore::sourceURLForFeedURL(urlOf("feed:%41:b"));
    EXPECT_EQ(bogus, nullptr);
    EXPECT_TRUE(log.contains("Generated bogus source URL <%41:b> for <feed:%41:b>. Nullifying."));
}
