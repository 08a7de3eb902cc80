#include "FeedParser/Parser.h"

#include "FeedParser/ParsedDocument.h"
#include "Foundation/AutoreleasePool.h"
#include "SQLite/Database.h"
#include "Support/LogCapture.h"
#include "Support/ManualClock.h"
#include "Support/TempDir.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <string>

using namespace Foundation;
using namespace Orvane;
using FeedParser::Info;
using FeedParser::Parser;
using nlohmann::json;

namespace {

std::string rss(const std::string& channel) {
    return "<rss version=\"2.0\"><channel>" + channel + "</channel></rss>";
}

/// So much text that libxml2 has handed the first element over before it gets to the end.
std::string padding() {
    return "<!-- " + std::string(2000, 'x') + " -->";
}

class ParserTest : public testing::Test {
 protected:
    ParserTest() { SQLite::Database::initialize(); }
    ~ParserTest() noexcept override {}

    std::string lastLine() const { return log.lines().empty() ? "" : log.lines().back(); }

    AutoreleasePool pool;
    Support::LogCapture log;
    Support::LoggingOn on{{&gLogParser, &gLogTidier}};
};

// The attempts

TEST_F(ParserTest, MakesOneLoggedAttemptAtNoData) {
    for (const Ref<Data>& data : {Ref<Data>(), Ref<Data>(Data::data("", 0))}) {
        log.clear();
        const Parser parser(data.get(), nullptr);
        EXPECT_EQ(parser.getInfo()->kind, Info::UnknownKind);
        EXPECT_EQ(log.lines(), (std::vector<std::string>{
                                   "[Parser] Beginning attempt #1",
                                   "[Parser] Finished parsing; mAttempt=0, mFatalError=0"}));
    }
}

TEST_F(ParserTest, ReadsAWellFormedFeedInOneAttempt) {
    const json found = parsed(rss("<title>A</title><item><title>B</title></item>"));
    EXPECT_EQ(found["kind"], "feed");
    EXPECT_EQ(found["format"], 1);
    EXPECT_EQ(found["attempts"], 1);
    EXPECT_EQ(found["tidiedWith"], nullptr);
    EXPECT_EQ(found["feed"]["title"], "A");
    EXPECT_EQ(valueAt(found, "entries.count"), 1);
    EXPECT_EQ(valueAt(found, "entries[0].title"), "B");
    EXPECT_EQ(lastLine(), "[Parser] Finished parsing; mAttempt=0, mFatalError=0");
}

TEST_F(ParserTest, RepairsAFeedWithATagThatIsNotClosed) {
    const std::string document = rss("<title>A</title><item><title>B</title>" + padding());
    const Ref<Data> data = Data::data(document.data(), document.size());
    const Parser parser(data.get(), nullptr);
    const json found = describe(parser);
    EXPECT_EQ(found["kind"], "feed");
    EXPECT_EQ(found["attempts"], 2);
    EXPECT_EQ(found["tidiedWith"], "FeedTidier");
    EXPECT_EQ(valueAt(found, "entries[0].title"), "B");
    EXPECT_EQ(lastLine(), "[Parser] Finished parsing; mAttempt=1, mFatalError=0");
    // What is kept is what was read.
    const Ref<Data> kept = parser.getInfo()->getFeed()->getXMLData();
    ASSERT_NE(kept.get(), nullptr);
    EXPECT_NE(kept->view(), data->view());
    EXPECT_NE(kept->view().find("</item>"), std::string_view::npos);
}

TEST_F(ParserTest, KeepsTheBytesOfAFeedThatNeedsNoRepair) {
    const std::string document = rss("<title>A</title>");
    const Ref<Data> data = Data::data(document.data(), document.size());
    const Parser parser(data.get(), nullptr);
    const Ref<Data> kept = parser.getInfo()->getFeed()->getXMLData();
    EXPECT_EQ(kept.get(), data.get());
}

TEST_F(ParserTest, GivesUpAfterFourFatalAttemptsOfWhichTheLastThreeReadTheTidiedBytes) {
    const json found = parsed("neither a tag nor a reference");
    EXPECT_EQ(found["kind"], "unknown");
    EXPECT_EQ(found["attempts"], 4);
    EXPECT_EQ(lastLine(), "[Parser] Finished parsing; mAttempt=4, mFatalError=1");
    for (const char* attempt : {"#1", "#2", "#3", "#4"}) {
        EXPECT_EQ(log.count(std::string("Beginning attempt ") + attempt), 1);
    }
    EXPECT_EQ(log.count("Tidying"), 1);
}

TEST_F(ParserTest, ForgetsWhatAFatalAttemptMade) {
    // Attempt 1 sees the first title and breaks off at the second element.
    const json found =
        parsed("<rss><channel><title>A</title>" + padding() + "<title>B</tittle></channel></rss>");
    EXPECT_EQ(found["attempts"], 2);
    EXPECT_EQ(valueAt(found, "entries.count"), 0);
    EXPECT_EQ(found["feed"]["title"], "B");
}

TEST_F(ParserTest, ResetsTheIndentationOfItsLogs) {
    gLogParser.indent();
    gLogParserVerbose.indent();
    parsed(rss(""));
    EXPECT_EQ(gLogParser.mIndentation, 0u);
    EXPECT_EQ(gLogParserVerbose.mIndentation, 0u);
    EXPECT_EQ(log.lines().front(), "[Parser]     Beginning attempt #1");
    EXPECT_EQ(lastLine(), "[Parser] Finished parsing; mAttempt=0, mFatalError=0");
}

TEST_F(ParserTest, ForcesWindowsLatinUponTheThirdAttempt) {
    // No repair knows the encoding, so it stays the one that the document names.
    const json found = parsed("<?xml version=\"1.0\" encoding=\"x-unknown\"?>" +
                              rss("<title>caf\xE9 \x80</title>"));
    EXPECT_EQ(found["feed"]["title"], "caf\xC3\xA9 \xE2\x82\xAC");
    EXPECT_EQ(found["attempts"], 3);
    EXPECT_EQ(lastLine(), "[Parser] Finished parsing; mAttempt=2, mFatalError=0");
}

// Errors

TEST_F(ParserTest, SaysWhichErrorsAreFatalAndWhereTheyAre) {
    parsed("<rss>\n<channel>\n</b></channel></rss>");
    EXPECT_TRUE(log.contains("[Parser] Fatal Error 76, Line 2: Opening and ending tag mismatch"));
}

TEST_F(ParserTest, TakesAnyErrorInAFeedForAReasonToRepairIt) {
    // libxml2 itself goes on after an undeclared prefix.
    const json found =
        parsed(rss("<title>A</title>" + padding() + "<item><x:y/><title>B</title></item>"));
    EXPECT_EQ(found["kind"], "feed");
    EXPECT_EQ(found["attempts"], 2);
    EXPECT_EQ(valueAt(found, "entries[0].title"), "B");
    EXPECT_TRUE(log.contains("[Parser] Error 201, Line 1: Namespace prefix x on y is not defined"));
    EXPECT_TRUE(log.contains("[Parser] Fatal error: xmlTextReaderReadOuter/InnerXml failed"));
}

TEST_F(ParserTest, LetsNamesMatchWithAnyPrefixOnceOneIsNotDeclared) {
    const std::string item =
        "<item><x:date>2005-10-21T00:12:34Z</x:date><creator>C</creator>"
        "<y:encoded xmlns:y=\"urn:y\">text</y:encoded></item>";
    // Of a small feed libxml2 has read all before the first element counts, so nothing is lost.
    for (const auto& [more, attempts] : {std::pair(std::string(), 1), std::pair(padding(), 2)}) {
        const json found = parsed(rss(more + item));
        EXPECT_EQ(valueAt(found, "entries[0].datePublished"), "2005-10-21T00:12:34Z");
        EXPECT_EQ(valueAt(found, "entries[0].author.name"), "C");
        EXPECT_EQ(valueAt(found, "entries[0].content"), "text");
        EXPECT_EQ(found["attempts"], attempts);
    }
}

TEST_F(ParserTest, LetsThemMatchAlsoWhereTheRepairFoundThePrefix) {
    // Attempt 1 ends at the tag that does not fit, before it gets to the prefix.
    const json found = parsed("<rss></b><channel><item>" + padding() +
                              "<x:date>2005-10-21T00:12:34Z</x:date></item></channel></rss>");
    EXPECT_EQ(valueAt(found, "entries[0].datePublished"), "2005-10-21T00:12:34Z");
    EXPECT_FALSE(log.contains("Error 201"));
}

TEST_F(ParserTest, ReadsOnFromTheNextElementWithAnyPrefixInWhatIsNotExpanded) {
    const json found = parsed("<p:Person xmlns:p=\"http://xmlns.com/foaf/0.1/\"><x:y>z</x:y>" +
                              padding() + "<q:nick xmlns:q=\"urn:q\">N</q:nick></p:Person>");
    EXPECT_EQ(found["kind"], "friend");
    EXPECT_EQ(found["attempts"], 1);
    EXPECT_EQ(found["friend"]["nick"], "N");
}

TEST_F(ParserTest, MatchesNoForeignNamesWithoutAPrefixOtherwise) {
    const json found =
        parsed(rss("<item><date>2005-10-21T00:12:34Z</date><creator>C</creator>"
                   "<x:nick xmlns:x=\"urn:x\">n</x:nick></item>"));
    EXPECT_EQ(valueAt(found, "entries[0].datePublished"), nullptr);
    EXPECT_EQ(valueAt(found, "entries[0].author"), nullptr);
    EXPECT_EQ(found["attempts"], 1);
}

class Recovery : public ParserTest, public testing::WithParamInterface<const char*> {};

TEST_P(Recovery, ReadsWhatNoRepairTakesAway) {
    const json found = parsed(rss("<title>\xC3\x84</title>" + padding() + "<item>" + GetParam() +
                                  "<title>B</title></item>"));
    EXPECT_EQ(found["kind"], "feed");
    EXPECT_EQ(found["feed"]["title"], "\xC3\x84");
    EXPECT_EQ(valueAt(found, "entries[0].title"), "B");
}
INSTANTIATE_TEST_SUITE_P(All, Recovery,
                         testing::Values("<x xml:id=\"a\"/><x xml:id=\"a\"/>", "<x xml:id=\"1\"/>",
                                         "<x xml:space=\"other\"/>", "<x xmlns:a=\"no uri\"/>",
                                         "<a:b:c xmlns:a=\"urn:a\"/>", "<x a:b=\"c\"/>"));

TEST_F(ParserTest, WarnsOfAnEndTagWithoutItsElementAndGoesOn) {
    // The text of the outer title ends at the first end of a title.
    const json found =
        parsed(rss("<title>A<title>B</title>C</title><item><title>D</title></item>"));
    EXPECT_EQ(found["attempts"], 1);
    EXPECT_EQ(log.count("[WARNING] FeedParser::handleEndElement: no tag matching 'TitleTag' on "
                        "stack! (localname='title', prefix='(null)')"),
              1);
    EXPECT_EQ(valueAt(found, "entries[0].title"), "D");
}

// Entities and encodings

TEST_F(ParserTest, KnowsTheEntitiesOfHTMLWithoutADocumentType) {
    for (const std::string& more : {std::string(), padding()}) {
        const json found = parsed(rss(more + "<item><title>caf&eacute; &tau;</title>"
                                             "<link href=\"http://a/&eacute;\"/></item>"));
        EXPECT_EQ(found["attempts"], 1);
        EXPECT_EQ(valueAt(found, "entries[0].title"), "caf\xC3\xA9 \xCE\xA4");
        EXPECT_EQ(valueAt(found, "entries[0].alternateUrl"), "http://a/%C3%A9");
        // They stay in the XML.
        const std::string xml = valueAt(found, "entries[0].xml");
        EXPECT_NE(xml.find("<title>caf&eacute; &tau;</title>"), std::string::npos);
        EXPECT_FALSE(log.contains("] Error "));
    }
}

TEST_F(ParserTest, KnowsThemWithADocumentTypeOfItsOwn) {
    const json found = parsed("<!DOCTYPE rss SYSTEM \"http://a/b.dtd\" [<!ENTITY own \"O\">]>" +
                              rss("<title>&eacute;&own;</title>"));
    EXPECT_EQ(found["attempts"], 1);
    EXPECT_FALSE(log.contains("] Error "));
}

TEST_F(ParserTest, RepairsReferencesToEntitiesThatNobodyDeclared) {
    const json found = parsed(rss("<title>A &foo; &amp; B & C</title>"));
    EXPECT_EQ(found["attempts"], 2);
    EXPECT_EQ(found["feed"]["title"], "A &foo; & B & C");
}

TEST_F(ParserTest, OpensNoFileForAnEntityOrADocumentType) {
    const Support::TempDir folder;
    const std::string secret = "file://" + folder.writeFile("secret", "SECRET");
    const std::string dtd = "file://" + folder.writeFile("types", "<!ENTITY more \"MORE\">");
    const json found = parsed("<!DOCTYPE rss SYSTEM \"" + dtd + "\" [<!ENTITY secret SYSTEM \"" +
                              secret + "\"><!ENTITY % all SYSTEM \"" + dtd + "\"> %all;]>" +
                              rss("<title>A &secret; &more;</title><item><link href=\"http://a/"
                                  "\"/><description>&secret;</description></item>"));
    EXPECT_EQ(found["kind"], "feed");
    EXPECT_EQ(found.dump().find("SECRET"), std::string::npos);
    EXPECT_EQ(found.dump().find("MORE"), std::string::npos);
}

TEST_F(ParserTest, TakesWhatIsNotTheUTF8ThatItClaimsToBeForLatin1) {
    const json found = parsed("<?xml version=\"1.0\" encoding=\"UTF-8\"?>" +
                              rss(padding() + "<title>caf\xE9</title>"));
    EXPECT_EQ(found["feed"]["title"], "caf\xC3\xA9");
    EXPECT_EQ(found["attempts"], 2);
    EXPECT_TRUE(log.contains("(class=FeedTidier, encoding=10, baseURL="));
}

TEST_F(ParserTest, DoesNotTakeItForLatin1BecauseOfAControlCharacter) {
    const json found = parsed(rss(padding() + "<title>caf\xC3\xA9\x08!</title>"));
    EXPECT_EQ(found["feed"]["title"], "caf\xC3\xA9!");
    EXPECT_FALSE(log.contains("encoding=10"));
}

TEST_F(ParserTest, RepairsTextOfAnyEncoding) {
    // "Привет" in windows-1251, in a feed that is not well-formed.
    const json found = parsed(
        "<?xml version=\"1.0\" encoding=\"windows-1251\"?><rss><channel>"
        "<title>\xCF\xF0\xE8\xE2\xE5\xF2 &#8212; <b></title></channel></rss>");
    EXPECT_EQ(found["attempts"], 2);
    EXPECT_EQ(found["feed"]["title"], "Привет — ");
}

TEST_F(ParserTest, ReadsEncodingsByTheirOtherNames) {
    for (const char* name : {"windows_1251", "mac-cyrillic", "mac_cyrillic"}) {
        const bool isMac = std::string(name).starts_with("mac");
        const json found = parsed("<?xml version=\"1.0\" encoding=\"" + std::string(name) + "\"?>" +
                                  rss(isMac ? "<title>\x8F</title>" : "<title>\xCF</title>"));
        EXPECT_EQ(found["feed"]["title"], "П") << name;
        EXPECT_EQ(found["attempts"], 1) << name;
    }
}

// What stands around a feed

class Mending : public ParserTest, public testing::WithParamInterface<const char*> {};

TEST_P(Mending, ReadsTheFeed) {
    const json found = parsed(GetParam());
    EXPECT_EQ(found["kind"], "feed");
    EXPECT_EQ(found["feed"]["title"], "A");
    EXPECT_EQ(valueAt(found, "entries[0].title"), "B");
    EXPECT_EQ(valueAt(found, "entries.count"), 1);
}
INSTANTIATE_TEST_SUITE_P(
    All, Mending,
    testing::Values(
        // White space, text and markup in front of the declaration.
        "\n <?xml version=\"1.0\"?><rss><channel><title>A</title><item><title>B</title></item>"
        "</channel></rss>",
        "Warning: x on line 1 <?xml version=\"1.0\"?><rss><channel><title>A</title><item><title>B"
        "</title></item></channel></rss>",
        "<br />\n<b>Warning</b>: x<br />\n<?xml version=\"1.0\"?><rss><channel><title>A</title>"
        "<item><title>B</title></item></channel></rss>",
        "junk<rss><channel><title>A</title><item><title>B</title></item></channel></rss>",
        // Behind the root.
        "<rss><channel><title>A</title><item><title>B</title></item></channel></rss>junk<b>&",
        "<rss><channel><title>A</title><item><title>B</title></item></channel></rss><rss/>",
        // Characters that no document may have.
        "<rss><channel><title>A\x01\x08</title><item><title>B&#8;\x0b</title></item></channel>"
        "</rss>",
        // A missing end.
        "<rss><channel><title>A</title><item><title>B</title></item>",
        "<rss><channel><title>A</title><item><title>B",
        // Tags that do not fit.
        "<rss><channel><title>A</b></title><item><title>B</title></i></item></channel></rss>",
        "<rss><channel><title>A</title><item><title>B</title><description>x<br>y<p></description>"
        "</item></channel></rss>",
        // Attributes that are not quoted, or twice there.
        "<rss version=2.0><channel><title x=1 x=2>A</title><item><title>B</title></item></channel>"
        "</rss>"));

// Pages

TEST_F(ParserTest, ReadsAPageUpToTheEndOfItsHead) {
    const json found = parsed(
        "<html xmlns=\"http://www.w3.org/1999/xhtml\"><head>"
        "<link rel=\"alternate\" type=\"application/rss+xml\" "
        "href=\"f.xml\"/></head><body>" +
            padding() + "<p>broken & <b>",
        "http://a.b/c/");
    EXPECT_EQ(found["kind"], "page");
    EXPECT_EQ(found["attempts"], 1);
    EXPECT_EQ(found["page"]["base"], "http://a.b/c/");
    EXPECT_EQ(found["page"]["links"][0]["url"], "http://a.b/c/f.xml");
    EXPECT_EQ(found["page"]["links"][0]["kind"], 1);
}

TEST_F(ParserTest, GoesOnInAPageAfterErrorsThatAreNotFatal) {
    const json found = parsed(
        "<html><head x:y=\"z\"><link rel=\"a\" href=\"http://a/\"/></head>"
        "<body/></html>");
    EXPECT_EQ(found["attempts"], 1);
    EXPECT_TRUE(log.contains("Error 201"));
    EXPECT_EQ(found["page"]["links"].size(), 1u);
}

TEST_F(ParserTest, TidiesAPageThatHasEndedAsHTMLAlone) {
    const json found = parsed("<html><head><link rel=\"a\" href=\"http://a/\"/></head2></html>");
    EXPECT_EQ(found["kind"], "page");
    EXPECT_EQ(found["tidiedWith"], "HTMLDocumentTidier");
    EXPECT_EQ(found["page"]["links"].size(), 1u);
}

TEST_F(ParserTest, FindsAllLinksOfAPageThatIsNoXML) {
    const json found = parsed(
        "<!DOCTYPE html><html lang=en><head><meta charset=utf-8><title>A & B</title>"
        "<script>if (a < b) document.write('<link rel=x href=no>')</script>"
        "<link rel=stylesheet href=/s.css><!-- <link rel=no href=no> -->"
        "<my-element></my-element><noscript><link rel=\"n\" href=\"n\"></noscript>"
        "<div>the head has ended, for a repair</div>"
        "<link rel='alternate' title=\"two\nlines &amp; &nbsp;&copy=1\" href=\"?a=1&b=2\">"
        "</head><body><link rel=no href=no>",
        "http://a.b/");
    EXPECT_EQ(found["kind"], "page");
    EXPECT_EQ(found["tidiedWith"], "HTMLDocumentTidier");
    const json& links = found["page"]["links"];
    ASSERT_EQ(links.size(), 3u) << links.dump();
    EXPECT_EQ(links[0]["href"], "/s.css");
    EXPECT_EQ(links[1]["rel"], "n");
    EXPECT_EQ(links[2]["title"], "two\nlines & \xC2\xA0&copy=1");
    EXPECT_EQ(links[2]["url"], "http://a.b/?a=1&b=2");
    EXPECT_EQ(links[2]["kind"], 7);
}

TEST_F(ParserTest, FindsTheLinksOfAPageThatBreaksOffInItsHead) {
    const json found = parsed(
        "<html><head><link rel=a href=b><script>never ends <link rel=c "
        "href=d><title>");
    EXPECT_EQ(found["kind"], "page");
    EXPECT_EQ(found["page"]["links"].size(), 2u);
}

TEST_F(ParserTest, ReadsAPageInTheEncodingThatItDeclares) {
    const json found = parsed(
        "<html><head><meta charset=windows-1251><link rel=a title=\xCF "
        "href=b></head>");
    EXPECT_EQ(found["page"]["links"][0]["title"], "П");
}

// Results

TEST_F(ParserTest, CountsEntriesByHundredthsOfASecond) {
    Support::ManualClock clock;
    const std::string document = rss("<item/><item><title>B</title></item><item/>");
    const Ref<Data> data = Data::data(document.data(), document.size());
    const Parser parser(data.get(), nullptr);
    double expected = Support::ManualClock::kStart;
    for (auto entry = parser.getInfo()->getFeed()->getEntries(nullptr); entry.hasRow();
         entry.nextRow()) {
        expected -= 0.01;
        ASSERT_NE(entry->mLocalDateCreated.getValue(), nullptr);
        EXPECT_DOUBLE_EQ(entry->mLocalDateCreated.getValue()->getAbsoluteTime(), expected);
        EXPECT_TRUE(entry->mCurrent.getValue());
    }
    EXPECT_DOUBLE_EQ(expected, Support::ManualClock::kStart - 0.01 - 0.01 - 0.01);
}

TEST_F(ParserTest, GivesEntriesTheAuthorAndTheDateOfTheirFeed) {
    const json found = parsed(
        "<feed xmlns=\"http://www.w3.org/2005/Atom\"><author><name>F</name></author>"
        "<published>2005-10-21T00:12:34Z</published><entry/><entry><author><name>E</name>"
        "</author><published>2006-01-01T00:00:00Z</published></entry></feed>");
    EXPECT_EQ(valueAt(found, "entries[0].author.name"), "F");
    EXPECT_EQ(valueAt(found, "entries[0].datePublished"), "2005-10-21T00:12:34Z");
    EXPECT_EQ(valueAt(found, "entries[1].author.name"), "E");
    EXPECT_EQ(valueAt(found, "entries[1].datePublished"), "2006-01-01T00:00:00Z");
    EXPECT_EQ(valueAt(found, "info.defaultAuthors[0].name"), "F");
    EXPECT_EQ(valueAt(found, "info.defaultTimePublished"), "2005-10-21T00:12:34Z");
}

TEST_F(ParserTest, IgnoresDefaultAuthorsWhoAreNobody) {
    const json found = parsed(
        "<feed xmlns=\"http://www.w3.org/2005/Atom\"><author/>"
        "<contributor><name/></contributor></feed>");
    EXPECT_TRUE(found["info"]["defaultAuthors"].empty());
    EXPECT_TRUE(found["info"]["defaultContributors"].empty());
}

TEST_F(ParserTest, GivesThePartsOfItsResultByKind) {
    const std::string document = rss("");
    const Ref<Data> data = Data::data(document.data(), document.size());
    const Parser parser(data.get(), nullptr);
    const Info& info = *parser.getInfo();
    EXPECT_EQ(info.parser, &parser);
    EXPECT_NE(info.getFeed(), nullptr);
    EXPECT_EQ(info.getEntry(), nullptr);
    EXPECT_EQ(info.getPage(), nullptr);
    EXPECT_EQ(info.getFriend(), nullptr);
}

TEST_F(ParserTest, LeavesAResultThatOutlivesIt) {
    Ref<Info> info;
    {
        const std::string document = rss("<title>A</title>");
        const Ref<Data> data = Data::data(document.data(), document.size());
        const Parser parser(data.get(), nullptr);
        info = parser.getInfo();
    }
    EXPECT_EQ(info->parser, nullptr);
    EXPECT_EQ(info->getFeed()->mTitle.getValue()->utf8(), "A");
}

TEST_F(ParserTest, ReadsALoneEntry) {
    const json found = parsed(
        "<entry xmlns=\"http://www.w3.org/2005/Atom\"><title>E</title>"
        "</entry>");
    EXPECT_EQ(found["kind"], "entry");
    EXPECT_EQ(found["format"], 2);
    EXPECT_EQ(valueAt(found, "entries[0].title"), "E");
    EXPECT_EQ(parsed("<item><title>E</title></item>")["format"], 1);
}

TEST_F(ParserTest, FollowsTheBaseURLsInTheDocument) {
    const json found = parsed(
        "<feed xmlns=\"http://www.w3.org/2005/Atom\" xml:base=\"d/\"><link href=\"x\"/>"
        "<entry xml:base=\"e/\"><link href=\"y\"/></entry><entry><link href=\"z\"/></entry></feed>",
        "http://a.b/c");
    EXPECT_EQ(found["feed"]["alternateUrl"], "http://a.b/d/x");
    EXPECT_EQ(found["feed"]["url"], "http://a.b/d/");
    EXPECT_EQ(valueAt(found, "entries[0].alternateUrl"), "http://a.b/d/e/y");
    EXPECT_EQ(valueAt(found, "entries[0].baseUrl"), "http://a.b/d/e/");
    EXPECT_EQ(valueAt(found, "entries[1].alternateUrl"), "http://a.b/d/z");
}

}  // namespace
