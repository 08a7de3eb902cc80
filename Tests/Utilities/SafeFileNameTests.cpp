#include "Utilities/SafeFileName.h"

#include <gtest/gtest.h>

#include <ostream>
#include <string>

using Orvane::SafeFileName;

namespace {

struct NameCase {
    std::string given, safe;
};
std::ostream& operator<<(std::ostream& stream, const NameCase& c) {
    return stream << testing::PrintToString(c.given);
}

class SafeFileNameTest : public testing::TestWithParam<NameCase> {};

INSTANTIATE_TEST_SUITE_P(
    Names, SafeFileNameTest,
    testing::Values(NameCase{"song.mp3", "song.mp3"}, NameCase{"../../etc/passwd", "passwd"},
                    NameCase{"/etc/passwd", "passwd"}, NameCase{"a/b/", "b"},
                    NameCase{"C:\\Users\\x\\song.mp3", "song.mp3"}, NameCase{"..", ""},
                    NameCase{".", ""}, NameCase{"/", ""}, NameCase{"", ""}, NameCase{"...", ""},
                    NameCase{".profile", "profile"}, NameCase{" ..  .x", "x"},
                    NameCase{"a\nb\x7F.\x01txt", "ab.txt"}, NameCase{std::string("a\0b", 3), "ab"},
                    NameCase{"\n.a", "a"},
                    NameCase{"a\xC2\x85"
                             "b\xC2\xA0",
                             "ab\xC2\xA0"},
                    // Written from right to left, the end would look like the extension.
                    NameCase{"song\xE2\x80\xAE"
                             "3pm.exe",
                             "song3pm.exe"},
                    NameCase{"a\xE2\x80\x8E\xE2\x80\xA8\xE2\x81\xA6z", "az"},
                    NameCase{"na\xC3\xAFve caf\xC3\xA9 \xE2\x82\xAC.ogg",
                             "na\xC3\xAFve caf\xC3\xA9 \xE2\x82\xAC.ogg"},
                    NameCase{"-rf", "-rf"}));

std::string times(int count, const std::string& text) {
    std::string result;
    for (int i = 0; i < count; ++i)
        result += text;
    return result;
}

}  // namespace

TEST_P(SafeFileNameTest, KeepsWhatCanBeAPlainName) {
    EXPECT_EQ(SafeFileName::make(GetParam().given), GetParam().safe);
}

TEST(SafeFileName, HasAtMost255Bytes) {
    EXPECT_EQ(SafeFileName::make(times(255, "a")), times(255, "a"));
    EXPECT_EQ(SafeFileName::make(times(256, "a")), times(255, "a"));
}

TEST(SafeFileName, KeepsTheExtensionOfALongName) {
    EXPECT_EQ(SafeFileName::make(times(300, "a") + ".mp3"), times(251, "a") + ".mp3");
    EXPECT_EQ(SafeFileName::make("abcdef.mp3", 7), "abc.mp3");
}

TEST(SafeFileName, CutsALongExtensionWithTheName) {
    EXPECT_EQ(SafeFileName::make("a." + times(300, "b")), "a." + times(253, "b"));
    EXPECT_EQ(SafeFileName::make("a.bcd", 4), "a.bc");
}

TEST(SafeFileName, CutsNoCharacter) {
    EXPECT_EQ(SafeFileName::make(times(100, "\xE2\x82\xAC")), times(85, "\xE2\x82\xAC"));
    EXPECT_EQ(SafeFileName::make(times(100, "\xE2\x82\xAC"), 254), times(84, "\xE2\x82\xAC"));
    EXPECT_EQ(SafeFileName::make(times(100, "\xE2\x82\xAC") + ".mp3"),
              times(83, "\xE2\x82\xAC") + ".mp3");
}

TEST(SafeFileName, IsQuickForLongNames) {
    const std::string made = SafeFileName::make(times(1000000, ".\xE2\x80\xAE"));
    EXPECT_EQ(made, "");
}
