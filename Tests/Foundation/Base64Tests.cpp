#include "Foundation/Base64.h"

#include <gtest/gtest.h>

#include <random>

using namespace Foundation;

namespace {

struct Pair {
    const char* bytes;
    const char* text;
};

class Base64Pairs : public testing::TestWithParam<Pair> {};

}  // namespace

TEST_P(Base64Pairs, EncodeAndDecode) {
    EXPECT_EQ(Base64::encode(GetParam().bytes), GetParam().text);
    EXPECT_EQ(Base64::decode(GetParam().text), GetParam().bytes);
}

// The test vectors of RFC 4648, section 10.
INSTANTIATE_TEST_SUITE_P(OfTheStandard, Base64Pairs,
                         testing::Values(Pair{"", ""}, Pair{"f", "Zg=="}, Pair{"fo", "Zm8="},
                                         Pair{"foo", "Zm9v"}, Pair{"foob", "Zm9vYg=="},
                                         Pair{"fooba", "Zm9vYmE="}, Pair{"foobar", "Zm9vYmFy"}));

TEST(Base64, UsesTheWholeAlphabet) {
    std::string bytes;
    for (unsigned i = 0; i < 64; i += 4) {
        const unsigned group = i << 18 | (i + 1) << 12 | (i + 2) << 6 | (i + 3);
        bytes += {static_cast<char>(group >> 16), static_cast<char>(group >> 8),
                  static_cast<char>(group)};
    }
    const std::string alphabet = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
    EXPECT_EQ(Base64::encode(bytes), alphabet);
    EXPECT_EQ(Base64::decode(alphabet), bytes);
}

TEST(Base64, DoesNotBreakLines) {
    EXPECT_EQ(Base64::encode(std::string(300, 'x')).find_first_of("\r\n"), std::string::npos);
}

TEST(Base64, IgnoresWhatIsOutsideTheAlphabet) {
    EXPECT_EQ(Base64::decode(" Zm9v\r\n\tY-m_F*y\xFF"), "foobar");
}

TEST(Base64, CutsTheLastGroupByItsPadding) {
    EXPECT_EQ(Base64::decode("Zm9v===="), "foo");
    EXPECT_EQ(Base64::decode("Zm9vY==="), "foo");
    EXPECT_EQ(Base64::decode("Zm9vYg==Zm9v"), "foob");
    EXPECT_EQ(Base64::decode("===="), "");
}

TEST(Base64, ReadsGroupsWithoutPadding) {
    EXPECT_EQ(Base64::decode("Zg"), "f");
    EXPECT_EQ(Base64::decode("Zm8"), "fo");
    EXPECT_EQ(Base64::decode("Z"), "");
}

TEST(Base64, GivesBackWhatItEncoded) {
    constexpr unsigned kSeed = 7;
    SCOPED_TRACE(kSeed);
    std::mt19937 random(kSeed);
    for (std::size_t size = 0; size < 200; ++size) {
        std::string bytes(size, '\0');
        for (char& c : bytes) {
            c = static_cast<char>(random());
        }
        ASSERT_EQ(Base64::decode(Base64::encode(bytes)), bytes);
    }
}
