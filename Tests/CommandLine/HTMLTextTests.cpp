#include "CommandLine/HTMLText.h"

#include <gmock/gmock.h>

using Commands::HTMLText;
using testing::ElementsAre;

namespace {

std::string text(const std::string& html, std::size_t columns = 40) {
    return HTMLText(html, columns).text();
}

}  // namespace

TEST(HTMLText, WritesParagraphsAndLines) {
    EXPECT_EQ(text("<p>One <b>two</b>\n three</p><p>Four<br/>five</p>"),
              "One two three\n\nFour\nfive\n");
    EXPECT_EQ(text("<div>a</div><div>b</div>plain"), "a\nb\nplain\n");
    EXPECT_EQ(text("no markup at all"), "no markup at all\n");
    EXPECT_EQ(text(""), "");
    EXPECT_EQ(text("one two three four", 21), "one two three four\n");
}

TEST(HTMLText, WritesLists) {
    EXPECT_EQ(text("<ul><li>a</li><li>b<ul><li>c</li></ul></li></ul><ol><li>x</li><li>y</li></ol>"),
              "* a\n* b\n\n  * c\n\n 1. x\n 2. y\n"
              "");
}

TEST(HTMLText, KeepsPreformattedLines) {
    EXPECT_EQ(text("<p>a</p><pre>x\n  y\n\nz</pre>"), "a\n\nx\n  y\n\nz\n");
}

TEST(HTMLText, NumbersLinks) {
    const HTMLText html(
        "<p><a href='http://e.org/1'>One</a> <a href='/two'>Two</a> <a href='http://e.org/1'>again"
        "</a> <a name='x'>no link</a> <a href='#top'>top</a></p>",
        80, "http://base.org/dir/page");
    EXPECT_EQ(html.text(), "One [1] Two [2] again [1] no link top\n");
    EXPECT_THAT(html.links(), ElementsAre("http://e.org/1", "http://base.org/two"));
}

TEST(HTMLText, ResolvesReferences) {
    EXPECT_EQ(text("a &amp; b &lt;c&gt; &#65;&#x42; &eacute; &bogus; & &;"),
              "a & b <c> AB \u00E9 &bogus; & &;\n");
    EXPECT_EQ(text("&#0;&#x110000;&#xD800;"), "\uFFFD\uFFFD\uFFFD\n");
}

TEST(HTMLText, LeavesOutWhatIsNotShown) {
    EXPECT_EQ(text("<style>p{}</style><script>if (a<b) x()</script><!-- c --><p>Shown</p>"),
              "Shown\n");
    EXPECT_EQ(text("<p><img src='x' alt='A picture'/></p>"), "[A picture]\n");
}

TEST(HTMLText, DoesNotControlTheTerminal) {
    EXPECT_EQ(text("<p>\033[2J&#27;[31m\u009B</p>"), "[2J[31m\n");
    EXPECT_THAT(HTMLText("<a href='http://e.org/\033[2J'>x</a>", 80).links().at(0),
                testing::Not(testing::HasSubstr("\033")));
}

TEST(HTMLText, EndsWhateverItIsGiven) {
    for (const char* html : {"<", "<p", "<a href=", "<a href='", "<!--", "</", "<script>", "&#",
                             "&", "</ul></ol></pre></blockquote></a>", "<li>x", "<a href=x>y"}) {
        EXPECT_NO_THROW(text(html)) << html;
    }
}
