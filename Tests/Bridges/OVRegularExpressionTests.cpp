#include <Orvane/OVException.h>
#include <Orvane/OVRegularExpression.h>

#include "Support/Language.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

namespace {

using Expression = OVRegularExpression;
using Error = std::optional<OVError>;

/// ICU's U_REGEX_INVALID_STATE and U_INDEX_OUTOFBOUNDS_ERROR.
constexpr int kNoText = 66306;
constexpr int kOutOfBounds = 8;

OVRange range(std::int64_t location, std::int64_t length) {
    return {location, length};
}

/// The texts of all matches in a text, with blanks in between.
std::string matchesIn(const std::string& pattern, const std::string& text,
                      std::uint32_t options = Expression::None) {
    Expression expression(pattern, options);
    EXPECT_TRUE(expression.setSearchString(text));
    std::string all;
    while (const std::optional<std::string> match = expression.nextMatch()) {
        all += (all.empty() ? "" : " ") + *match;
    }
    EXPECT_EQ(expression.lastError(), 0);
    return all;
}

}  // namespace

TEST(OVRegularExpression, MatchesAWholeText) {
    Expression expression("a+b");
    EXPECT_TRUE(expression.setSearchString("aab"));
    EXPECT_TRUE(expression.matches());
    EXPECT_EQ(expression.lastError(), 0);
    EXPECT_FALSE(expression.matchesString("aabc"));
    EXPECT_EQ(expression.lastError(), 0) << "not to match is no error";
    EXPECT_TRUE(expression.matchesString("ab"));
}

TEST(OVRegularExpression, MatchesFromAPlaceOn) {
    Expression expression("a+b");
    ASSERT_TRUE(expression.setSearchString("xxaab"));
    EXPECT_FALSE(expression.matches());
    EXPECT_FALSE(expression.matchesFrom(1));
    EXPECT_TRUE(expression.matchesFrom(2));
    EXPECT_EQ(expression.rangeOfMatchedGroup(0), range(2, 3));
    EXPECT_TRUE(expression.matchesFrom(3));
    for (const std::int64_t outside : {6, -1}) {
        EXPECT_FALSE(expression.matchesFrom(outside));
        EXPECT_EQ(expression.lastError(), kOutOfBounds) << outside;
    }
}

TEST(OVRegularExpression, FindsOneMatchAfterTheOther) {
    Expression expression("[0-9]+");
    ASSERT_TRUE(expression.setSearchString("a12b3"));
    EXPECT_EQ(expression.rangeOfNextMatch(), range(1, 2));
    EXPECT_EQ(expression.nextMatch(), "3");
    EXPECT_FALSE(expression.rangeOfNextMatch().isFound());
    EXPECT_EQ(expression.nextMatch(), std::nullopt);
    EXPECT_EQ(expression.lastError(), 0);
    expression.resetMatches();
    EXPECT_EQ(expression.nextMatch(), "12");
}

TEST(OVRegularExpression, SaysThatNothingIsFoundByTheLargestLocation) {
    Expression expression("a");
    ASSERT_TRUE(expression.setSearchString("b"));
    EXPECT_EQ(expression.rangeOfNextMatch(), range(INT64_MAX, 0));
    EXPECT_EQ(expression.rangeOfMatchedGroup(0), range(INT64_MAX, 0));
    EXPECT_EQ(OVRange::kNotFound, INT64_MAX);
}

TEST(OVRegularExpression, GivesTheGroupsOfTheLastMatch) {
    Expression expression("(\\w+)@(\\w+)|(!)");
    ASSERT_TRUE(expression.setSearchString("to me@here !"));
    EXPECT_EQ(expression.nextMatch(), "me@here");
    EXPECT_EQ(expression.rangeOfMatchedGroup(1), range(3, 2));
    EXPECT_EQ(expression.matchedGroup(1), "me");
    EXPECT_EQ(expression.matchedGroup(2), "here");
    EXPECT_EQ(expression.matchedGroup(3), std::nullopt) << "it has no part in the match";
    EXPECT_EQ(expression.lastError(), 0);
    EXPECT_EQ(expression.matchedGroup(4), std::nullopt);
    EXPECT_EQ(expression.lastError(), kOutOfBounds);
    EXPECT_EQ(expression.nextMatch(), "!");
    EXPECT_EQ(expression.lastError(), 0) << "the error is that of the last operation";
    EXPECT_EQ(expression.matchedGroup(3), "!");
    EXPECT_EQ(expression.matchedGroup(1), std::nullopt);
}

TEST(OVRegularExpression, FindsEmptyMatches) {
    Expression expression("x*");
    ASSERT_TRUE(expression.setSearchString("ax"));
    EXPECT_EQ(expression.rangeOfNextMatch(), range(0, 0));
    EXPECT_EQ(expression.rangeOfNextMatch(), range(1, 1));
    EXPECT_EQ(expression.nextMatch(), "");
    EXPECT_EQ(expression.nextMatch(), std::nullopt);
}

TEST(OVRegularExpression, CountsBytesOfUTF8) {
    const std::string text = "caf\xC3\xA9 \xF0\x9F\x98\x80 ok";
    Expression expression("o.");
    ASSERT_TRUE(expression.setSearchString(text));
    const OVRange found = expression.rangeOfNextMatch();
    EXPECT_EQ(found, range(11, 2));
    EXPECT_EQ(text.substr(11, 2), "ok");
    EXPECT_EQ(matchesIn("[^a-z ]", text), "\xC3\xA9 \xF0\x9F\x98\x80");
    EXPECT_EQ(matchesIn("\xC3\x89", text, Expression::CaseInsensitive), "\xC3\xA9");
}

TEST(OVRegularExpression, TakesBrokenTextsForReplacementCharacters) {
    EXPECT_EQ(matchesIn("\\x{FFFD}", "a\xFFz"), "\xFF");
    EXPECT_EQ(matchesIn("z", "a\xFFz\xC3"), "z");
    EXPECT_EQ(matchesIn("b", std::string("a\0b", 3)), "b");
}

TEST(OVRegularExpression, NeedsATextToSearch) {
    Expression expression("a");
    EXPECT_FALSE(expression.matches());
    EXPECT_EQ(expression.lastError(), kNoText);
    EXPECT_FALSE(expression.matchesFrom(0));
    EXPECT_FALSE(expression.rangeOfNextMatch().isFound());
    EXPECT_EQ(expression.lastError(), kNoText);
    EXPECT_EQ(expression.matchedGroup(0), std::nullopt);
    EXPECT_EQ(expression.lastError(), kNoText);
    expression.resetMatches();
    EXPECT_EQ(expression.lastError(), kNoText);
    EXPECT_TRUE(expression.setSearchString(""));
    EXPECT_EQ(expression.lastError(), 0);
    EXPECT_FALSE(expression.matches());
}

TEST(OVRegularExpression, SearchesTheLastTextAlone) {
    Expression expression("[a-z]+");
    ASSERT_TRUE(expression.setSearchString(std::string(10000, 'a') + " b"));
    EXPECT_EQ(expression.rangeOfNextMatch(), range(0, 10000));
    std::string second = "1 other";
    ASSERT_TRUE(expression.setSearchString(second));
    second.assign("xxxxxxx");
    EXPECT_EQ(expression.rangeOfMatchedGroup(0), OVRange()) << "the last match is forgotten";
    EXPECT_EQ(expression.nextMatch(), "other");
    EXPECT_EQ(expression.nextMatch(), std::nullopt);
}

TEST(OVRegularExpression, IsCopiedWithoutItsText) {
    Expression expression("(A)b", Expression::CaseInsensitive);
    ASSERT_TRUE(expression.matchesString("ab"));
    const std::unique_ptr<Expression> copy = expression.copy();
    ASSERT_TRUE(copy);
    EXPECT_FALSE(copy->matches());
    EXPECT_EQ(copy->lastError(), kNoText);
    EXPECT_TRUE(copy->matchesString("aB"));
    EXPECT_EQ(copy->matchedGroup(1), "a");
    EXPECT_EQ(expression.rangeOfMatchedGroup(0), range(0, 2)) << "the two are apart";
}

TEST(OVRegularExpression, ReadsItsPatternAsItsOptionsSay) {
    EXPECT_EQ(matchesIn("A", "aA"), "A");
    EXPECT_EQ(matchesIn("A", "aA", Expression::CaseInsensitive), "a A");
    EXPECT_EQ(matchesIn("^b", "a\nb"), "");
    EXPECT_EQ(matchesIn("^b", "a\nb", Expression::Multiline), "b");
    EXPECT_EQ(matchesIn("a.b", "a\nb"), "");
    EXPECT_EQ(matchesIn("a.b", "a\nb", Expression::DotMatchesLineEnds), "a\nb");
    EXPECT_EQ(matchesIn("a # b", "a", Expression::Comments), "a");
    EXPECT_EQ(matchesIn(".", "a.b", Expression::Literal), ".");
    EXPECT_EQ(matchesIn("a.", "a\r", Expression::UnixLines), "a\r");
    EXPECT_EQ(
        matchesIn("A.B", "a\nb", Expression::CaseInsensitive | Expression::DotMatchesLineEnds),
        "a\nb");
    EXPECT_FALSE(
        Expression::regularExpressionWithPattern("\\y", Expression::ErrorOnUnknownEscapes));
}

TEST(OVRegularExpression, TellsWhereAPatternIsWrong) {
    Error error;
    EXPECT_FALSE(Expression::regularExpressionWithPattern("ab\n(c", Expression::Comments, &error));
    ASSERT_TRUE(error);
    EXPECT_EQ(error->domain(), "OVRegularExpression");
    EXPECT_EQ(error->code(), 66310) << "mismatched parentheses";
    EXPECT_EQ(error->description(), "Regular expression syntax error");
    EXPECT_EQ(error->userInfo(),
              (std::map<std::string, int>{{"ErrorLine", 2}, {"ErrorPosition", 2}}));
    EXPECT_FALSE(Expression::regularExpressionWithPattern("[a", 0));
}

TEST(OVRegularExpression, TellsOfAWrongPatternInTheUsersLanguage) {
    const Support::Language german("de");
    Error error;
    EXPECT_FALSE(Expression::regularExpressionWithPattern("(", 0, &error));
    EXPECT_EQ(error->description(), "Syntaxfehler in einem regul\xC3\xA4ren Ausdruck");
}

TEST(OVRegularExpression, ClearsTheErrorOfAnEarlierPattern) {
    Error error = OVError("x", 1);
    EXPECT_TRUE(Expression::regularExpressionWithPattern("a", 0, &error));
    EXPECT_FALSE(error);
}

TEST(OVRegularExpression, CannotBeConstructedOfAWrongPattern) {
    try {
        const Expression expression("a(");
        FAIL() << "should have thrown";
    } catch (const OVException& exception) {
        EXPECT_STREQ(exception.what(), "Regular expression syntax error");
        ASSERT_TRUE(exception.error());
        EXPECT_EQ(exception.error()->domain(), OVRegularExpressionErrorDomain);
        EXPECT_EQ(exception.error()->userInfo().at("ErrorPosition"), 2);
    }
}

TEST(OVRegularExpression, HasAPatternOfAtMost1023Units) {
    const Support::LogCapture log;
    Expression longest(std::string(1023, 'a'));
    EXPECT_TRUE(longest.matchesString(std::string(1023, 'a')));
    EXPECT_THROW(Expression(std::string(1024, 'a')), OVException);
    EXPECT_THROW(Expression::regularExpressionWithPattern(std::string(1024, 'a')), OVException);
    EXPECT_THROW(Expression::regularExpressionWithPattern(""), OVException);
    EXPECT_EQ(log.count("length>0 && length<1024"), 3);
}

TEST(OVRegularExpression, CountsUTF16UnitsOfItsPattern) {
    const Support::LogCapture log;
    std::string pattern;
    for (int i = 0; i < 511; ++i) {
        pattern += "\xF0\x9F\x98\x80";
    }
    EXPECT_TRUE(Expression(pattern + "a").matchesString(pattern + "a"));
    EXPECT_THROW(Expression(pattern + "aa"), OVException);
}

TEST(OVRegularExpression, SearchesTextsOfAnyLength) {
    Expression expression("b");
    ASSERT_TRUE(expression.setSearchString(std::string(1000000, 'a') + "b"));
    EXPECT_EQ(expression.rangeOfNextMatch(), range(1000000, 1));
}
