#include "Foundation/StringComparison.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Ref.h"
#include "Foundation/String.h"

#include <gtest/gtest.h>

#include <ostream>

using namespace Foundation;

namespace Foundation {

void PrintTo(const TextRange& range, std::ostream* out) {
    *out << "{" << range.start << ", " << range.length << "}";
}

}  // namespace Foundation

namespace {

constexpr auto kExactly = CompareOptions::None;
constexpr auto kNoCase = CompareOptions::CaseInsensitive;
constexpr auto kNoDiacritics = CompareOptions::DiacriticInsensitive;
constexpr auto kNumeric = CompareOptions::Numeric;

// "é" as one character, and as a letter with a mark.
#define E_ACUTE "\xC3\xA9"
#define E_AND_ACUTE "e\xCC\x81"

int compare(const char* a, const char* b, CompareOptions options) {
    const AutoreleasePool pool;
    const int forward = Compare(String::string(a), String::string(b), options);
    EXPECT_EQ(Compare(String::string(b), String::string(a), options), -forward);
    return forward;
}

std::optional<TextRange> find(const char* text, const char* word, CompareOptions options,
                              bool wholeWord) {
    const AutoreleasePool pool;
    return Ref<String>(String::string(text))->findWord(String::string(word), options, wholeWord);
}

}  // namespace

TEST(Compare, PutsNullFirst) {
    EXPECT_EQ(compare(nullptr, nullptr, kExactly), 0);
    EXPECT_EQ(compare(nullptr, "", kNoCase), -1);
}

TEST(Compare, OrdersByCodePoint) {
    EXPECT_EQ(compare("a", "a", kExactly), 0);
    EXPECT_EQ(compare("B", "a", kExactly), -1);
    EXPECT_EQ(compare("a", "ab", kExactly), -1);
    EXPECT_EQ(compare("z", E_ACUTE, kExactly), -1);
    EXPECT_EQ(compare(E_ACUTE, E_AND_ACUTE, kExactly), 1);
    // U+FFFD is before U+1F600, though not in UTF-16.
    EXPECT_EQ(compare("\xEF\xBF\xBD", "\xF0\x9F\x98\x80", kExactly), -1);
}

TEST(Compare, OverlooksCase) {
    EXPECT_EQ(compare("JavaScript", "javascript", kNoCase), 0);
    EXPECT_EQ(compare("STRASSE",
                      "stra\xC3\x9F"
                      "e",
                      kNoCase),
              0);
    EXPECT_EQ(compare("B", "a", kNoCase), 1);
    EXPECT_EQ(compare("e", E_ACUTE, kNoCase), -1);
}

TEST(Compare, OverlooksDiacritics) {
    EXPECT_EQ(compare(E_ACUTE, "e", kNoDiacritics), 0);
    EXPECT_EQ(compare(E_AND_ACUTE, "e", kNoDiacritics), 0);
    EXPECT_NE(compare("E", "e", kNoDiacritics), 0);
    EXPECT_EQ(compare("E", E_ACUTE, kNoDiacritics | kNoCase), 0);
    EXPECT_EQ(compare("f", E_ACUTE, kNoDiacritics | kNoCase), 1);
}

TEST(Compare, OrdersByNumbers) {
    EXPECT_EQ(compare("part 9", "part 10", kNumeric), -1);
    EXPECT_EQ(compare("part 9", "part 10", kExactly), 1);
    EXPECT_EQ(compare("Part 9", "part 10", kNumeric | kNoCase), -1);
    EXPECT_EQ(compare("Part 9", "part 9", kNumeric | kNoCase), 0);
    EXPECT_NE(compare("Part 9", "part 9", kNumeric), 0);
}

TEST(FindWord, FindsTheFirstPlace) {
    EXPECT_EQ(find("one two two", "two", kExactly, false), (TextRange{4, 3}));
    EXPECT_EQ(find("one two", "three", kExactly, false), std::nullopt);
    EXPECT_EQ(find("two", "two", kExactly, true), (TextRange{0, 3}));
}

TEST(FindWord, FindsWholeWordsIfTold) {
    EXPECT_EQ(find("cathode cat", "cat", kExactly, false), (TextRange{0, 3}));
    EXPECT_EQ(find("cathode cat", "cat", kExactly, true), (TextRange{8, 3}));
    EXPECT_EQ(find("concatenate", "cat", kExactly, true), std::nullopt);
    EXPECT_EQ(find("(cat)", "cat", kExactly, true), (TextRange{1, 3}));
    EXPECT_EQ(find("the black cat sat", "black cat", kExactly, true), (TextRange{4, 9}));
}

TEST(FindWord, CountsInCharacters) {
    EXPECT_EQ(find("\xF0\x9F\x98\x80 " E_ACUTE " cat", "cat", kExactly, true), (TextRange{4, 3}));
    EXPECT_EQ(find("a \xF0\x9F\x98\x80\xF0\x9F\x98\x80", "\xF0\x9F\x98\x80\xF0\x9F\x98\x80",
                   kExactly, false),
              (TextRange{2, 2}));
}

TEST(FindWord, OverlooksWhatItIsTold) {
    EXPECT_EQ(find("a Cat", "cat", kExactly, true), std::nullopt);
    EXPECT_EQ(find("a Cat", "cAT", kNoCase, true), (TextRange{2, 3}));
    EXPECT_EQ(find("caf" E_ACUTE, "cafe", kNoCase, true), std::nullopt);
    EXPECT_EQ(find("Caf" E_ACUTE, "cafe", kNoDiacritics, true), std::nullopt);
    EXPECT_EQ(find("caf" E_ACUTE, "cafe", kNoDiacritics, true), (TextRange{0, 4}));
    EXPECT_EQ(find("Caf" E_AND_ACUTE, "cafe", kNoDiacritics | kNoCase, true), (TextRange{0, 5}));
}

TEST(FindWord, TakesEquivalentCharactersForTheSame) {
    EXPECT_EQ(find("caf" E_AND_ACUTE " x", "caf" E_ACUTE, kExactly, true), (TextRange{0, 5}));
    EXPECT_EQ(find("caf" E_AND_ACUTE, "cafe", kExactly, false), std::nullopt);
}

TEST(FindWord, FindsNothingInOrByNothing) {
    EXPECT_EQ(find("text", "", kExactly, false), std::nullopt);
    EXPECT_EQ(find("text", nullptr, kExactly, false), std::nullopt);
    EXPECT_EQ(find("", "text", kExactly, true), std::nullopt);
    // Collation passes over control characters altogether.
    EXPECT_EQ(find("text", "\x01", kExactly, false), std::nullopt);
}
