#include "Foundation/StringEncoding.h"

#include <gtest/gtest.h>

using namespace Foundation;

namespace {

struct Sample {
    const char* encoding;
    std::string bytes;
    std::string utf8;
};

class StringEncodingSamples : public testing::TestWithParam<Sample> {};

}  // namespace

TEST_P(StringEncodingSamples, GoBothWays) {
    const std::optional<StringEncoding> encoding = StringEncoding::named(GetParam().encoding);
    ASSERT_TRUE(encoding);
    EXPECT_EQ(encoding->decode(GetParam().bytes), GetParam().utf8);
    EXPECT_EQ(encoding->encode(GetParam().utf8), GetParam().bytes);
}

INSTANTIATE_TEST_SUITE_P(
    Of, StringEncodingSamples,
    testing::Values(Sample{"utf-8", "\xE2\x82\xAC", "\xE2\x82\xAC"},
                    Sample{"UTF-16BE", std::string("\x00\x61\x20\xAC\xD8\x3D\xDE\x00", 8),
                           "a\xE2\x82\xAC\xF0\x9F\x98\x80"},
                    Sample{"UTF-16LE", std::string("\x61\x00\xAC\x20", 4), "a\xE2\x82\xAC"},
                    Sample{"latin1", "\xE9\xFF", "\xC3\xA9\xC3\xBF"},
                    Sample{"cp1252", "\x80\x93\xE9", "\xE2\x82\xAC\xE2\x80\x9C\xC3\xA9"},
                    Sample{"macintosh", "\x8E\xA5", "\xC3\xA9\xE2\x80\xA2"},
                    Sample{"us-ascii", "plain", "plain"},
                    Sample{"Shift_JIS", "\x93\xFA", "\xE6\x97\xA5"},
                    Sample{"koi8-r", "\xD2", "\xD1\x80"}));

TEST(StringEncoding, KnowsTheConstantsByTheirNames) {
    EXPECT_EQ(StringEncoding::named("utf8"), StringEncoding::kUTF8);
    EXPECT_EQ(StringEncoding::named("UTF-16"), StringEncoding::kUTF16);
    EXPECT_EQ(StringEncoding::named("utf-16be"), StringEncoding::kUTF16BE);
    EXPECT_EQ(StringEncoding::named("utf-16le"), StringEncoding::kUTF16LE);
    EXPECT_EQ(StringEncoding::named("iso-8859-1"), StringEncoding::kLatin1);
    EXPECT_EQ(StringEncoding::named("windows-1252"), StringEncoding::kWindows1252);
    EXPECT_EQ(StringEncoding::named("macintosh"), StringEncoding::kMacRoman);
    EXPECT_EQ(StringEncoding::named("ascii"), StringEncoding::kASCII);
    EXPECT_STREQ(StringEncoding::named("latin1")->getName(), "ISO-8859-1");
}

TEST(StringEncoding, DoesNotKnowOtherNames) {
    for (const char* name : {"", "no-such-encoding", "../../etc/passwd", "utf-8 and more"}) {
        EXPECT_EQ(StringEncoding::named(name), std::nullopt) << name;
    }
    EXPECT_EQ(StringEncoding::named(nullptr), std::nullopt);
    EXPECT_EQ(StringEncoding::named(std::string(10000, 'x').c_str()), std::nullopt);
}

TEST(StringEncoding, ReadsUTF16InTheOrderOfItsMark) {
    const StringEncoding& encoding = StringEncoding::kUTF16;
    EXPECT_EQ(encoding.decode(std::string("\xFE\xFF\x00\x61", 4)), "a");
    EXPECT_EQ(encoding.decode(std::string("\xFF\xFE\x61\x00", 4)), "a");
    EXPECT_EQ(encoding.decode(std::string("\x00\x61", 2)), "a");
    const std::optional<std::string> written = encoding.encode("a\xE2\x82\xAC");
    ASSERT_TRUE(written);
    EXPECT_EQ(written->size(), 6u);
    EXPECT_EQ(encoding.decode(*written), "a\xE2\x82\xAC");
}

TEST(StringEncoding, DropsTheMarkAtTheStart) {
    EXPECT_EQ(StringEncoding::kUTF8.decode("\xEF\xBB\xBF"
                                           "a\xEF\xBB\xBF"),
              "a\xEF\xBB\xBF");
    EXPECT_EQ(StringEncoding::kUTF16BE.decode(std::string("\xFE\xFF\x00\x61", 4)), "a");
    EXPECT_EQ(StringEncoding::kUTF16LE.decode(std::string("\xFF\xFE\x61\x00", 4)), "a");
}

TEST(StringEncoding, ReadsOnlyWhatIsAllText) {
    EXPECT_EQ(StringEncoding::kUTF8.decode("a\xFF"), std::nullopt);
    EXPECT_EQ(StringEncoding::kASCII.decode("a\xE9"), std::nullopt);
    EXPECT_EQ(StringEncoding::kUTF16BE.decode("abc"), std::nullopt);
    EXPECT_EQ(StringEncoding::kUTF16BE.decode("\xD8\x3D"), std::nullopt);
    EXPECT_EQ(StringEncoding::named("Shift_JIS")->decode("\x93"), std::nullopt);
}

TEST(StringEncoding, ReadsWhatIsNoTextAsTheReplacementWhereAskedTo) {
    EXPECT_EQ(StringEncoding::kUTF8.decodeLeniently("a\xE9 b\xC3\xA9"), "a\xEF\xBF\xBD b\xC3\xA9");
    EXPECT_EQ(StringEncoding::kASCII.decodeLeniently("a\xE9"), "a\xEF\xBF\xBD");
    EXPECT_EQ(StringEncoding::named("Shift_JIS")->decodeLeniently("\x93\xFA\x93"),
              "\xE6\x97\xA5\xEF\xBF\xBD");
    EXPECT_EQ(StringEncoding::kUTF8.decodeLeniently("\xEF\xBB\xBF\xE9"), "\xEF\xBF\xBD");
    EXPECT_EQ(StringEncoding::kLatin1.decodeLeniently("a\xE9"), "a\xC3\xA9");
}

TEST(StringEncoding, WritesOnlyWhatHasAForm) {
    EXPECT_EQ(StringEncoding::kASCII.encode("a\xC3\xA9"), std::nullopt);
    EXPECT_EQ(StringEncoding::kLatin1.encode("\xE2\x82\xAC"), std::nullopt);
    // A zero-width joiner, which ICU would pass over by itself.
    EXPECT_EQ(StringEncoding::kLatin1.encode("a\xE2\x80\x8D"), std::nullopt);
}

TEST(StringEncoding, KeepsZerosAndNothing) {
    const std::string zeros("a\0b", 3);
    EXPECT_EQ(StringEncoding::kUTF8.decode(zeros), zeros);
    EXPECT_EQ(StringEncoding::kLatin1.decode(zeros), zeros);
    EXPECT_EQ(StringEncoding::kLatin1.decode(std::string_view()), "");
    EXPECT_EQ(StringEncoding::kLatin1.encode(std::string_view()), "");
}

TEST(StringEncoding, ConvertsLongTexts) {
    std::string utf8, latin1;
    for (int i = 0; i < 100000; ++i) {
        utf8 += i % 3 ? "x" : "\xC3\xA9";
        latin1 += i % 3 ? 'x' : '\xE9';
    }
    EXPECT_EQ(StringEncoding::kLatin1.decode(latin1), utf8);
    EXPECT_EQ(StringEncoding::kLatin1.encode(utf8), latin1);
}
