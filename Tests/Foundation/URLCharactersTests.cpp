#include "Foundation/URLCharacters.h"

#include <gtest/gtest.h>

using namespace Foundation;

TEST(URLCharacters, EscapesEverythingThatIsNotItself) {
    EXPECT_EQ(escapeURLText("azAZ09-._~!$&'()*+,;=:@/?"), "azAZ09-._~!$&'()*+,;=:@/?");
    EXPECT_EQ(escapeURLText(" \"#%<>[\\]^`{|}\x01\x7f\xff"),
              "%20%22%23%25%3C%3E%5B%5C%5D%5E%60%7B%7C%7D%01%7F%FF");
    EXPECT_EQ(escapeURLText("a&b%26", "&"), "a%26b%2526");
    EXPECT_EQ(escapeURLText(std::string_view("\0", 1)), "%00");
    EXPECT_EQ(escapeURLText(""), "");
}

TEST(URLCharacters, UnescapesWhatWasEscaped) {
    std::string all;
    for (int byte = 0; byte < 256; ++byte) {
        all += static_cast<char>(byte);
    }
    EXPECT_EQ(unescapeURLText(escapeURLText(all)), all);
    EXPECT_EQ(unescapeURLText(escapeURLText(all, all)), all);
    EXPECT_EQ(unescapeURLText("%c3%A4+"), "\xc3\xa4+");
    EXPECT_EQ(unescapeURLText("%2F%41", "/"), "%2FA");
}

TEST(URLCharacters, RefusesAPercentSignWithoutItsDigits) {
    for (const char* bad : {"%", "%4", "a%", "%4g", "%g4", "%%41", "%-1"}) {
        EXPECT_EQ(unescapeURLText(bad), std::nullopt) << bad;
    }
}
