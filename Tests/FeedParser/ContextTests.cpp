#include "FeedParser/ParsedDocument.h"
#include "Foundation/AutoreleasePool.h"
#include "SQLite/Database.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <string>

using namespace Foundation;
using nlohmann::json;

namespace {

/// Documents of each dialect, around what a test is about.
class ContextTest : public testing::Test {
 protected:
    ContextTest() { SQLite::Database::initialize(); }
    ~ContextTest() noexcept override {}

    static json channel(const std::string& xml) {
        return parsed(
            "<rss version=\"2.0\" xmlns:dc=\"http://purl.org/dc/elements/1.1/\" "
            "xmlns:content=\"http://purl.org/rss/1.0/modules/content/\" "
            "xmlns:atom=\"http://www.w3.org/2005/Atom\"><channel>" +
                xml + "</channel></rss>",
            "http://a.b/");
    }
    static json item(const std::string& xml) {
        return valueAt(channel("<item>" + xml + "</item>"), "entries[0]");
    }
    static json atom(const std::string& xml) {
        return parsed("<feed xmlns=\"http://www.w3.org/2005/Atom\">" + xml + "</feed>",
                      "http://a.b/");
    }
    static json entry(const std::string& xml) {
        return valueAt(atom("<entry>" + xml + "</entry>"), "entries[0]");
    }
    static json rdf(const std::string& xml) {
        return parsed(
            "<rdf:RDF xmlns:rdf=\"http://www.w3.org/1999/02/22-rdf-syntax-ns#\" "
            "xmlns=\"http://purl.org/rss/1.0/\" "
            "xmlns:foaf=\"http://xmlns.com/foaf/0.1/\">" +
            xml + "</rdf:RDF>");
    }

    AutoreleasePool pool;
    Support::LogCapture log;
    Support::LoggingOn on{{&Orvane::gLogParserDates, &Orvane::gLogParserVerbose}};
};

using ContextFactory = ContextTest;

TEST_F(ContextFactory, MatchesNamesInAnyCase) {
    EXPECT_EQ(parsed("<RSS><Channel><TITLE>T</TITLE></Channel></RSS>")["feed"]["title"], "T");
}

TEST_F(ContextFactory, LogsEachElement) {
    parsed("<x:feed xmlns:x=\"http://www.w3.org/2005/Atom\"><y/></x:feed>");
    EXPECT_TRUE(
        log.contains("[ParserVerbose] Context::newChild('http://www.w3.org/2005/Atom' - "
                     "FeedUri, 'x' - UnknownTag, 'feed' - FeedTag, 0)"));
    EXPECT_TRUE(
        log.contains("[ParserVerbose] Context::newChild('(null)' - BlankUri, '(null)' - "
                     "BlankTag, 'y' - UnknownTag, 0)"));
}

TEST_F(ContextFactory, TakesNoNamesOfOtherVocabulariesWithoutTheirPrefix) {
    const json found = item(
        "<date>2005-10-21T00:12:34Z</date><created>2005-10-21T00:12:34Z"
        "</created><creator>c</creator><encoded>e</encoded>");
    EXPECT_EQ(found["datePublished"], nullptr);
    EXPECT_EQ(found["dateCreated"], nullptr);
    EXPECT_EQ(found["author"], nullptr);
    EXPECT_EQ(found["content"], nullptr);
}

TEST_F(ContextFactory, TakesThemByThePrefixInWhateverNamespace) {
    const json found = parsed(
        "<rss><channel><item xmlns:dc=\"urn:x\" xmlns:content=\"urn:y\">"
        "<dc:date>2005-10-21T00:12:34Z</dc:date><content:encoded>e"
        "</content:encoded></item></channel></rss>");
    EXPECT_EQ(valueAt(found, "entries[0].datePublished"), "2005-10-21T00:12:34Z");
    EXPECT_EQ(valueAt(found, "entries[0].content"), "e");
}

TEST_F(ContextFactory, ReadsAtomWithinRSS) {
    const json found = channel(
        "<atom:link rel=\"self\" href=\"/f\"/><atom:subtitle>s"
        "</atom:subtitle>");
    EXPECT_EQ(valueAt(found, "info.links[0].url"), "http://a.b/f");
    EXPECT_EQ(found["feed"]["subtitle"], "s");
}

TEST_F(ContextFactory, LetsAnElementOfAnUnknownVocabularySwallowItsChildren) {
    const json found = channel(
        "<title>T</title><x><title>U</title></x><y:title xmlns:y=\"urn:y\">"
        "V</y:title>");
    EXPECT_EQ(found["feed"]["title"], "T");
}

// Feeds

using FeedContext = ContextTest;

TEST_F(FeedContext, TakesWhatStandsInItsChannel) {
    const json found = channel(
        "<title>T &amp;amp; &lt;b&gt;U&lt;/b&gt;</title><dc:rights>R</dc:rights>"
        "<lastBuildDate>Fri, 21 Oct 2005 00:12:34 GMT</lastBuildDate><link>http://a.b/page</link>"
        "<image><url>/i.png</url><title>I</title><link>http://c/</link></image>"
        "<pubDate>Sat, 22 Oct 2005 00:12:34 GMT</pubDate><id>D</id><icon>/j.png</icon>");
    const json& feed = found["feed"];
    EXPECT_EQ(feed["title"], "T & U");
    EXPECT_EQ(feed["rights"], "R");
    EXPECT_EQ(feed["dateUpdated"], "2005-10-21T00:12:34Z");
    EXPECT_EQ(feed["alternateUrl"], "http://a.b/page");
    EXPECT_EQ(feed["logoUrl"], "http://a.b/i.png");
    EXPECT_EQ(feed["iconUrl"], "http://a.b/j.png");
    EXPECT_EQ(feed["id"], "D");
    EXPECT_EQ(feed["format"], 1);
    EXPECT_EQ(feed["url"], "http://a.b/");
    EXPECT_EQ(valueAt(found, "info.defaultTimePublished"), "2005-10-22T00:12:34Z");
}

TEST_F(FeedContext, MakesItsSubtitleOfTheDescriptionWithoutMarkup) {
    EXPECT_EQ(
        channel(
            "<description>a &lt;b&gt;c&lt;/b&gt; &amp;amp; d</description>")["feed"]["subtitle"],
        "a c & d");
}

TEST_F(FeedContext, KeepsTheLastOfSubtitleAndDescription) {
    EXPECT_EQ(channel("<description>a</description><subtitle>b</subtitle>")["feed"]["subtitle"],
              "b");
    EXPECT_EQ(channel("<subtitle>b</subtitle><description>a</description>")["feed"]["subtitle"],
              "a");
}

TEST_F(FeedContext, EmptiesTheSubtitleForAContent) {
    EXPECT_EQ(
        channel("<subtitle>b</subtitle><content:encoded>a</content:encoded>")["feed"]["subtitle"],
        nullptr);
}

TEST_F(FeedContext, KeepsTheFirstAlternateLinkAndListsAll) {
    const json found = atom(
        "<link rel=\"self\" href=\"/s\"/><link href=\"/a\"/>"
        "<link rel=\"alternate\" href=\"/b\"/>");
    EXPECT_EQ(found["feed"]["alternateUrl"], "http://a.b/a");
    EXPECT_EQ(found["info"]["links"].size(), 3u);
    EXPECT_EQ(found["format"], 2);
}

// Entries

using EntryContext = ContextTest;

TEST_F(EntryContext, TakesAGUIDForItsIDAndItsPage) {
    EXPECT_EQ(item("<guid>http://a.b/1</guid>")["id"], "http://a.b/1");
    EXPECT_EQ(item("<guid>http://a.b/1</guid>")["alternateUrl"], "http://a.b/1");
    for (const char* no : {"NO", "false", " False "}) {
        const json found =
            item(std::string("<guid isPermaLink=\"") + no + "\">http://a.b/1</guid>");
        EXPECT_EQ(found["id"], "http://a.b/1");
        EXPECT_EQ(found["alternateUrl"], nullptr);
    }
}

TEST_F(EntryContext, KeepsTheFirstLinkUnlessAGUIDComesBehindIt) {
    const std::string links = "<link>http://a.b/1</link><link>http://a.b/2</link>";
    EXPECT_EQ(item(links)["alternateUrl"], "http://a.b/1");
    EXPECT_EQ(item(links + "<guid>http://a.b/3</guid>")["alternateUrl"], "http://a.b/3");
    EXPECT_EQ(item("<guid>http://a.b/3</guid>" + links)["alternateUrl"], "http://a.b/3");
}

TEST_F(EntryContext, KeepsTheLongestContent) {
    const std::string small = "<description>ab</description>";
    const std::string large = "<content:encoded>abc</content:encoded>";
    EXPECT_EQ(item(small + large)["content"], "abc");
    EXPECT_EQ(item(large + small)["content"], "abc");
    EXPECT_EQ(item(small + "<description/><description></description>")["content"], "ab");
    EXPECT_EQ(item(small + "<content:encoded>xy</content:encoded>")["content"], "ab");
}

TEST_F(EntryContext, TakesItsDates) {
    const json found = entry(
        "<published>2005-10-21T00:12:34Z</published>"
        "<updated>2005-10-22T00:12:34Z</updated>"
        "<created>2005-10-23T00:12:34Z</created>");
    EXPECT_EQ(found["datePublished"], "2005-10-21T00:12:34Z");
    EXPECT_EQ(found["dateUpdated"], "2005-10-22T00:12:34Z");
    EXPECT_EQ(found["dateCreated"], nullptr);  // of Dublin Core alone
    EXPECT_EQ(item("<dc:created>2005-10-23T00:12:34Z</dc:created>")["dateCreated"],
              "2005-10-23T00:12:34Z");
}

TEST_F(EntryContext, TakesTheFirstAuthorAndTheFirstContributor) {
    const std::string contributor = "<contributor><name>C</name></contributor>";
    const std::string author = "<author><name>A</name><email>a@b.c</email><uri>/a</uri></author>";
    EXPECT_EQ(entry(author + contributor)["author"]["name"], "A");
    EXPECT_EQ(entry(author)["author"]["email"], "a@b.c");
    EXPECT_EQ(entry(author)["author"]["url"], "http://a.b/a");
    EXPECT_EQ(entry(contributor + author)["author"]["name"], "C");
}

TEST_F(EntryContext, KeepsItsXMLWithTheNamespacesThatItUses) {
    EXPECT_EQ(entry("<title a=\"&lt;\">T</title>")["xml"],
              "<entry xmlns=\"http://www.w3.org/2005/Atom\"><title a=\"&lt;\">T</title></entry>");
    EXPECT_EQ(item("<dc:date/><title/>")["xml"],
              "<item xmlns:dc=\"http://purl.org/dc/elements/1.1/\"><dc:date/><title/></item>");
}

TEST_F(EntryContext, KeepsNoXMLOfAnEmptyElement) {
    EXPECT_EQ(valueAt(channel("<item/>"), "entries[0].xml"), nullptr);
}

// Texts

using PlainTextContext = ContextTest;

TEST_F(PlainTextContext, UndoesEscapesTwiceInRSSAndForHTML) {
    EXPECT_EQ(item("<title>&amp;lt;b&amp;gt; a &lt;i&gt;b&lt;/i&gt;</title>")["title"], " a b");
    EXPECT_EQ(entry("<title>&amp;amp;lt;</title>")["title"], "&amp;lt;");
    EXPECT_EQ(entry("<title type=\"text/html\">&amp;amp;lt;b</title>")["title"], "&lt;b");
    EXPECT_EQ(entry("<title type=\"html\">a &amp;amp; b</title>")["title"], "a & b");
    EXPECT_EQ(entry("<title type=\"xhtml\"><div>a &amp;amp; b</div></title>")["title"], "a & b");
    EXPECT_EQ(entry("<title type=\"text\">a &amp;amp; b</title>")["title"], "a &amp; b");
}

TEST_F(PlainTextContext, IsEmptyWithoutContent) {
    EXPECT_EQ(item("<title/>")["title"], "");
    EXPECT_EQ(item("<title></title>")["title"], "");
}

using ContentContext = ContextTest;

TEST_F(ContentContext, KeepsTextByItsType) {
    json found = entry("<content>&amp;lt;b&amp;gt;</content>");
    EXPECT_EQ(found["content"], "&lt;b&gt;");
    EXPECT_EQ(found["contentType"], "text/plain");
    found = entry("<content mode=\"escaped\">&amp;lt;b&amp;gt;</content>");
    EXPECT_EQ(found["content"], "<b>");
    EXPECT_EQ(found["contentType"], "text/plain");
    found = entry("<content type=\"text/html\">&lt;b&gt;&amp;amp;</content>");
    EXPECT_EQ(found["content"], "<b>&amp;");
    EXPECT_EQ(found["contentType"], "text/html");
    found = entry("<content type=\"application/xhtml+xml\"> <p>&amp;</p> </content>");
    EXPECT_EQ(found["content"], " <p xmlns=\"http://www.w3.org/2005/Atom\">&amp;</p> ");
    EXPECT_EQ(found["contentType"], "application/xhtml+xml");
    found = item("<description>&lt;b&gt;&amp;amp;</description>");
    EXPECT_EQ(found["content"], "<b>&amp;");
    EXPECT_EQ(found["contentType"], "text/html");
}

TEST_F(ContentContext, TakesAnyOtherTypeForBase64) {
    const json found = entry("<content type=\" image/png \">AQID</content>");
    EXPECT_EQ(found["content"], "\x01\x02\x03");
    EXPECT_EQ(found["contentType"], "image/png");
    EXPECT_EQ(entry("<content type=\"image/png\">AQ</content>")["content"], nullptr);
    EXPECT_EQ(entry("<content mode=\"base64\">AQID</content>")["content"], "AQID");
}

TEST_F(ContentContext, KeepsTheSummaryApart) {
    const json found = entry("<summary>S</summary><content>C</content>");
    EXPECT_EQ(found["summary"], "S");
    EXPECT_EQ(found["summaryType"], "text/plain");
    EXPECT_EQ(found["content"], "C");
}

using DateContext = ContextTest;

TEST_F(DateContext, LogsWhatIsNoDate) {
    EXPECT_EQ(item("<pubDate>soon</pubDate>")["datePublished"], nullptr);
    EXPECT_TRUE(
        log.contains("[ParserDates] FeedParser: Couldn't parse date 'soon' in <http://a.b/>"));
}

using AuthorContext = ContextTest;

TEST_F(AuthorContext, ReadsTheLineOfRSS) {
    json author = item("<author>a@b.c (A &amp; B)</author>")["author"];
    EXPECT_EQ(author["name"], "A & B");
    EXPECT_EQ(author["email"], "a@b.c");
    author = item("<dc:creator>A B</dc:creator>")["author"];
    EXPECT_EQ(author["name"], "A B");
    EXPECT_EQ(author["email"], nullptr);
}

// Links

using LinkContext = ContextTest;

TEST_F(LinkContext, ReadsEnclosuresOfBothDialects) {
    json found = item(
        "<enclosure url=\" /f.mp3 \" length=\"123 bytes\" type=\"audio/mpeg\" "
        "title=\"E\"/>")["enclosures"];
    ASSERT_EQ(found.size(), 1u);
    EXPECT_EQ(found[0]["url"], "http://a.b/f.mp3");
    EXPECT_EQ(found[0]["length"], 123);
    EXPECT_EQ(found[0]["mimeType"], "audio/mpeg");
    EXPECT_EQ(found[0]["title"], "E");
    for (const char* rel : {"enclosure", "ENCLOSURE", " Enclosure "}) {
        found =
            entry(std::string("<link rel=\"") + rel + "\" href=\"/f\" size=\"x\"/>")["enclosures"];
        ASSERT_EQ(found.size(), 1u) << rel;
        EXPECT_EQ(found[0]["length"], 0);
    }
}

TEST_F(LinkContext, TakesNoEnclosureWithoutAURL) {
    EXPECT_TRUE(item("<enclosure length=\"1\"/>")["enclosures"].empty());
    EXPECT_TRUE(item("<enclosure url=\"javascript:x()\"/>")["enclosures"].empty());
}

TEST_F(LinkContext, TakesTheTextOfALinkWithoutAHref) {
    const json found = channel("<link rel=\"self\">http://a.b/x</link><link/>");
    EXPECT_EQ(found["info"]["links"][0]["rel"], "alternate");
    EXPECT_EQ(found["info"]["links"][0]["href"], "http://a.b/x");
    EXPECT_EQ(found["info"]["links"][1]["rel"], "alternate");
    EXPECT_EQ(found["info"]["links"][1]["href"], "");
}

TEST_F(LinkContext, TellsTheKindsOfLinks) {
    const json found = atom(
        "<link rel=\"meta\" type=\"application/rdf+xml\" title=\"my foaf\" "
        "href=\"/foaf\"/>");
    EXPECT_EQ(found["info"]["links"][0]["kind"], 4);
}

// RDF and friends

using RDFContext = ContextTest;

TEST_F(RDFContext, ReadsItemsBesideTheChannel) {
    const json found = rdf("<channel><title>T</title></channel><item><title>I</title></item>");
    EXPECT_EQ(found["kind"], "feed");
    EXPECT_EQ(found["format"], 1);
    EXPECT_EQ(found["feed"]["title"], "T");
    EXPECT_EQ(valueAt(found, "entries[0].title"), "I");
}

TEST_F(RDFContext, IsAPersonOnlyWithoutAnyItem) {
    const std::string person = "<foaf:Person><foaf:name>P</foaf:name></foaf:Person>";
    EXPECT_EQ(rdf(person)["kind"], "friend");
    EXPECT_EQ(rdf(person)["friend"]["name"], "P");
    EXPECT_EQ(rdf(person + "<item/>")["kind"], "feed");
    EXPECT_EQ(rdf("")["kind"], "unknown");
}

using FriendContext = ContextTest;

TEST_F(FriendContext, ReadsAPersonAndWhomSheKnows) {
    const json found =
        rdf("<foaf:Person><foaf:family_name>F</foaf:family_name><foaf:givenname>G</foaf:givenname>"
            "<foaf:nick>N</foaf:nick><foaf:homepage rdf:resource=\"http://a/1\"/>"
            "<foaf:weblog>http://a/2</foaf:weblog>"
            "<foaf:knows><foaf:Person><foaf:name>K</foaf:name></foaf:Person></foaf:knows>"
            "<foaf:knows><foaf:Person><foaf:name>L</foaf:name></foaf:Person></foaf:knows>"
            "</foaf:Person>");
    const json& person = found["friend"];
    EXPECT_EQ(person["familyName"], "F");
    EXPECT_EQ(person["firstName"], "G");
    EXPECT_EQ(person["nick"], "N");
    EXPECT_EQ(person["name"], nullptr);
    EXPECT_EQ(person["url"], "http://a/2");
    ASSERT_EQ(person["knows"].size(), 2u);
    EXPECT_EQ(person["knows"][0]["name"], "K");
    EXPECT_EQ(person["knows"][1]["name"], "L");
}

TEST_F(FriendContext, CountsAtOnceWithoutARoot) {
    const json found = parsed(
        "<foaf:Person xmlns:foaf=\"http://xmlns.com/foaf/0.1/\">"
        "<foaf:firstName>F</foaf:firstName></foaf:Person>");
    EXPECT_EQ(found["kind"], "friend");
    EXPECT_EQ(found["friend"]["firstName"], "F");
}

// Pages

using PageContext = ContextTest;

TEST_F(PageContext, GivesItsLinksTheLastBaseBehindThem) {
    const json found = parsed(
        "<html><head><link rel=\"a\" href=\"x\"/><base href=\"/c/\"/>"
        "<link rel=\"b\" href=\"y\"/></head></html>",
        "http://a.b/d/");
    EXPECT_EQ(found["page"]["base"], "http://a.b/c/");
    EXPECT_EQ(found["page"]["links"][0]["url"], "http://a.b/c/x");
    EXPECT_EQ(found["page"]["links"][1]["url"], "http://a.b/d/y");
}

}  // namespace
