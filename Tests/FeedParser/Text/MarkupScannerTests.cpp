#include "FeedParser/Text/MarkupScanner.h"

#include <gtest/gtest.h>

#include <string>

using namespace Orvane::FeedParser;

namespace {

/// The pieces, a letter for the kind of each: "t(text) s(name|attributes) ..."
std::string scan(std::string_view markup, MarkupScanner::Language language) {
    MarkupScanner scanner(markup, language);
    MarkupToken token;
    std::string result;
    while (scanner.next(token)) {
        result += "tsedci!"[static_cast<int>(token.kind)];
        const bool isTag = !token.name.empty();
        result += '(' + std::string(isTag ? token.name : token.whole);
        if (token.kind == MarkupToken::Kind::StartTag) result += '|' + std::string(token.content);
        result += token.isEmpty ? "/)" : ")";
    }
    return result;
}

std::string scanXML(std::string_view markup) {
    return scan(markup, MarkupScanner::Language::XML);
}

std::string scanHTML(std::string_view markup) {
    return scan(markup, MarkupScanner::Language::HTML);
}

std::string attributes(std::string_view text) {
    AttributeScanner scanner(text);
    std::string_view name, value;
    std::string result;
    while (scanner.next(name, value))
        result += std::string(name) + "=[" + std::string(value) + "]";
    return result;
}

}  // namespace

TEST(MarkupScanner, TakesMarkupApart) {
    EXPECT_EQ(scanXML("a<b c='d'>e</b><f/>"), "t(a)s(b| c='d')t(e)e(b)s(f|/)");
    EXPECT_EQ(scanXML("<?x y?><!-- > --><!DOCTYPE a><![CDATA[<b>]]>"),
              "i(<?x y?>)c(<!-- > -->)!(<!DOCTYPE a>)d(<![CDATA[<b>]]>)");
    EXPECT_EQ(scanXML("<!DOCTYPE a [<!ENTITY b 'c'>]>d"), "!(<!DOCTYPE a [<!ENTITY b 'c'>]>)t(d)");
}

TEST(MarkupScanner, TakesALoneBracketForText) {
    EXPECT_EQ(scanXML("a < b <3 </ <"), "t(a < b <3 </ <)");
    EXPECT_EQ(scanHTML("<_a <\xC3\xA9>"), "t(<_a <\xC3\xA9>)");
    EXPECT_EQ(scanXML("<_a>"), "s(_a|)");
}

TEST(MarkupScanner, ReadsOverQuotedBrackets) {
    EXPECT_EQ(scanHTML("<a b=\"x>y\" c = '>'>z"), "s(a| b=\"x>y\" c = '>')t(z)");
    EXPECT_EQ(scanHTML("<a b=x\"y>z\""), "s(a| b=x\"y)t(z\")");
    EXPECT_EQ(scanHTML("<a b=\"x>z"), "s(a| b=\"x)t(z)");
}

TEST(MarkupScanner, EndsWithTheMarkupWhatIsNotComplete) {
    EXPECT_EQ(scanHTML("<a b"), "s(a| b)");
    EXPECT_EQ(scanXML("<a <b>"), "s(a| )s(b|)");
    EXPECT_EQ(scanXML("<!-- a<b>"), "c(<!--)t( a)s(b|)");
    EXPECT_EQ(scanXML("<![CDATA[a<b>"), "d(<![CDATA[)t(a)s(b|)");
    EXPECT_EQ(scanXML("<?a b>c"), "i(<?a b>)t(c)");
}

TEST(MarkupScanner, PassesOverRawText) {
    const std::string_view markup = "<script>a</b></scripts></SCRIPT >c";
    MarkupScanner scanner(markup, MarkupScanner::Language::HTML);
    MarkupToken token;
    scanner.next(token);
    EXPECT_EQ(scanner.skipRawText("script"), "a</b></scripts>");
    scanner.next(token);
    EXPECT_EQ(token.whole, "</SCRIPT >");
    scanner.next(token);
    EXPECT_EQ(scanner.skipRawText("script"), "");
    EXPECT_FALSE(scanner.next(token));
}

TEST(AttributeScanner, ReadsEveryFormOfAttribute) {
    EXPECT_EQ(attributes(" a=\"b c\" d='e' f=g h = i j k/l"), "a=[b c]d=[e]f=[g]h=[i]j=[]k=[]l=[]");
    EXPECT_EQ(attributes("a= b=\"c"), "a=[b=\"c]");
    EXPECT_EQ(attributes(" = / > "), "");
}
