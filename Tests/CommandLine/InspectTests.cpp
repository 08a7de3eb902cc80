#include "CommandLine/Program.h"
#include "Support/EnvVar.h"
#include "Support/TempDir.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <algorithm>
#include <sstream>
#include <string>
#include <vector>

namespace {

using json = nlohmann::ordered_json;
using Support::ChildResult;
using testing::HasSubstr;
using testing::Not;

constexpr const char* kFeed = R"XML(<?xml version="1.0" encoding="utf-8"?>
<feed xmlns="http://www.w3.org/2005/Atom"
  xmlns:dc="http://purl.org/dc/elements/1.1/" xml:base="http://example.org/">
  <title>A &amp; B</title>
  <subtitle>Under</subtitle>
  <id>urn:feed</id>
  <rights>All</rights>
  <link rel="alternate" type="text/html" title="Home" href="home"/>
  <link rel="self" href="feed.xml"/>
  <icon>icon.png</icon>
  <logo>logo.png</logo>
  <updated>2005-10-21T02:12:34+02:00</updated>
  <published>2005-10-20T00:00:00Z</published>
  <author><name>Jane</name><email>jane@example.org</email></author>
  <contributor><name>Jim</name><uri>http://jim.example.org/</uri></contributor>
  <entry>
    <id>urn:1</id>
    <title>First</title>
    <rights>Some</rights>
    <link href="one"/>
    <link rel="enclosure" type="audio/mpeg" length="123" title="Sound" href="one.mp3"/>
    <author><name>Joe</name></author>
    <content type="html">&lt;p onclick="x()">One&lt;br>two</content>
    <summary>Short</summary>
    <dc:created>2005-10-18T00:00:00Z</dc:created>
    <published>2005-10-19T00:00:00Z</published>
    <updated>2005-10-19T12:00:00Z</updated>
  </entry>
  <entry>
    <title>Second</title>
    <content type="image/png">AAEC/w==</content>
  </entry>
</feed>
)XML";

std::vector<json> objects(const std::string& lines) {
    std::vector<json> all;
    std::istringstream stream(lines);
    for (std::string line; std::getline(stream, line);) {
        all.push_back(json::parse(line));
    }
    return all;
}

class Inspect : public testing::Test {
 protected:
    /// The one object that inspecting a document with these options gives.
    json inspect(const std::string& document, std::vector<std::string> options = {}) {
        options.insert(options.begin(), {"inspect", "--json"});
        options.push_back(mDir.writeFile("document", document));
        const ChildResult result = runOrvane(options);
        EXPECT_EQ(result.status, 0) << result.err;
        const std::vector<json> all = objects(result.out);
        EXPECT_EQ(all.size(), 1U);
        return all.empty() ? json() : all[0];
    }

    Support::TempDir mDir;
};

std::vector<std::string> keysOf(const json& object) {
    std::vector<std::string> keys;
    for (const auto& [key, value] : object.items())
        keys.push_back(key);
    return keys;
}

using Keys = std::vector<std::string>;

TEST_F(Inspect, WritesTheFieldsInTheirOrder) {
    const json found = inspect(kFeed);
    EXPECT_EQ(keysOf(found), (Keys{"file", "kind", "format", "attempts", "tidiedWith", "feed",
                                   "entries", "info", "page", "friend"}));
    EXPECT_EQ(keysOf(found["feed"]), (Keys{"title", "subtitle", "id", "rights", "alternateUrl",
                                           "iconUrl", "logoUrl", "dateUpdated", "url"}));
    EXPECT_EQ(keysOf(found["entries"][0]),
              (Keys{"id", "title", "rights", "alternateUrl", "baseUrl", "author", "content",
                    "contentType", "summary", "summaryType", "dateCreated", "datePublished",
                    "dateUpdated", "enclosures", "xmlHash"}));
    EXPECT_EQ(keysOf(found["info"]),
              (Keys{"links", "defaultAuthors", "defaultContributors", "defaultTimePublished"}));
}

TEST_F(Inspect, TellsOfAFeed) {
    const json found = inspect(kFeed);
    EXPECT_EQ(found["file"], mDir / "document");
    EXPECT_EQ(found["kind"], "feed");
    EXPECT_EQ(found["format"], 2);
    EXPECT_EQ(found["attempts"], 1);
    EXPECT_EQ(found["tidiedWith"], nullptr);
    EXPECT_EQ(found["feed"], (json{{"title", "A & B"},
                                   {"subtitle", "Under"},
                                   {"id", "urn:feed"},
                                   {"rights", "All"},
                                   {"alternateUrl", "http://example.org/home"},
                                   {"iconUrl", "http://example.org/icon.png"},
                                   {"logoUrl", "http://example.org/logo.png"},
                                   {"dateUpdated", "2005-10-21T00:12:34Z"},
                                   {"url", "http://example.org/"}}));
    EXPECT_EQ(found["page"], nullptr);
    EXPECT_EQ(found["friend"], nullptr);
}

TEST_F(Inspect, TellsOfWhatAFeedHasForItsEntries) {
    const json info = inspect(kFeed)["info"];
    EXPECT_EQ(info["links"][0], (json{{"rel", "alternate"},
                                      {"type", "text/html"},
                                      {"title", "Home"},
                                      {"href", "home"},
                                      {"url", "http://example.org/home"},
                                      {"kind", 7}}));
    EXPECT_EQ(info["links"][1]["kind"], 6);
    EXPECT_EQ(info["links"][1]["type"], nullptr);
    EXPECT_EQ(info["defaultAuthors"],
              json::array({{{"name", "Jane"}, {"email", "jane@example.org"}, {"url", nullptr}}}));
    EXPECT_EQ(info["defaultContributors"][0]["url"], "http://jim.example.org/");
    EXPECT_EQ(info["defaultTimePublished"], "2005-10-20T00:00:00Z");
}

TEST_F(Inspect, TellsOfEntries) {
    const json entries = inspect(kFeed)["entries"];
    ASSERT_EQ(entries.size(), 2U);
    json first = entries[0];
    const std::string hash = first["xmlHash"];
    EXPECT_EQ(hash.size(), 40U);
    EXPECT_EQ(hash.find_first_not_of("0123456789abcdef"), std::string::npos);
    first.erase("xmlHash");
    EXPECT_EQ(first, (json{{"id", "urn:1"},
                           {"title", "First"},
                           {"rights", "Some"},
                           {"alternateUrl", "http://example.org/one"},
                           {"baseUrl", "http://example.org/"},
                           {"author", {{"name", "Joe"}, {"email", nullptr}, {"url", nullptr}}},
                           {"content", "<p onclick=\"x()\">One<br>two"},
                           {"contentType", "text/html"},
                           {"summary", "Short"},
                           {"summaryType", "text/plain"},
                           {"dateCreated", "2005-10-18T00:00:00Z"},
                           {"datePublished", "2005-10-19T00:00:00Z"},
                           {"dateUpdated", "2005-10-19T12:00:00Z"},
                           {"enclosures", json::array({{{"url", "http://example.org/one.mp3"},
                                                        {"mimeType", "audio/mpeg"},
                                                        {"length", 123},
                                                        {"title", "Sound"}}})}}));
}

TEST_F(Inspect, GivesNullForWhatIsNotThere) {
    const json entry = inspect("<rss><channel><item/></channel></rss>")["entries"][0];
    for (const auto& [key, value] : entry.items()) {
        if (key == "enclosures") {
            EXPECT_EQ(value, json::array());
        } else if (key != "xmlHash") {
            EXPECT_EQ(value, nullptr) << key;
        }
    }
}

TEST_F(Inspect, GivesBinaryContentAsBase64WithItsType) {
    const json second = inspect(kFeed)["entries"][1];
    EXPECT_EQ(second["content"], "AAEC/w==");
    EXPECT_EQ(second["contentType"], "image/png");
    EXPECT_EQ(second["author"]["name"], "Jane");
    EXPECT_EQ(second["datePublished"], "2005-10-20T00:00:00Z");
}

TEST_F(Inspect, PadsBase64OfEveryLength) {
    for (const char* data : {"AAEC/w==", "AAEC//4=", "AAEC//79"}) {
        const std::string document = "<feed><entry><content type='image/png'>" + std::string(data) +
                                     "</content></entry></feed>";
        EXPECT_EQ(inspect(document)["entries"][0]["content"], data);
    }
}

TEST_F(Inspect, TidiesContentsIfAskedTo) {
    const json first = inspect(kFeed, {"--tidied"})["entries"][0];
    EXPECT_THAT(first["content"], HasSubstr("<br />"));
    EXPECT_THAT(first["content"], HasSubstr("</p>"));
    EXPECT_EQ(first["summary"], "Short");
}

TEST_F(Inspect, CountsRelativeURLsFromTheBase) {
    const std::string document = "<feed><title>T</title><link href='x'/></feed>";
    const json found = inspect(document, {"--base", "http://base.example.org/a/b"});
    EXPECT_EQ(found["feed"]["alternateUrl"], "http://base.example.org/a/x");
    EXPECT_EQ(found["feed"]["url"], "http://base.example.org/a/b");
    EXPECT_EQ(inspect(document)["feed"]["url"], nullptr);
}

TEST_F(Inspect, TellsHowADocumentWasRepaired) {
    const json found = inspect("<rss><channel><title>T</title><item><title>U</title>");
    EXPECT_EQ(found["attempts"], 2);
    EXPECT_EQ(found["tidiedWith"], "FeedTidier");
    EXPECT_EQ(found["entries"][0]["title"], "U");
}

TEST_F(Inspect, FindsTheTidierInItsOwnTree) {
    const Support::EnvVar programs("ORVANE_PROGRAMS", nullptr);
    // Too long to be repaired in the process.
    const json found = inspect("<rss><channel><title>T</title><description>" +
                               std::string(100000, 'x') + "</description><item>");
    EXPECT_EQ(found["attempts"], 2);
    EXPECT_EQ(found["kind"], "feed");
}

TEST_F(Inspect, TellsOfASingleEntry) {
    const json found =
        inspect("<entry xmlns='http://www.w3.org/2005/Atom'><title>T</title></entry>");
    EXPECT_EQ(found["kind"], "entry");
    EXPECT_EQ(found["format"], 2);
    EXPECT_EQ(found["feed"], nullptr);
    EXPECT_EQ(found["entries"][0]["title"], "T");
}

TEST_F(Inspect, TellsOfAPage) {
    const json found = inspect(
        "<html><head><link rel='alternate' type='application/rss+xml' href='f'/>"
        "<base href='http://example.org/p/'/></head><body/></html>");
    EXPECT_EQ(found["kind"], "page");
    EXPECT_EQ(found["page"]["base"], "http://example.org/p/");
    EXPECT_EQ(found["page"]["links"], json::array({{{"rel", "alternate"},
                                                    {"type", "application/rss+xml"},
                                                    {"title", nullptr},
                                                    {"href", "f"},
                                                    {"url", "http://example.org/p/f"},
                                                    {"kind", 1}}}));
    EXPECT_EQ(found["entries"], json::array());
}

TEST_F(Inspect, TellsOfAPerson) {
    const json found = inspect(
        "<rdf:RDF xmlns:rdf='http://www.w3.org/1999/02/22-rdf-syntax-ns#' "
        "xmlns='http://xmlns.com/foaf/0.1/'><Person><name>Ann</name><nick>A</nick>"
        "<knows><Person><name>Bob</name></Person></knows></Person></rdf:RDF>");
    EXPECT_EQ(found["kind"], "friend");
    const json& person = found["friend"];
    EXPECT_EQ(keysOf(person), (Keys{"name", "firstName", "familyName", "nick", "url", "knows"}));
    EXPECT_EQ(person["name"], "Ann");
    EXPECT_EQ(person["nick"], "A");
    EXPECT_EQ(person["knows"][0]["name"], "Bob");
    EXPECT_EQ(person["knows"][0]["knows"], json::array());
}

TEST_F(Inspect, WritesOneLineWhateverCountsAsItsEnd) {
    const std::string breaks =
        "a\xC2\x85"
        "b\xE2\x80\xA8"
        "c\xE2\x80\xA9"
        "d";
    const std::string file =
        mDir.writeFile("in", "<feed><entry><content>" + breaks + "</content></entry></feed>");
    const ChildResult result = runOrvane({"inspect", "--json", file});
    EXPECT_THAT(result.out, HasSubstr("a\\u0085b\\u2028c\\u2029d"));
    EXPECT_EQ(std::count(result.out.begin(), result.out.end(), '\n'), 1);
}

TEST_F(Inspect, TellsOfNothing) {
    const json found = inspect("");
    EXPECT_EQ(found["kind"], "unknown");
    EXPECT_EQ(found["format"], 0);
    EXPECT_EQ(found["attempts"], 1);
    EXPECT_EQ(found["info"]["links"], json::array());
    EXPECT_EQ(found["info"]["defaultTimePublished"], nullptr);
}

TEST_F(Inspect, ReadsStandardInput) {
    const ChildResult result =
        runInShell("\"$0\" inspect --json - <\"$1\"", {mDir.writeFile("in", kFeed)});
    EXPECT_EQ(result.status, 0) << result.err;
    const json found = json::parse(result.out);
    EXPECT_EQ(found["file"], "-");
    EXPECT_EQ(found["feed"]["title"], "A & B");
}

TEST_F(Inspect, GoesOnBehindAFileThatCannotBeRead) {
    const std::string missing = mDir / "missing";
    const std::string folder = mDir.makeDirectory("folder");
    const std::string there = mDir.writeFile("there", kFeed);
    const ChildResult result = runOrvane({"inspect", "--json", missing, folder, there});
    EXPECT_EQ(result.status, 4);
    const std::vector<json> all = objects(result.out);
    ASSERT_EQ(all.size(), 1U);
    EXPECT_EQ(all[0]["file"], there);
    EXPECT_EQ(result.err, "orvane inspect: " + missing + ": No such file or directory\n" +
                              "orvane inspect: " + folder + ": Is a directory\n");
}

TEST_F(Inspect, FailsIfStandardOutputIsFull) {
    const ChildResult result =
        runInShell("\"$0\" inspect --json \"$1\" >/dev/full", {mDir.writeFile("in", kFeed)});
    EXPECT_EQ(result.status, 5);
    EXPECT_THAT(result.err, HasSubstr("standard output: No space left on device"));
}

#ifndef __SANITIZE_ADDRESS__  // which keeps what is freed for a while
TEST_F(Inspect, KeepsNothingOfFilesThatAreDone) {
    std::string feed = "<rss><channel>";
    for (int i = 0; i < 100; ++i) {
        feed += "<item><title>T" + std::to_string(i) + "</title><description>" +
                std::string(1000, 'x') + "</description></item>";
    }
    const std::string file = mDir.writeFile("feed", feed + "</channel></rss>");
    const auto peakOf = [&](std::size_t copies) {
        std::vector<std::string> arguments(copies + 2, file);
        arguments[0] = "inspect";
        arguments[1] = "--json";
        const ChildResult result = runOrvane(arguments);
        EXPECT_EQ(result.status, 0);
        EXPECT_EQ(std::count(result.out.begin(), result.out.end(), '\n'), copies);
        return result.peakBytes;
    };
    const std::size_t few = peakOf(10);
    EXPECT_LT(peakOf(500), few + (4U << 20));
}
#endif

TEST_F(Inspect, ShowsPeopleAFeedInLines) {
    const ChildResult result = runOrvane({"inspect", mDir.writeFile("in", kFeed)});
    EXPECT_EQ(result.status, 0);
    EXPECT_THAT(result.out, HasSubstr("/in: a feed (Atom), attempt 1\n"));
    EXPECT_THAT(result.out, HasSubstr("  Title       A & B\n"));
    EXPECT_THAT(result.out, HasSubstr("  Link        http://example.org/home (page, \"Home\")\n"));
    EXPECT_THAT(result.out, HasSubstr("  1. First\n"));
    EXPECT_THAT(result.out, HasSubstr("     Content     text/html, 27 bytes\n"));
    EXPECT_THAT(result.out,
                HasSubstr("     Enclosure   http://example.org/one.mp3 (audio/mpeg, 123 bytes)\n"));
}

TEST_F(Inspect, LetsNoDocumentControlTheTerminal) {
    const ChildResult result =
        runOrvane({"inspect", mDir.writeFile("in",
                                             "<rss><channel><title>A&amp;#27;[31mB&amp;#155;C\n"
                                             "D</title></channel></rss>")});
    EXPECT_THAT(result.out, Not(HasSubstr("\x1B")));
    EXPECT_THAT(result.out, Not(HasSubstr("\xC2\x9B")));
    EXPECT_THAT(result.out, HasSubstr("  Title       A[31mB"));
}

}  // namespace
