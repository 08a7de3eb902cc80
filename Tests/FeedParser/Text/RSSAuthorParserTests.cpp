#include "FeedParser/Text/RSSAuthorParser.h"

#include "Foundation/AutoreleasePool.h"

#include <gtest/gtest.h>

using namespace Foundation;
using Orvane::RSSAuthorParser;

namespace {

struct Line {
    const char* text;
    const char* name;   ///< null for none
    const char* email;  ///< null for none
};

class AuthorLines : public testing::TestWithParam<Line> {};

std::string textOf(const String* text) {
    return text ? text->utf8() : "(null)";
}

std::string textOf(const char* text) {
    return text ? text : "(null)";
}

}  // namespace

TEST_P(AuthorLines, AreSplit) {
    const Ref<String> text = String::string(GetParam().text);
    const RSSAuthorParser author(text);
    EXPECT_EQ(textOf(author.name), textOf(GetParam().name));
    EXPECT_EQ(textOf(author.email), textOf(GetParam().email));
}

INSTANTIATE_TEST_SUITE_P(
    RSSAuthorParser, AuthorLines,
    testing::Values(
        Line{"", nullptr, nullptr}, Line{" \t\n\v\f\r ", nullptr, nullptr},
        // The four forms.
        Line{"joe@example.com (Joe Doe)", "Joe Doe", "joe@example.com"},
        Line{"Joe Doe <joe@example.com>", "Joe Doe", "joe@example.com"},
        Line{"\"Doe, Joe\" <joe@example.com>", "Doe, Joe", "joe@example.com"},
        Line{"Joe Q. Doe", "Joe Q. Doe", nullptr},
        Line{"joe@example.com", nullptr, "joe@example.com"},
        // What makes a word an address.
        Line{"joe@home", "joe@home", nullptr}, Line{"joe@home.", "joe@home.", nullptr},
        Line{"joe@home.x", nullptr, "joe@home.x"}, Line{"joe.doe", "joe.doe", nullptr},
        Line{"a.b@c", "a.b@c", nullptr}, Line{"@.x", nullptr, "@.x"},
        Line{"joe@a@b.c", nullptr, "joe@a@b.c"}, Line{"joe@a..", nullptr, "joe@a.."},
        Line{"joe at home dot org", "joe at home dot org", nullptr},
        Line{"joe@home. org", "joe@home. org", nullptr},
        // Parentheses.
        Line{"joe@a.b (Joe (the) Doe)", "Joe (the) Doe", "joe@a.b"},
        Line{"(((x)))", "((x))", nullptr}, Line{"(Joe", "Joe", nullptr},
        Line{"(a)b) c", "ab) c", nullptr}, Line{"Joe(Doe)", "DoeJoe", nullptr},
        Line{"Joe(Doe) x", "DoeJoe x", nullptr}, Line{"joe@a.b(Joe)", nullptr, "joe@a.b(Joe)"},
        // Brackets and quotes.
        Line{"<joe@a.b", nullptr, "joe@a.b"}, Line{"< jo e@a.b >", nullptr, "joe@a.b"},
        Line{"<not an address>", nullptr, "notanaddress"}, Line{"\"Joe", "Joe", nullptr},
        Line{"\"joe@a.b\"", "joe@a.b", nullptr}, Line{"joe@a.b <c@d.e>", nullptr, "joe@a.b c@d.e"},
        Line{"joe@a.b c@d.e", nullptr, "joe@a.b c@d.e"}, Line{"<a>b", "b", "a"},
        // Blanks.
        Line{"  Joe \t\n Doe  ", "Joe Doe", nullptr}, Line{"Joe\tDoe", "Joe\tDoe", nullptr},
        Line{"(Joe  Doe)", "Joe Doe", nullptr}, Line{"\" Joe \"", "Joe", nullptr},
        // Bytes beyond ASCII.
        Line{"j@a.b (J\xC3\xB6rg \xE6\x97\xA5)", "J\xC3\xB6rg \xE6\x97\xA5", "j@a.b"}));

TEST(RSSAuthorParser, FindsNothingInNull) {
    const RSSAuthorParser author(nullptr);
    EXPECT_EQ(author.name.get(), nullptr);
    EXPECT_EQ(author.email.get(), nullptr);
}

TEST(RSSAuthorParser, EndsAtAZeroByte) {
    const Ref<String> text = String::string(std::string("Joe\0Doe", 7));
    EXPECT_EQ(RSSAuthorParser(text).name->utf8(), "Joe");
}

TEST(RSSAuthorParser, TrimsItsOwnBlanks) {
    std::string text("\0\t\n\v\f\r a \0 b\r\f\v\n\t \0", 19);
    RSSAuthorParser::trim(text);
    EXPECT_EQ(text, std::string("a \0 b", 5));
    std::string blank(" \0", 2);
    RSSAuthorParser::trim(blank);
    EXPECT_EQ(blank, "");
}
