#include "Foundation/UTF8.h"

#include <gtest/gtest.h>

using namespace Foundation;

TEST(UTF8, TellsWhatIsValid) {
    for (const std::string_view valid :
         {std::string_view(), std::string_view("abc"), std::string_view("\0", 1),
          std::string_view("\xC2\x80 \xDF\xBF \xE0\xA0\x80 \xEF\xBF\xBF"),
          std::string_view("\xF0\x90\x80\x80 \xF4\x8F\xBF\xBF")}) {
        for (std::size_t before = 0; before < 20; ++before) {
            EXPECT_TRUE(UTF8::isValid(std::string(before, 'a').append(valid))) << valid;
        }
    }
}

class UTF8Refusals : public testing::TestWithParam<const char*> {};

TEST_P(UTF8Refusals, AreNotValid) {
    EXPECT_FALSE(UTF8::isValid(GetParam()));
    // Behind so many others that it stands at each place of a word of the machine.
    for (std::size_t before = 0; before < 20; ++before) {
        const std::string text = std::string(before, 'a') + GetParam() + " and much text behind it";
        EXPECT_FALSE(UTF8::isValid(text)) << before;
    }
}

INSTANTIATE_TEST_SUITE_P(Of, UTF8Refusals,
                         testing::Values("\x80", "\xBF", "\xC0\x80", "\xC1\xBF", "\xC2", "\xC2 ",
                                         "\xE0\x9F\xBF", "\xE2\x82", "\xED\xA0\x80", "\xED\xBF\xBF",
                                         "\xF0\x8F\xBF\xBF", "\xF0\x9F\x98", "\xF4\x90\x80\x80",
                                         "\xF5\x80\x80\x80", "\xFE", "\xFF"));

TEST(UTF8, CountsCharacters) {
    EXPECT_EQ(UTF8::count(""), 0u);
    EXPECT_EQ(UTF8::count("abc"), 3u);
    EXPECT_EQ(UTF8::count("a\xC3\xA9\xE2\x82\xAC\xF0\x9F\x98\x80"), 4u);
}

TEST(UTF8, FindsCharactersByIndex) {
    const std::string_view text = "a\xC3\xA9\xE2\x82\xACz";
    EXPECT_EQ(UTF8::offset(text, 0), 0u);
    EXPECT_EQ(UTF8::offset(text, 2), 3u);
    EXPECT_EQ(UTF8::offset(text, 3), 6u);
    EXPECT_EQ(UTF8::offset(text, 4), 7u);
    EXPECT_EQ(UTF8::offset(text, SIZE_MAX), 7u);
    EXPECT_EQ(UTF8::offset("", 0), 0u);
}
