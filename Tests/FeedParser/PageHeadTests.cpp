#include "FeedParser/PageHead.h"

#include <gtest/gtest.h>

#include <string>

using Orvane::FeedParser::PageHead;

namespace {

/// The links and bases that are left of a page.
std::string linksOf(const std::string& page) {
    const PageHead head(page);
    std::string kept = head.restore(head.getPage());
    const std::string before = "<!DOCTYPE html>\n<html><head><title></title>";
    const std::string behind = "</head><body></body></html>\n";
    EXPECT_TRUE(kept.starts_with(before));
    EXPECT_TRUE(kept.ends_with(behind));
    kept.resize(kept.size() - behind.size());
    return kept.substr(before.size());
}

TEST(PageHead, KeepsLinksAndBasesInTheirOrder) {
    EXPECT_EQ(linksOf("<html><head><LINK Rel=a HREF='b' class=x><base href=\"c\"><p>"
                      "<link title=d/></head>"),
              "<link rel=\"a\" href=\"b\" /><base href=\"c\" /><link title=\"d\" />");
}

TEST(PageHead, EndsWithTheHeadOrAtTheBody) {
    EXPECT_EQ(linksOf("<link rel=a></head><link rel=b>"), "<link rel=\"a\" />");
    EXPECT_EQ(linksOf("<link rel=a><body><link rel=b>"), "<link rel=\"a\" />");
    EXPECT_EQ(linksOf("<link rel=a>"), "<link rel=\"a\" />");
}

TEST(PageHead, PassesOverWhatIsNoMarkup) {
    EXPECT_EQ(linksOf("<script><link rel=a></body></script><!-- <link rel=b> -->"
                      "<style><link rel=c></style><title><link rel=d></title>"
                      "<noscript><link rel=e></noscript>"),
              "<link rel=\"e\" />");
}

TEST(PageHead, GoesOnBehindAnElementWithoutItsEnd) {
    EXPECT_EQ(linksOf("<script><link rel=a><script><link rel=b><!-- <link rel=c>"),
              "<link rel=\"a\" /><link rel=\"b\" /><link rel=\"c\" />");
}

TEST(PageHead, KeepsTheFirstOfEachAttribute) {
    EXPECT_EQ(linksOf("<link rel=a REL=b>"), "<link rel=\"a\" />");
}

TEST(PageHead, WritesValuesAsXML) {
    EXPECT_EQ(
        linksOf("<link title='a&b &amp; &AMP; &eacute; &#233; &#8; &nosuch; <\"' href=?a&b=1>"),
        "<link title=\"a&amp;b &#38; &#38; &#233; &#233; &amp;#8; &amp;nosuch; &lt;&quot;\" "
        "href=\"?a&amp;b=1\" />");
}

TEST(PageHead, MarksLineFeedsAndTabsForARepair) {
    const PageHead head("<link title='a\r\nb\rc\td'>");
    EXPECT_EQ(head.getPage().find("a\n"), std::string::npos);
    EXPECT_EQ(linksOf("<link title='a\r\nb\rc\td'>"), "<link title=\"a&#10;b&#10;c&#9;d\" />");
}

TEST(PageHead, MakesThemBlanksWhereAllMarksAreTaken) {
    EXPECT_EQ(linksOf("<link title='a\nb\xEF\xA3\xBE\xEF\xA3\xBD\xEF\xA3\xBC\xEF\xA3\xBB"
                      "\xEF\xA3\xBA'>"),
              "<link title=\"a b\xEF\xA3\xBE\xEF\xA3\xBD\xEF\xA3\xBC\xEF\xA3\xBB\xEF\xA3\xBA\" />");
}

}  // namespace
