#include "FeedParser/NamespaceClass.h"
#include "FeedParser/Tag.h"
#include "Support/AllocationCounter.h"

#include <gtest/gtest.h>

#include <string>

using namespace Orvane::FeedParser;

TEST(NameAllocation, NamesAreReadWithoutAny) {
    const std::string texts[] = {"",
                                 " TITLE\n",
                                 "http://www.w3.org/2005/Atom",
                                 "unknown",
                                 std::string(100000, 'a'),
                                 std::string(100000, ' ')};
    for (const std::string& text : texts) {
        const std::size_t before = Support::allocations();
        sStringToTag(text.c_str());
        sStringToUri(text.c_str());
        EXPECT_EQ(Support::allocations() - before, 0u) << text.substr(0, 40);
    }
}
