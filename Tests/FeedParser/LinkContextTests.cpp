#include "FeedParser/LinkContext.h"

#include "Foundation/AutoreleasePool.h"
#include "SQLite/Database.h"

#include <gtest/gtest.h>

#include <limits>
#include <utility>

using namespace Foundation;
using namespace Orvane::FeedParser;

namespace {

class LinkContextTest : public testing::Test {
 protected:
    LinkContextTest() { SQLite::Database::initialize(); }
    ~LinkContextTest() noexcept override {}

    AutoreleasePool pool;
    Ref<LinkContext> context{new LinkContext(LinkTag)};
};

TEST_F(LinkContextTest, TakesValuesWithoutOuterWhiteSpace) {
    context->gotAttribute(nullptr, "href", " x\n");
    context->gotAttribute(nullptr, "length", " 12 ");
    EXPECT_EQ(context->link->mHref->utf8(), "x");
    EXPECT_EQ(context->enclosure->mLength.getValue(), 12);
}

TEST_F(LinkContextTest, TakesTheDigitsThatALengthBeginsWith) {
    const std::pair<const char*, long long> lengths[] = {
        {"12", 12},
        {" 12 bytes", 12},
        {"007", 7},
        {"1.5", 1},
        {"-5", 0},
        {"+5", 0},
        {"- 5", 0},
        {"x5", 0},
        {"0x10", 0},
        {" ", 0},
        {"1,024", 1},
        {"99999999999999999999", std::numeric_limits<long long>::max()},
        {"12 bytes, or so says whoever made this feed", 12}};
    for (const auto& [text, length] : lengths) {
        context->gotAttribute(nullptr, "length", "77");
        context->gotAttribute(nullptr, "size", text);
        EXPECT_EQ(context->enclosure->mLength.getValue(), length) << text;
    }
}

TEST_F(LinkContextTest, IgnoresValuesThatAreNoUTF8) {
    for (const char* name : {"rel", "type", "title", "href", "length"}) {
        context->gotAttribute(nullptr, name, "\xFF");
    }
    EXPECT_EQ(context->link->mRel.get(), nullptr);
    EXPECT_EQ(context->link->mType.get(), nullptr);
    EXPECT_EQ(context->link->mTitle.get(), nullptr);
    EXPECT_EQ(context->link->mHref.get(), nullptr);
    EXPECT_EQ(context->typeString.get(), nullptr);
}

}  // namespace
