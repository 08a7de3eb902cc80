#include "FeedParser/Text/HTMLMending.h"

#include "FeedParser/Text/Bounds.h"
#include "FeedParser/Text/HTMLDocumentTidier.h"
#include "FeedParser/Text/HTMLElements.h"
#include "FeedParser/Text/HTMLSnippetTidier.h"
#include "FeedParser/Text/TidierAsked.h"
#include "FeedParser/Text/TidyDocument.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <string>

using namespace Orvane::FeedParser;

namespace {

std::string mend(const std::string& markup, HTMLMending::Kind kind = HTMLMending::Kind::Snippet) {
    return HTMLMending(kind).mend(markup);
}

std::string repeated(const std::string& text, int times) {
    std::string result;
    for (int i = 0; i < times; ++i)
        result += text;
    return result;
}

}  // namespace

TEST(HTMLMending, TakesOutTagsThatTidyDoesNotKnow) {
    EXPECT_EQ(mend("<my-card a=\"<b>\">x <b>y</b></my-card><o:p>z</o:p><p class='k'>"),
              "x <b>y</b>z<p class='k'>");
    EXPECT_EQ(mend("a<!-- b --><?xml:namespace prefix=o/><![if !IE]>c<![endif]>"), "ac");
    EXPECT_EQ(mend("<!DOCTYPE html><p>", HTMLMending::Kind::Page), "<!DOCTYPE html><p>");
}

TEST(HTMLMending, LeavesDrawingsAndFormulasAsTheyAre) {
    const std::string drawing = "<svg viewBox='0'><g><path d=''/></g></svg><math><mi>x</mi></math>";
    EXPECT_EQ(mend(drawing), drawing);
    EXPECT_EQ(mend("<svg/><g>x</g>"), "<svg/>x");
    EXPECT_EQ(mend("<svg><g>x<table><tr></table>"), "<svg><g>x</svg><table><tr></table>");
    const std::string holder = "<svg><foreignObject><p>x</p></foreignObject></svg>";
    EXPECT_EQ(mend(holder), holder);
}

TEST(HTMLMending, EscapesWhatBeginsNothing) {
    EXPECT_EQ(mend("1 < 2 <\xED\x95\x9C>"), "1 &lt; 2 &lt;\xED\x95\x9C>");
    EXPECT_EQ(mend("<a href='?a=1&copy=2&lt;&#38;'>&copy 1"),
              "<a href='?a=1&amp;copy=2&lt;&#38;'>&copy 1");
    EXPECT_EQ(mend(std::string("a\0b\x07 c", 6)), "ab c");
}

TEST(HTMLMending, LooksForNoMarkupInScripts) {
    EXPECT_EQ(mend("<script>if (a<b) '<x-y>'</script><x-y>", HTMLMending::Kind::Page),
              "<script>if (a<b) '<x-y>'</script>");
    EXPECT_EQ(mend("a<script>if (a<b) '<x-y>'</script>b<STYLE>c<d></Style>e"), "abe");
}

TEST(HTMLMending, KeepsWhatNoscriptHoldsInContentAlone) {
    EXPECT_EQ(mend("<noscript><b>x</b></noscript>"), "<b>x</b>");
    EXPECT_EQ(mend("<noscript>x</noscript>", HTMLMending::Kind::Page), "<noscript>x</noscript>");
    EXPECT_EQ(TidierAsked<HTMLSnippetTidier>()("<script>a</script><noscript><b>x</b></noscript>"),
              "<b>x</b>");
}

TEST(HTMLMending, BoundsTheDepthAndTheOpenInlines) {
    const Support::LoggingOn on({&Orvane::gLogParser});
    const Support::LogCapture log;
    const std::string deep = mend(repeated("<div>x", 1000) + repeated("</div>", 1000));
    EXPECT_EQ(std::count(deep.begin(), deep.end(), '<'), 2 * Bounds::kElementDepth);
    EXPECT_EQ(std::count(deep.begin(), deep.end(), 'x'), 1000);
    EXPECT_EQ(log.count("A document has reached the bound \"kElementDepth\", 200"), 1);
    const std::string inlines = mend(repeated("<font><p>", 100));
    EXPECT_EQ(std::count(inlines.begin(), inlines.end(), 'f'), Bounds::kOpenInlines);
    EXPECT_EQ(log.count("A document has reached the bound \"kOpenInlines\", 24"), 1);
    EXPECT_EQ(log.count("A document has reached the bound \"kRepeatedInlines\", 3000"), 0);
    EXPECT_EQ(mend(repeated("<p>", 1000)), repeated("<p>", 1000));
    EXPECT_EQ(mend(repeated("<b>x</b>", 1000)), repeated("<b>x</b>", 1000));
}

TEST(HTMLMending, EndsOpenInlinesThatWereRepeatedOftenEnough) {
    const Support::LoggingOn on({&Orvane::gLogParser});
    const Support::LogCapture log;
    constexpr int kBlocks = Bounds::kRepeatedInlines / 2;
    const std::string opened = "<b><i>" + repeated("<p>x", kBlocks);
    EXPECT_EQ(mend(opened), opened);
    const std::string ended = mend(opened + "<p>y</i></b><b><p>z</b>");
    EXPECT_TRUE(ended == opened + "</b></i><p>y<b></b><p>z" ||
                ended == opened + "</i></b><p>y<b></b><p>z")
        << ended.substr(opened.size());
    EXPECT_EQ(log.count("A document has reached the bound \"kRepeatedInlines\", 3000"), 1);
}

TEST(HTMLMending, BoundsTheAttributes) {
    std::string tag = "<p";
    for (int i = 0; i < 1000; ++i)
        tag += " a" + std::to_string(i) + "='\"&b=1'";
    const std::string mended = mend(tag + ">");
    EXPECT_NE(mended.find(" a199='\"&amp;b=1'>"), std::string::npos);
    EXPECT_EQ(mended.find("a200="), std::string::npos);
}

TEST(HTMLMending, GivesThePagesOfTodayTheirLinks) {
    const std::string page = TidierAsked<HTMLDocumentTidier>()(
        "<html><head><link rel=alternate href=/a><x-head></x-head><link rel=icon href=/b>"
        "<search><link rel=alternate href=/c><title>d <link rel=next href=/e>");
    EXPECT_NE(page.find("<link rel=\"next\" href=\"/e\" />"), std::string::npos) << page;
    EXPECT_NE(page.find("<link rel=\"alternate\" href=\"/a\" />"), std::string::npos);
    EXPECT_NE(page.find("<link rel=\"icon\" href=\"/b\" />"), std::string::npos);
    EXPECT_NE(page.find("<link rel=\"alternate\" href=\"/c\" />"), std::string::npos);
}

TEST(HTMLElement, IsKnownToTidyWhereItSaysSo) {
    for (const char* name :
         {"a", "article", "dialog", "math", "svg", "template", "wbr", "xmp", "nextid", "server"}) {
        ASSERT_NE(HTMLElement::find(name), nullptr) << name;
        EXPECT_TRUE(HTMLElement::find(name)->is(HTMLElement::Known)) << name;
        const std::unique_ptr<TidyDocument> document = TidyDocument::create();
        document->repair("<" + std::string(name) + ">x", "utf8");
        EXPECT_EQ(document->getMessages().find("is not recognized"), std::string::npos) << name;
    }
    EXPECT_EQ(HTMLElement::find("my-card"), nullptr);
    EXPECT_FALSE(HTMLElement::find("data")->is(HTMLElement::Known));
}
