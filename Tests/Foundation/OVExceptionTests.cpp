#include <Orvane/OVException.h>
#include <gtest/gtest.h>

TEST(OVException, IsARuntimeErrorWithItsText) {
    try {
        throw OVException("what happened");
    } catch (const std::runtime_error& e) {
        EXPECT_STREQ(e.what(), "what happened");
        EXPECT_NE(dynamic_cast<const OVException*>(&e), nullptr);
    }
}
