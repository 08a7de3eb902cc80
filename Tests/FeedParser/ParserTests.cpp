#include "FeedParser/Parser.h"

#include "FeedParser/ParsedDocument.h"
#include "Foundation/AutoreleasePool.h"
#include "SQLite/Database.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <string>

using namespace Foundation;
using namespace Orvane;
using FeedParser::Info;
using nlohmann::json;

namespace {

std::string rss(const std::string& channel) {
    return "<rss version=\"2.0\"><channel>" + channel + "</channel></rss>";
}

class ParserTest : public testing::Test {
 protected:
    ParserTest() { SQLite::Database::initialize(); }
    ~ParserTest() noexcept override {}

    AutoreleasePool pool;
    Support::LogCapture log;
    Support::LoggingOn on{{&gLogParser}};
};

TEST_F(ParserTest, MakesOneLoggedAttemptAtNoData) {
    for (const Ref<Data>& data : {Ref<Data>(), Ref<Data>(Data::data("", 0))}) {
        log.clear();
        const FeedParser::Parser parser(data.get(), nullptr);
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
    EXPECT_EQ(found["feed"]["title"], "A");
    EXPECT_EQ(valueAt(found, "entries.count"), 1);
    EXPECT_EQ(valueAt(found, "entries[0].title"), "B");
    EXPECT_EQ(log.lines().back(), "[Parser] Finished parsing; mAttempt=0, mFatalError=0");
}

TEST_F(ParserTest, RepairsAFeedWithoutItsEnd) {
    const json found = parsed("<rss><channel><title>A</title><item><title>B</title>");
    EXPECT_EQ(found["kind"], "feed");
    EXPECT_EQ(found["attempts"], 2);
    EXPECT_EQ(found["tidiedWith"], "FeedTidier");
    EXPECT_EQ(log.lines().back(), "[Parser] Finished parsing; mAttempt=1, mFatalError=0");
}

}  // namespace
