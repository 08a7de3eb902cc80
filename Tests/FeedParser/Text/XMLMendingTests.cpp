#include "FeedParser/Text/XMLMending.h"

#include "FeedParser/Text/Bounds.h"
#include "FeedParser/Text/FeedTidier.h"
#include "FeedParser/Text/TidierAsked.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>
#include <libxml/parser.h>

#include <string>

using namespace Orvane::FeedParser;

namespace {

/// How libxml2 reads a document: without the least error, or not.
bool isWhole(const std::string& xml) {
    xmlParserCtxt* context = xmlNewParserCtxt();
    xmlDoc* document = xmlCtxtReadMemory(context, xml.data(), static_cast<int>(xml.size()), nullptr,
                                         nullptr, XML_PARSE_NOERROR | XML_PARSE_NOWARNING);
    const bool result = document && context->wellFormed && context->nsWellFormed;
    xmlFreeDoc(document);
    xmlFreeParserCtxt(context);
    xmlResetLastError();
    return result;
}

std::string repeated(const std::string& text, int times) {
    std::string result;
    for (int i = 0; i < times; ++i)
        result += text;
    return result;
}

struct Case {
    const char* what;
    std::string feed;
    std::string tidied;
};

std::string named(const testing::TestParamInfo<Case>& info) {
    return info.param.what;
}

class BrokenFeeds : public testing::TestWithParam<Case> {};

const Case kCases[] = {
    {"AnElementThatWasNotEnded", "<rss><title>a<item><title>b</item></rss>",
     "<rss><title>a<item><title>b</title></item></title></rss>\n"},
    {"ATagThatWasNotEnded", "<rss><channel <title>a</title></rss>",
     "<rss><channel><title>a</title></channel></rss>\n"},
    {"AnEndThatNothingBegan", "<rss></x>a</y></rss>", "<rss>a</rss>\n"},
    {"AnEndInAnotherCase", "<rss><Title>a</title></RSS>", "<rss><Title>a</Title></rss>\n"},
    {"AMissingEnd", "<rss><channel><title>a</title>",
     "<rss><channel><title>a</title></channel></rss>\n"},
    {"JunkAroundTheRoot", "junk \n<?xml version='1.0'?> more <rss>a</rss> junk <b>x</b>",
     "<?xml version=\"1.0\" encoding=\"utf-8\"?>\n<rss>a</rss>\n"},
    {"ControlCharacters", std::string("<rss>a\x01\x0B\0b&#1;&#xD800;&#99999999;</rss>", 40),
     "<rss>ab</rss>\n"},
    {"LooseBracketsAndAmpersands", "<rss>a < b && c <3 &#38; &foo; &copy=1 ?a&b</rss>",
     "<rss>a &lt; b &amp;&amp; c &lt;3 &amp; &amp;foo; &amp;copy=1 ?a&amp;b</rss>\n"},
    {"AttributesOfEveryForm", "<rss a=1 b='2\"' c a=3 d=x&y 1=2>a</rss>",
     "<rss a=\"1\" b=\"2&quot;\" c=\"\" d=\"x&amp;y\">a</rss>\n"},
    {"NamesThatAreNone", "<rss><a:b:c>x</a:b:c><:d>y</:d></rss>",
     "<rss xmlns:a=\"urn:x-orvane:prefix:a\"><a:b_c>x</a:b_c><d>y</d></rss>\n"},
    {"APrefixOfAFamiliarName", "<rss><dc:date>x</dc:date></rss>",
     "<rss xmlns:dc=\"http://purl.org/dc/elements/1.1/\"><dc:date>x</dc:date></rss>\n"},
    {"APrefixDeclaredElsewhereOnly", "<rss><a xmlns:p=\"q\"><p:b/></a><p:c/></rss>",
     "<rss xmlns:p=\"urn:x-orvane:prefix:p\"><a xmlns:p=\"q\"><p:b /></a><p:c /></rss>\n"},
    {"NamespacesThatCannotBe",
     "<rss xmlns:a=\"\" xmlns:b=\" b c \" xmlns:xml=\"d\" "
     "xmlns=\"http://www.w3.org/2000/xmlns/\"/>",
     "<rss xmlns:b=\"b%20c\" />\n"},
    {"NamespacesThatAreEntities",
     "<!DOCTYPE r [<!ENTITY f \"http://f/\">]><rss xmlns:a=\"&f;x\"><a:b/></rss>",
     "<rss xmlns:a=\"http://f/x\"><a:b /></rss>\n"},
    {"CharacterData", "<rss><![CDATA[<b>&amp;</b>\n]]><![CDATA[x</rss>",
     "<rss>&lt;b&gt;&amp;amp;&lt;/b&gt;\nx</rss>\n"},
    {"CommentsAndInstructions", "<rss>a<!-- b --><?php c ?>d</rss>", "<rss>ad</rss>\n"},
    {"TextBetweenElements", "<rss>\n <d>x<b>y</b>z <i>a</i> b\r\n\rc</d>\n</rss>",
     "<rss>\n <d>x<b>y</b>z <i>a</i> b\n\nc</d>\n</rss>\n"},
    {"NoBreakSpaces", "<rss>a&nbsp;b&#160;c&#xA0;d\xC2\xA0</rss>",
     "<rss>a&#160;b&#160;c&#160;d&#160;</rss>\n"},
    {"EntitiesOfHTML", "<rss>&eacute;&#8364;&#150;</rss>",
     "<rss>\xC3\xA9\xE2\x82\xAC\xE2\x80\x93</rss>\n"},
    {"HTMLThatIsNotEscaped", "<rss><d>a<br>b<img src=x>c<p>d<p>e<li>f</d></rss>",
     "<rss><d>a<br />b<img src=\"x\" />c<p>d</p><p>e<li>f</li></p></d></rss>\n"},
    {"AnItemThatWasNotEnded", "<rss><item><b>x<item>y</item></rss>",
     "<rss><item><b>x</b></item><item>y</item></rss>\n"},
    {"AnEntryThatIsTheRoot", "<entry><a>x<entry>y</entry>",
     "<entry><a>x<entry>y</entry></a></entry>\n"},
    {"CharactersThatMarkLines", "<rss>\xEF\xA3\xBE\n\xEF\xA3\xBD</rss>",
     "<rss>\xEF\xA3\xBE\n\xEF\xA3\xBD</rss>\n"},
};

TEST_P(BrokenFeeds, AreMended) {
    const std::string tidied = TidierAsked<FeedTidier>()(GetParam().feed);
    EXPECT_EQ(tidied, GetParam().tidied);
    EXPECT_TRUE(isWhole(tidied));
}

INSTANTIATE_TEST_SUITE_P(With, BrokenFeeds, testing::ValuesIn(kCases), named);

}  // namespace

TEST(XMLMending, BoundsTheDepthAndKeepsTheText) {
    const Support::LoggingOn on({&Orvane::gLogParser});
    const Support::LogCapture log;
    XMLMending mending(XMLMending::Kind::Feed, true);
    const std::string mended = mending.mend(repeated("<a>x", 100000));
    EXPECT_EQ(std::count(mended.begin(), mended.end(), '<'), 2 * Bounds::kElementDepth);
    EXPECT_EQ(std::count(mended.begin(), mended.end(), 'x'), 100000 + 1);  // and "xml:space"
    EXPECT_EQ(log.count("A document has reached the bound \"kElementDepth\", 200"), 1);
    EXPECT_TRUE(isWhole(mended));
}

TEST(XMLMending, BoundsTheAttributes) {
    const Support::LoggingOn on({&Orvane::gLogParser});
    const Support::LogCapture log;
    std::string tag = "<a";
    for (int i = 0; i < 1000; ++i)
        tag += " a" + std::to_string(i) + "=1";
    XMLMending mending(XMLMending::Kind::Feed, true);
    const std::string mended = mending.mend(tag + "/>");
    EXPECT_NE(mended.find("a199="), std::string::npos);
    EXPECT_EQ(mended.find("a200="), std::string::npos);
    EXPECT_TRUE(log.contains("A document has reached the bound \"kMendedAttributes\", 200"));
}

TEST(XMLMending, BoundsWhatEntitiesMakeOfAttributes) {
    XMLMending mending(XMLMending::Kind::Feed, true);
    const std::string mended = mending.mend("<!DOCTYPE r [<!ENTITY a \"" + repeated("x", 250) +
                                            "\">]><r b=\"" + repeated("&a;", 100000) + "\"/>");
    EXPECT_LT(mended.size(), 1000000u);
}

TEST(XMLMending, LeavesPagesToTheNextTidier) {
    TidierAsked<FeedTidier> tidy;
    EXPECT_EQ(tidy("<!DOCTYPE html><html><head><meta a><link b></head></html>"), "(null)");
    EXPECT_EQ(tidy("<P>a<p>b"), "(null)");
    EXPECT_EQ(tidy("<xhtml:body/>"), "(null)");
    EXPECT_NE(tidy("<rdf:RDF/>"), "(null)");
}
