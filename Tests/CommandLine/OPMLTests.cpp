#include "CommandLine/OPML.h"

#include "CommandLine/OutlineStore.h"

#include <gmock/gmock.h>

using Commands::Outline;
using Commands::OutlineStore;
using testing::HasSubstr;
namespace OPML = Commands::OPML;

namespace {

/// Outlines as text: "Title<url>" for feeds, "Folder(...)" for folders, with attributes in
/// brackets.
std::string shown(const std::vector<Outline>& outlines) {
    std::string text;
    for (const Outline& each : outlines) {
        if (!text.empty()) text += ' ';
        text += each.title;
        text += each.isFeed() ? '<' + each.url + '>' : '(' + shown(each.children) + ')';
        for (const auto& [name, value] : each.others) {
            text += '[' + name + '=' + value + ']';
        }
    }
    return text;
}

std::string read(const std::string& body) {
    const auto outlines = OPML::read("<opml version='2.0'><head/><body>" + body + "</body></opml>");
    return outlines ? shown(*outlines) : "none";
}

Outline feed(const std::string& title, const std::string& url) {
    Outline outline;
    outline.title = title;
    outline.url = url;
    return outline;
}

std::vector<Outline> parsed(const std::string& body) {
    return OPML::read("<opml><body>" + body + "</body></opml>").value_or(std::vector<Outline>());
}

}  // namespace

TEST(OPML, ReadsFeedsAndFolders) {
    EXPECT_EQ(read("<outline text='A' xmlUrl='http://e.org/a'/>"
                   "<outline text='Folder'><outline title='B' text='b' xmlUrl=' http://e.org/b '/>"
                   "<outline text='Inner'><outline text='C' xmlUrl='http://e.org/c'/></outline>"
                   "</outline>"),
              "A<http://e.org/a> Folder(B<http://e.org/b> Inner(C<http://e.org/c>))");
}

TEST(OPML, KeepsAttributesThatItDoesNotKnow) {
    EXPECT_EQ(read("<outline text='A' type='rss' xmlUrl='u:a' category='x,y' version='RSS2'/>"),
              "A<u:a>[category=x,y][version=RSS2]");
}

TEST(OPML, TakesNamesInAnyCase) {
    EXPECT_EQ(read("<OUTLINE TEXT='A' XMLURL='u:a'/><outline text='B' xmlurl='u:b'/>"),
              "A<u:a> B<u:b>");
}

TEST(OPML, LeavesOutWhatIsNeitherFeedNorFolder) {
    EXPECT_EQ(read("<outline text='A remark'/><outline text='A link' type='link' url='u:x'/>"
                   "<outline text='A' xmlUrl='u:a'><outline text='B' xmlUrl='u:b'/></outline>"
                   "<outline><outline text='C' xmlUrl='u:c'/></outline>"),
              "A<u:a> B<u:b> C<u:c>");
    EXPECT_EQ(read("<outline text='Empty'/>"), "none");
    EXPECT_EQ(shown(*OPML::read("<opml><outline text='A' xmlUrl='u:a'/></opml>")), "A<u:a>");
}

TEST(OPML, MendsWhatIsBroken) {
    EXPECT_EQ(shown(*OPML::read("<opml><body><outline text='A & B' xmlUrl='u:a?x=1&y=2'>"
                                "<outline text='B' xmlUrl='u:b'/>")),
              "A & B<u:a?x=1&y=2> B<u:b>");
    EXPECT_FALSE(OPML::read("<"));
    EXPECT_FALSE(OPML::read(""));
}

TEST(OPML, ReadsLists) {
    EXPECT_EQ(shown(*OPML::read("# mine\nhttp://e.org/a \"tag\"\n\nhttp://e.org/b\r\n")),
              "<http://e.org/a> <http://e.org/b>");
}

TEST(OPML, FlattensWhatIsVeryDeep) {
    std::string text = "<outline text='A' xmlUrl='u:a'/>";
    for (int i = 0; i < 200; ++i) {
        text = "<outline text='f'>" + text + "</outline>";
    }
    std::size_t depth = 0;
    std::vector<Outline> level = parsed(text);
    for (; !level.empty() && !level[0].isFeed(); level = std::vector<Outline>(level[0].children)) {
        ++depth;
    }
    EXPECT_EQ(depth, static_cast<std::size_t>(OPML::kDepth));
    EXPECT_EQ(level.size(), 1U);
}

TEST(OPML, WritesWhatItReads) {
    const std::vector<Outline> outlines = parsed(
        "<outline text='F &amp; G'><outline text='&lt;A&gt; \"x\"' xmlUrl='u:a?1&amp;2' "
        "htmlUrl='u:p' note='two&#10;lines'/></outline>");
    const std::string text = OPML::write(outlines, "Mine & yours", OVDate(0));
    EXPECT_THAT(text, HasSubstr("<title>Mine &amp; yours</title>"));
    EXPECT_THAT(text, HasSubstr("<dateCreated>Mon, 01 Jan 2001 00:00:00 GMT</dateCreated>"));
    const auto again = OPML::read(text);
    ASSERT_TRUE(again);
    EXPECT_EQ(shown(*again), "F & G(<A> \"x\"<u:a?1&2>[note=two\nlines])");
    EXPECT_EQ((*again)[0].children[0].page, "u:p");
}

TEST(OutlineStore, MergesFoldersOfOneName) {
    OutlineStore store("org.example.None");
    store.merge(parsed("<outline text='F'><outline text='A' xmlUrl='u:a' x='1'/></outline>"));
    store.merge(
        parsed("<outline text='F'><outline text='New' xmlUrl='u:a'/>"
               "<outline text='B' xmlUrl='u:b'/></outline><outline text='C' xmlUrl='u:c'/>"));
    EXPECT_EQ(shown(store.outlines()), "F(New<u:a>[x=1] B<u:b>) C<u:c>");
}

TEST(OutlineStore, KeepsWhatItHasInAFile) {
    OutlineStore store("org.example/../Client");
    store.merge(parsed("<outline text='F'><outline text='A' xmlUrl='u:a' x='1'/></outline>"));
    store.save();
    EXPECT_EQ(shown(OutlineStore("org.example/../Client").outlines()), "F(A<u:a>[x=1])");
    EXPECT_EQ(shown(OutlineStore("org.example.Other").outlines()), "");
}

TEST(OutlineStore, ArrangesTheFeedsThatThereAre) {
    const std::vector<Outline> kept = parsed(
        "<outline text='F'><outline text='Mine' xmlUrl='u:a' x='1'/><outline text='Gone' "
        "xmlUrl='u:gone'/></outline><outline text='G'><outline text='Gone' xmlUrl='u:gone'/>"
        "</outline>");
    const std::vector<Outline> feeds = {feed("A", "u:a"), feed("B", "u:b")};
    EXPECT_EQ(shown(OutlineStore::arranged(kept, feeds)), "F(Mine<u:a>[x=1]) B<u:b>");
    EXPECT_EQ(shown(OutlineStore::arranged({}, feeds)), "A<u:a> B<u:b>");
}
