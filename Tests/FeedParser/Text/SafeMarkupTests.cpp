#include "FeedParser/Text/SafeMarkup.h"

#include "FeedParser/Text/HTMLSnippetTidier.h"
#include "FeedParser/Text/TidierAsked.h"
#include "FeedParser/Text/XMLSnippetTidier.h"
#include "Foundation/Ref.h"

#include <gtest/gtest.h>

#include <string>

using namespace Foundation;
using namespace Orvane::FeedParser;

namespace {

constexpr const char* kBase = "http://h/d/f";

/// What the pass makes of markup; checks that a second pass changes nothing.
std::string pass(const std::string& markup, const char* base = kBase) {
    const AutoreleasePool pool;
    const Ref<URL> url = base ? Ref<URL>(URL::url(String::string(base))) : Ref<URL>();
    const std::string safe = SafeMarkup::make(markup, url.get());
    EXPECT_EQ(SafeMarkup::make(safe, url.get()), safe);
    return safe;
}

std::string tidyHTML(const std::string& markup) {
    return TidierAsked<HTMLSnippetTidier>(kBase)(markup);
}

std::string tidyXML(const std::string& markup) {
    return TidierAsked<XMLSnippetTidier>(kBase)(markup);
}

struct Case {
    const char* what;
    std::string markup;
    std::string safe;
};

std::string named(const testing::TestParamInfo<Case>& info) {
    return info.param.what;
}

class Markup : public testing::TestWithParam<Case> {};

const Case kCases[] = {
    {"Text", "a &amp; &lt;b&gt; \xC3\xA9 &#160;\xC2\xA0 'c' \"d\"",
     "a &amp; &lt;b&gt; \xC3\xA9 &#160;&#160; 'c' \"d\""},
    {"Plain", "<p>a <b>b</b><br/><img alt=\"x\"/></p><i></i>",
     "<p>a <b>b</b><br /><img alt=\"x\" /></p><i></i>"},
    {"Scripts", "a<script>b</script><SCRIPT>c</SCRIPT><style>d</style>e", "ae"},
    {"Handlers", "<p onclick=\"a\" ONLOAD=\"b\" title=\"c\">d</p>", "<p title=\"c\">d</p>"},
    {"DataAttributes", "<p data-x=\"a\" contenteditable=\"\" tabindex=\"1\">d</p>", "<p>d</p>"},
    {"Links", "<a href=\"x\" target=\"_top\" ping=\"y\">a</a><a href=\"javascript:x\">b</a>",
     "<a href=\"http://h/d/x\">a</a><a>b</a>"},
    {"LinkElsewhere", "<p href=\"x\" cite=\"y\">a</p>", "<p cite=\"http://h/d/y\">a</p>"},
    {"Pictures", "<img src=\"x\" srcset=\"y 2x\" lowsrc=\"z\"/>",
     "<img src=\"http://h/d/x\" srcset=\"http://h/d/y 2x\" />"},
    {"Backgrounds",
     "<table background=\"x\"><tr><td background=\"javascript:x\">a</td></tr></table>",
     "<table background=\"http://h/d/x\"><tr><td>a</td></tr></table>"},
    {"Styles", "<p style=\"color:red;position:fixed\">a</p><p style=\"position:fixed\">b</p>",
     "<p style=\"color: red\">a</p><p>b</p>"},
    {"PlugIns",
     "<object data=\"x\"><param name=\"y\"/>a</object><embed src=\"x\"/><applet>b</applet>", "ab"},
    {"HeadOfAPage", "<base href=\"x\"/><meta content=\"y\"/><link href=\"z\"/><title>t</title>a",
     "a"},
    {"WholePages", "<html><head><title>t</title></head><body onload=\"x\"><p>a</p></body></html>",
     "<p>a</p>"},
    {"Forms",
     "<form action=\"x\"><label>a</label><input value=\"b\"/><input type=\"hidden\" value=\"c\"/>"
     "<button>d</button><textarea>e</textarea><select><option>f</option><option>g</option>"
     "</select><input type=\"submit\" value=\"h\"/><input type=\"password\" value=\"i\"/></form>",
     "<div><label>a</label>bdef g h</div>"},
    {"BoxesByPresence", "<input type=\"radio\" CHECKED=\"\"/><input type=\"radio\"/>",
     "<input type=\"radio\" checked=\"checked\" disabled=\"disabled\" />"
     "<input type=\"radio\" disabled=\"disabled\" />"},
    {"Boxes", "<input type=\"checkbox\" checked=\"checked\" onclick=\"x\"/>",
     "<input type=\"checkbox\" checked=\"checked\" disabled=\"disabled\" />"},
    {"ButtonsThatArePictures", "<input type=\"image\" src=\"x\" alt=\"y\"/>",
     "<img src=\"http://h/d/x\" alt=\"y\" />"},
    {"Frames",
     "<iframe src=\"//v/x?a&amp;b\" title=\"T\">z</iframe><iframe src=\"javascript:x\"/>"
     "<iframe srcdoc=\"&lt;script>\"/>",
     "<a href=\"http://v/x?a&amp;b\">T</a>"},
    {"FramesInLinks", "<a href=\"x\"><iframe src=\"y\"/></a>",
     "<a href=\"http://h/d/x\">http://h/d/y</a>"},
    {"LinksInLinks", "<a href=\"x\">a<b><a href=\"y\">b</a></b></a>",
     "<a href=\"http://h/d/x\">a<b>b</b></a>"},
    {"ElementsOfNoList", "<x-y onclick=\"a\">b<blink>c</blink><marquee>d</marquee></x-y>", "bcd"},
    {"Names", "<p id=\"a\" class=\" b  c \"><a name=\"tarnwick-rss-d\" href=\"#a\">e</a></p>",
     "<p id=\"tarnwick-rss-a\" class=\"tarnwick-rss-b tarnwick-rss-c\">"
     "<a name=\"tarnwick-rss-d\" href=\"#tarnwick-rss-a\">e</a></p>"},
    {"NamesOfWhatGoes", "<a href=\"#a\">b</a><script id=\"a\"/>",
     "<a href=\"http://h/d/f#a\">b</a>"},
    {"NamesThatComeLater",
     "<a href=\"#b\">c</a><map name=\"b\"/><img usemap=\"#b\"/><img usemap=\"#c\"/>",
     "<a href=\"#tarnwick-rss-b\">c</a><map name=\"tarnwick-rss-b\"></map>"
     "<img usemap=\"#tarnwick-rss-b\" /><img />"},
    {"AttributesTwice", "<p TITLE=\"a\" title=\"b\">c</p>", "<p title=\"a\">c</p>"},
    {"OtherNamespaces",
     "<x:p xmlns:x=\"urn:x\" onclick=\"y\">a<script "
     "xmlns=\"http://www.w3.org/1999/xhtml\">b</script></x:p>",
     "a"},
    {"XHTMLByPrefix", "<x:p xmlns:x=\"http://www.w3.org/1999/xhtml\">a<x:b>c</x:b></x:p>",
     "<p xmlns=\"http://www.w3.org/1999/xhtml\">a<b>c</b></p>"},
    {"ScriptsByPrefix", "<x:script xmlns:x=\"http://www.w3.org/1999/xhtml\">a</x:script>", ""},
    {"Comments", "a<!-- <script> --><?php b?><![CDATA[<script>]]>", "a&lt;script&gt;"},
    {"Films", "<video autoplay=\"x\" src=\"a\" poster=\"b\"><source src=\"c\"/></video>",
     "<video src=\"http://h/d/a\" poster=\"http://h/d/b\" controls=\"controls\">"
     "<source src=\"http://h/d/c\" /></video>"},
    {"Drawings",
     "<svg viewbox=\"0 0 1 1\" onload=\"x\"><g><path d=\"M0\" fill=\"url(#a)\" "
     "stroke=\"url(http://x)\"/>"
     "</g><lineargradient id=\"a\" xlink:href=\"http://x/#y\"/><use href=\"#a\"/><script>b</script>"
     "<style>c</style><foreignObject><p>d</p></foreignObject><animate attributeName=\"href\"/>"
     "<set to=\"x\"/><a xlink:href=\"javascript:x\"><text>e</text></a><title>f</title></svg>",
     "<svg xmlns=\"http://www.w3.org/2000/svg\" viewBox=\"0 0 1 1\"><g>"
     "<path d=\"M0\" fill=\"url(#tarnwick-rss-a)\"></path></g>"
     "<linearGradient id=\"tarnwick-rss-a\"></linearGradient><a><text>e</text></a></svg>"},
    {"ChoicesInDrawings",
     "<svg><switch><foreignObject><p>a</p></foreignObject><g onclick=\"x\"><text>b<textPath "
     "href=\"#c\">d</textPath></text></g></switch></svg>",
     "<svg xmlns=\"http://www.w3.org/2000/svg\"><g><text>bd</text></g></svg>"},
    {"Formulas",
     "<math href=\"javascript:x\"><mrow "
     "mathcolor=\"red\"><mi>x</mi><mtext><script>a</script></mtext>"
     "<mglyph/><maction actiontype=\"statusline\"><mn>1</mn></maction></mrow>"
     "<semantics><annotation>TeX</annotation></semantics></math>",
     "<math xmlns=\"http://www.w3.org/1998/Math/MathML\"><mrow mathcolor=\"red\"><mi>x</mi>"
     "<mtext></mtext><mn>1</mn></mrow><semantics></semantics></math>"},
    {"WhatIsNotWellFormed", "<p>a<b onclick=\"x\">b<script>c</script>", "<p>a<b>b</b></p>"},
};

}  // namespace

TEST_P(Markup, IsMadeSafe) {
    EXPECT_EQ(pass(GetParam().markup), GetParam().safe);
}

INSTANTIATE_TEST_SUITE_P(Of, Markup, testing::ValuesIn(kCases), named);

TEST(SafeMarkup, EscapesWhatCouldBeReadInAnotherWay) {
    const std::string attribute = pass("<p title=\"&lt;/p>&lt;script>&#10;'&quot;&amp;lt;\">x</p>");
    EXPECT_EQ(attribute, "<p title=\"&lt;/p&gt;&lt;script&gt; '&quot;&amp;lt;\">x</p>");
}

TEST(SafeMarkup, KeepsLinksWithoutABase) {
    EXPECT_EQ(pass("<a href=\"x\">a</a>", nullptr), "<a href=\"x\">a</a>");
    EXPECT_EQ(pass("<a href=\"#x\">a</a>", nullptr), "<a href=\"#x\">a</a>");
}

TEST(SafeMarkup, SurvivesDepth) {
    std::string deep;
    for (int i = 0; i < 1500; ++i)
        deep += "<b>";
    deep += "x";
    for (int i = 0; i < 1500; ++i)
        deep += "</b>";
    EXPECT_FALSE(pass(deep).empty());
}

TEST(HTMLSnippetTidier, GivesMarkupThatIsSafe) {
    EXPECT_EQ(tidyHTML("<a href=&#106;avascript&colon;x onclick=y>a<script>b</script>"),
              "<a>a</a>");
    EXPECT_EQ(tidyHTML("<img src=a.gif onerror=x><svg/onload=x><b>y</b>"),
              "<img src=\"http://h/d/a.gif\" /><b>y</b>");
    EXPECT_EQ(tidyHTML("<p>1 &lt;script&gt; <b>2"), "<p>1 &lt;script&gt; <b>2</b></p>");
    EXPECT_EQ(tidyHTML("<a href='?a=1&copy=2'>x"), "<a href=\"http://h/d/f?a=1&amp;copy=2\">x</a>");
}

TEST(XMLSnippetTidier, GivesMarkupThatIsSafe) {
    EXPECT_EQ(tidyXML("a <b>b</b>c&nbsp;<script>d</script><i onclick='x'>e"),
              "a <b>b</b>c&#160;<i>e</i>");
    EXPECT_EQ(tidyXML("<div xmlns='http://www.w3.org/1999/xhtml'><a href='x'>y</a></div>"),
              "<div xmlns=\"http://www.w3.org/1999/xhtml\"><a href=\"http://h/d/x\">y</a></div>");
    EXPECT_EQ(tidyXML("x</orvane><script>y"), "x");
}

TEST(XMLSnippetTidier, KeepsTextsAsTheyAre) {
    EXPECT_EQ(tidyXML("<pre> a\n  b</pre>x<b>y</b>z <i>u</i> v"),
              "<pre> a\n  b</pre>x<b>y</b>z <i>u</i> v");
}
