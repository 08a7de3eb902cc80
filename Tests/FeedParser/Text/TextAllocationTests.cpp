#include "FeedParser/Text/ParserUtils.h"
#include "Support/AllocationCounter.h"

#include <gtest/gtest.h>

#include <string>

using Orvane::ParserUtils;

namespace {

const std::string kTexts[] = {
    "",
    "A plain title",
    "  Tom &amp; Jerry&#8217;s <b>caf&eacute;</b> &#150; &foo; &#xD800; & < more ",
    std::string(100000, '&'),
    std::string(100000, '<'),
    std::string(100000, ' '),
};

}  // namespace

TEST(TextAllocation, ReferencesAreDecodedWithoutAny) {
    for (const std::string& text : kTexts) {
        std::string copy = text;
        const std::size_t before = Support::allocations();
        ParserUtils::decodeEntities(copy.data(), copy.data(), true);
        EXPECT_EQ(Support::allocations() - before, 0u) << text.substr(0, 40);
    }
}

TEST(TextAllocation, PlainTextIsMadeWithoutAny) {
    for (const std::string& text : kTexts) {
        std::string copy = text;
        const std::size_t before = Support::allocations();
        ParserUtils::convertToPlainText(copy.data(), copy.data());
        EXPECT_EQ(Support::allocations() - before, 0u) << text.substr(0, 40);
    }
}
