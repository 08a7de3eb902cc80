#include "FeedParser/Text/Bounds.h"

#include "FeedParser/ParsedDocument.h"
#include "FeedParser/Text/TidyHelper.h"
#include "Foundation/AutoreleasePool.h"
#include "SQLite/Database.h"
#include "Support/EnvVar.h"
#include "Support/LogCapture.h"
#include "Support/TempDir.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <string>

using nlohmann::json;
namespace Bounds = Orvane::FeedParser::Bounds;

namespace {

constexpr std::size_t kMiB = 1U << 20;

const char* const kRSS = "<rss><channel>";
const char* const kEnd = "</channel></rss>";

std::string repeated(const std::string& text, std::size_t times) {
    std::string all;
    all.reserve(text.size() * times);
    for (std::size_t i = 0; i < times; ++i) {
        all += text;
    }
    return all;
}

class DocumentBounds : public testing::Test {
 protected:
    DocumentBounds() { SQLite::Database::initialize(); }
    ~DocumentBounds() noexcept override {}

    Foundation::AutoreleasePool pool;
    Support::LogCapture log;
    Support::LoggingOn on{{&Orvane::gLogParser}};
};

TEST_F(DocumentBounds, EndTheReadingOfADocumentOfTooManyTags) {
    EXPECT_EQ(parsed(kRSS + repeated("<a/>", 2500000) + kEnd)["kind"], "unknown");
    EXPECT_TRUE(log.contains("A document has reached the bound \"tags\""));
}

TEST_F(DocumentBounds, KeepTheEntriesThatAFeedMayHave) {
    const json found = parsed(kRSS + repeated("<item/>", Bounds::kEntries + 10) + kEnd);
    EXPECT_EQ(found["kind"], "feed");
    EXPECT_EQ(found["entries"].size(), Bounds::kEntries);
    EXPECT_TRUE(log.contains("\"entries\""));
}

TEST_F(DocumentBounds, KeepTheEnclosuresThatAnEntryMayHave) {
    const json found = parsed(std::string(kRSS) + "<item>" +
                              repeated("<enclosure url=\"http://a/\"/>", Bounds::kEnclosures + 1) +
                              "</item>" + kEnd);
    EXPECT_EQ(valueAt(found, "entries[0].enclosures.count"), Bounds::kEnclosures);
    EXPECT_TRUE(log.contains("\"enclosures\""));
}

TEST_F(DocumentBounds, CutDeclarationsAndLeaveTheRest) {
    const json found =
        parsed("<!DOCTYPE rss [<!ENTITY % a 'b'>" + repeated("%a;", Bounds::kSubsetPercents) +
               "]>" + kRSS + "<title>T</title>" + kEnd);
    EXPECT_EQ(found["feed"]["title"], "T");
    EXPECT_EQ(found["attempts"], 1);
}

TEST_F(DocumentBounds, StopTheReaderAfterTooManyErrorsForARepair) {
    const json found = parsed(kRSS + std::string("<title>T</title>") +
                              repeated("<x:y/>", Bounds::kParserErrors + 100) + kEnd);
    EXPECT_EQ(log.count("\"errors\""), 1);
    EXPECT_EQ(found["feed"]["title"], "T");
    EXPECT_EQ(found["attempts"], 2);
}

TEST_F(DocumentBounds, LimitWhatEntitiesInAttributesComeTo) {
    const std::string link = "<link href=\"http://a/" + repeated("&a;", 500) + "\"/>";
    const json found = parsed("<!DOCTYPE rss [<!ENTITY a \"" + std::string(2000, 'x') + "\">]>" +
                              kRSS + link + link + kEnd);
    const std::string href = valueAt(found, "info.links[0].href");
    EXPECT_GT(href.size(), Bounds::kEntityBytes - 10000);
    EXPECT_LT(href.size(), Bounds::kEntityBytes + 10000);
    EXPECT_EQ(valueAt(found, "info.links[1].href"), "http://a/");
    EXPECT_EQ(log.count("\"bytes of entities\""), 1);
}

TEST_F(DocumentBounds, LimitTheRawXMLOfElementsWithinEachOther) {
    const json found = parsed(std::string(repeated("<entry>", 100)) + std::string(kMiB, 'x') +
                              repeated("</entry>", 100));
    EXPECT_EQ(found["kind"], "entry");
    EXPECT_TRUE(log.contains("\"bytes of raw XML\""));
}

TEST_F(DocumentBounds, EndTheAttemptsAtADocumentThatCannotBeTidied) {
    const Support::TempDir folder;
    const Support::EnvVar programs("ORVANE_PROGRAMS", folder.path().c_str());
    Orvane::FeedParser::TidyHelper::getShared().stop();
    const json found = parsed(kRSS + repeated("<item></b></item>", 2000) + kEnd);
    EXPECT_EQ(found["kind"], "unknown");
    EXPECT_EQ(found["attempts"], 1);
    EXPECT_EQ(log.count("[Parser] Not tidied (34030 bytes"), 2);
    EXPECT_EQ(log.count("[Parser] Beginning attempt #2"), 1);
    EXPECT_FALSE(log.contains("Beginning attempt #3"));
    EXPECT_EQ(log.lines().back(), "[Parser] Finished parsing; mAttempt=1, mFatalError=0");
}

}  // namespace
