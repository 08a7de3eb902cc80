#include "Foundation/DateTokens.h"

#include <gtest/gtest.h>

#include <string>

using namespace Foundation;

namespace {

constexpr std::size_t kZoneNameSize = 16;

/// The tokens of a text as "class:value", or "class" alone where the value is 0; "failed" if there
/// are none. What zone the text names follows in braces.
std::string tokensOf(std::string_view text, std::size_t zoneNameSize = kZoneNameSize) {
    DateTokens tokens;
    char zoneName[kZoneNameSize] = {};
    if (!tokens.read(text, zoneName, zoneNameSize)) return "failed";
    std::string list;
    for (std::size_t i = 0; i < tokens.count() && i < DateTokens::kCapacity; ++i) {
        if (i > 0) list += ' ';
        list += std::to_string(static_cast<int>(tokens.at(i).kind));
        if (tokens.at(i).value != 0) list += ':' + std::to_string(tokens.at(i).value);
    }
    if (zoneName[0] != '\0') list += std::string(" {") + zoneName + "}";
    return list;
}

struct Read {
    const char* text;
    const char* tokens;
};
class DateText : public testing::TestWithParam<Read> {};

}  // namespace

TEST_P(DateText, IsReadAsTokens) {
    EXPECT_EQ(tokensOf(GetParam().text), GetParam().tokens) << GetParam().text;
}

INSTANTIATE_TEST_SUITE_P(
    Numbers, DateText,
    testing::Values(Read{"", ""}, Read{" \t\n\v\f\r", ""}, Read{"12", "2:12"}, Read{"007", "2:7"},
                    Read{"0", "2"}, Read{"+5", "3:5"}, Read{"-5", "3:-5"}, Read{"+0", "3"},
                    Read{"-0", "16"}, Read{"-00", "16"}, Read{"-", "14"}, Read{"/", "14"},
                    Read{"+", "15"}, Read{"- 5", "14 2:5"},
                    // Of two signs the first counts, and a third is one of its own.
                    Read{"-+5", "3:-5"}, Read{"+-5", "3:5"}, Read{"--", "14"}, Read{"---", "14 14"},
                    Read{"---5", "14 3:-5"}, Read{"+-", "15"},
                    Read{"2005-10-12", "2:2005 3:-10 3:-12"}, Read{"/-0", "14 16"}));

INSTANTIATE_TEST_SUITE_P(Overflow, DateText,
                         testing::Values(Read{"2147483648", "2:-2147483648"},
                                         Read{"4294967296", "2"}, Read{"4294967297", "2:1"},
                                         Read{"-2147483648", "3:-2147483648"},
                                         Read{"-4294967296", "16"},
                                         Read{"99999999999999999999", "2:1661992959"}));

INSTANTIATE_TEST_SUITE_P(Words, DateText,
                         testing::Values(Read{"jan", "8:1"}, Read{"TUES", "1:2"},
                                         Read{"tuesdays", "1:2"}, Read{"months", "10:1"},
                                         Read{"this", "-1"}, Read{"S", "-1"}, Read{"A.M.", "5"},
                                         Read{"p.m.", "5:12"}, Read{"Jan.", "8:1"},
                                         Read{"J.a.n", "8:1"}, Read{"abcdefghijk", "-1"},
                                         Read{"septembers", "8:9"}, Read{"septemberss", "-1"},
                                         Read{"S.e.p.t.e.m.b.e.r.s...........", "8:9"},
                                         Read{"T", "17"}, Read{"1st", "2:1 13"},
                                         Read{"next week", "-1 9:604800"}, Read{"T18", "17 2:18"}));

INSTANTIATE_TEST_SUITE_P(Dots, DateText,
                         testing::Values(Read{".", "12"}, Read{"..", "12"}, Read{".25", "12 2:25"},
                                         Read{".Jan", "12"}, Read{"1.2.3", "2:1 12 2:2 12 2:3"},
                                         Read{"2.Jan.4", "2:2 12 2:4"}));

INSTANTIATE_TEST_SUITE_P(Marks, DateText,
                         testing::Values(Read{",", "11"}, Read{":", "4"}, Read{"#", "-1:35"},
                                         Read{")", "-1:41"}, Read{"\\", "-1:92"},
                                         Read{"\xc3\xa4", "-1:195 -1:164"}, Read{"\x01", "-1:1"},
                                         Read{"1:2,3", "2:1 4 2:2 11 2:3"}));

INSTANTIATE_TEST_SUITE_P(
    Comments, DateText,
    testing::Values(Read{"(a) 5", "2:5"}, Read{"(a (b) c) 5", "2:5"}, Read{"5(a)6", "2:5 2:6"},
                    Read{"(a \\) b) 5", "2:5"}, Read{"(\\() 5", "2:5"}, Read{"(\n) 5", "2:5"},
                    Read{"(\\\r) 5", "2:5"}, Read{"(GMT) 5", "2:5"}, Read{"(", "failed"},
                    Read{"(a", "failed"}, Read{"((a)", "failed"}, Read{"(a\r)", "failed"},
                    Read{"(a\\", "failed"}, Read{"(a\\)", "failed"}, Read{"5 (a", "failed"}));

INSTANTIATE_TEST_SUITE_P(
    Zones, DateText,
    testing::Values(Read{"gmt", "6 {GMT}"}, Read{"G.M.T.", "6 {GMT}"}, Read{"z", "6 {Z}"},
                    Read{"BST", "7 {BST}"}, Read{"CES", "7:-60 {CES}"},
                    Read{"est pdt", "6:300 7:480 {PDT}"},
                    // The plural is looked up as its singular, but named as it stands.
                    Read{"ESTS", "6:300 {ESTS}"},
                    // Digits end a word, so the names with a number in them are never whole.
                    Read{"EST5EDT", "6:300 2:5 7:300 {EDT}"}, Read{"Jan", "8:1"}));

TEST(DateTokens, CutAZoneNameToItsBuffer) {
    EXPECT_EQ(tokensOf("AKST", 5), "6:560 {AKST}");
    EXPECT_EQ(tokensOf("AKST", 4), "6:560 {AKS}");
    EXPECT_EQ(tokensOf("AKST", 1), "6:560");
    EXPECT_EQ(tokensOf("AKST", 0), "6:560");
}

TEST(DateTokens, NameAZoneEvenWhereTheTextFails) {
    DateTokens tokens;
    char zoneName[kZoneNameSize] = {};
    EXPECT_FALSE(tokens.read("5 GMT (", zoneName, sizeof zoneName));
    EXPECT_STREQ(zoneName, "GMT");
}

TEST(DateTokens, CountWhatTheyDoNotKeep) {
    std::string text;
    for (std::size_t i = 0; i < DateTokens::kCapacity; ++i)
        text += ", ";
    DateTokens tokens;
    char zoneName[kZoneNameSize] = {};
    ASSERT_TRUE(tokens.read(text, zoneName, sizeof zoneName));
    EXPECT_EQ(tokens.count(), DateTokens::kCapacity);
    EXPECT_TRUE(tokens.isComplete());
    ASSERT_TRUE(tokens.read(text + "5 GMT", zoneName, sizeof zoneName));
    EXPECT_EQ(tokens.count(), DateTokens::kCapacity + 2);
    EXPECT_FALSE(tokens.isComplete());
    EXPECT_STREQ(zoneName, "GMT");
    EXPECT_FALSE(tokens.read(text + "(", zoneName, sizeof zoneName));
}
