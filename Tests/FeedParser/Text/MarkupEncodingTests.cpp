#include "FeedParser/Text/MarkupEncoding.h"

#include <gtest/gtest.h>

#include <string>

using Orvane::FeedParser::MarkupEncoding;

namespace {

constexpr int kNone = 0;
constexpr int kError = -1;
constexpr int kUTF8 = 1;
constexpr int kUTF16LE = 2;
constexpr int kLatin1 = 10;
constexpr int kShiftJIS = 20;

struct Case {
    const char* what;
    std::string bytes;
    int encoding;
    std::string text;
};

std::string named(const testing::TestParamInfo<Case>& info) {
    return info.param.what;
}

class MarkupEncodings : public testing::TestWithParam<Case> {};

const Case kCases[] = {
    {"AMarkBeforeAnythingElse", std::string("\xFF\xFE<\0a\0>\0", 8), kLatin1, "<a>"},
    {"AMarkOfUTF8", "\xEF\xBB\xBF<a>", kNone, "<a>"},
    {"UTF16ByNumber", std::string("<\0a\0>\0", 6), kUTF16LE, "<a>"},
    {"Latin1AsWindows", "<a>\xE9\x80", kLatin1, "<a>\xC3\xA9\xE2\x82\xAC"},
    {"ShiftJIS", "<a>\x93\xFA", kShiftJIS, "<a>\xE6\x97\xA5"},
    {"ADeclaredNameWithoutANumber", "<?xml version='1.0' encoding = 'koi8-r'?><a>\xC1", kError,
     "<?xml version='1.0' encoding = 'koi8-r'?><a>\xD0\xB0"},
    {"ADeclaredLatin1AsWindows", "<?xml encoding=\"iso-8859-1\"?><a>\x80", kNone,
     "<?xml encoding=\"iso-8859-1\"?><a>\xE2\x82\xAC"},
    {"TheNumberBeforeTheDeclaration", "<?xml encoding=\"koi8-r\"?><a>\xE9", kLatin1,
     "<?xml encoding=\"koi8-r\"?><a>\xC3\xA9"},
    {"APagesDeclaration", "<html><META charset=windows-1251><p>\xE0", kError,
     "<html><META charset=windows-1251><p>\xD0\xB0"},
    {"AnOlderPagesDeclaration",
     "<meta http-equiv=content-type content='text/html; charset=windows-1251'>\xE0", kNone,
     "<meta http-equiv=content-type content='text/html; charset=windows-1251'>\xD0\xB0"},
    {"AWideDeclarationThatCanBeReadAsNone", "<?xml encoding=\"utf-16\"?><a>\xC3\xA9", kNone,
     "<?xml encoding=\"utf-16\"?><a>\xC3\xA9"},
    {"UTF8WithoutAWord", "<a>\xC3\xA9", kNone, "<a>\xC3\xA9"},
    {"WhatIsNoTextAsTheReplacement", "<a>\xE9", kUTF8, "<a>\xEF\xBF\xBD"},
};

TEST_P(MarkupEncodings, AreFound) {
    const MarkupEncoding::Text text = MarkupEncoding::toUTF8(GetParam().bytes, GetParam().encoding);
    EXPECT_TRUE(text.isUTF8);
    EXPECT_EQ(text.bytes, GetParam().text);
}

INSTANTIATE_TEST_SUITE_P(Of, MarkupEncodings, testing::ValuesIn(kCases), named);

}  // namespace

TEST(MarkupEncoding, LeavesBytesOfNoKnownEncoding) {
    for (const int encoding : {kNone, kError, 6, 99}) {
        const MarkupEncoding::Text text = MarkupEncoding::toUTF8("<a>\xE9", encoding);
        EXPECT_FALSE(text.isUTF8) << encoding;
        EXPECT_EQ(text.bytes, "<a>\xE9") << encoding;
    }
}

TEST(MarkupEncoding, LooksForADeclarationOnlyAtTheStart) {
    const std::string padding(2000, ' ');
    EXPECT_EQ(MarkupEncoding::getDeclared(padding + "<meta charset=x>"), "");
    EXPECT_EQ(MarkupEncoding::getDeclared("<meta charset=x>" + padding), "x");
}
