#include "FeedParser/ParserPort.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Data.h"
#include "Foundation/URL.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"

#include <gtest/gtest.h>

using namespace Foundation;
using namespace Orvane;

namespace {

constexpr const char* kFeed =
    "<rss version='2.0'><channel><title>A feed</title><item><title>First</title></item>"
    "<item><title>Second</title></item></channel></rss>";
constexpr const char* kEntry = "<item><title>Alone</title><guid>1</guid></item>";
constexpr const char* kPage = "<html><head><title>A page</title></head><body/></html>";

class ParserPortTest : public testing::Test {
 protected:
    ~ParserPortTest() noexcept override = default;

    static Data* data(const char* text) { return Data::adopt(text); }
    FeedCore* feed(const char* text) { return port.parseFeed(data(text), nullptr); }
    EntryCore* entry(const char* text) { return port.parseEntry(data(text), nullptr); }

    AutoreleasePool pool;
    FeedParser::ParserPort port;
};

}  // namespace

TEST_F(ParserPortTest, GivesTheFeedWithItsEntries) {
    FeedCore* const found = feed(kFeed);
    ASSERT_TRUE(found);
    EXPECT_EQ(found->mTitle.getValue()->utf8(), "A feed");
    EXPECT_EQ(found->mEntries.getNewRows().size(), 2U);
    EXPECT_FALSE(found->getTable());
}

TEST_F(ParserPortTest, GivesASingleEntry) {
    EntryCore* const found = entry(kEntry);
    ASSERT_TRUE(found);
    EXPECT_EQ(found->mTitle.getValue()->utf8(), "Alone");
    EXPECT_FALSE(found->mFeed);
}

TEST_F(ParserPortTest, GivesNothingForOtherDocuments) {
    EXPECT_FALSE(feed(kEntry));
    EXPECT_FALSE(feed(kPage));
    EXPECT_FALSE(feed(""));
    EXPECT_FALSE(entry(kFeed));
    EXPECT_FALSE(entry(kPage));
    EXPECT_FALSE(Ref<FeedCore>(port.parseFeed(nullptr, nullptr)).get());
}
