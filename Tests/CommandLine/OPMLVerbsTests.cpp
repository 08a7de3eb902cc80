// Lists of feeds, from other programs and for them.

#include "CommandLine/CommandLineTest.h"

#include <cstdlib>
#include <fstream>
#include <set>
#include <sstream>

namespace {

using testing::HasSubstr;
using testing::Not;

class OPMLVerbs : public CommandLineTest {
 protected:
    std::string writeList() {
        return home.writeFile(
            "list.opml",
            "<opml version='1.1'><head><title>x</title></head><body>"
            "<outline text='News'><outline text='Mine' xmlUrl='" +
                server.url("/feed") +
                "' category='/a/b'/><outline text='Bad' xmlUrl='|/bin/feed'/></outline>"
                "<outline text='Other' xmlUrl='" +
                server.url("/other") + "'/><outline text='Remark'/></body></opml>");
    }
};

/// A line of the corpus's manifest.
struct Row {
    std::string file;
    int distinct = -1;  ///< -1 where the file is not well-formed
};

std::vector<Row> manifest(const std::string& folder) {
    std::vector<Row> rows;
    std::ifstream stream(folder + "/manifest.tsv");
    std::string line;
    std::getline(stream, line);
    while (std::getline(stream, line)) {
        std::vector<std::string> fields;
        std::istringstream cells(line);
        for (std::string cell; std::getline(cells, cell, '\t');) {
            fields.push_back(cell);
        }
        if (fields.size() < 10) continue;
        rows.push_back({fields[0], fields[9] == "-" ? -1 : std::atoi(fields[9].c_str())});
    }
    return rows;
}

}  // namespace

TEST_F(OPMLVerbs, ImportReportsEachLineAndGoesOn) {
    const std::string file = writeList();
    const Support::ChildResult dry = run({"import", "--dry-run", file}, 4);
    EXPECT_THAT(dry.err, HasSubstr("2 feeds added, 0 known, 1 bad. Nothing was done."));
    run({"feeds"}, 1);
    const JSON report = json({"import", file}, 4);
    ASSERT_EQ(report["outlines"].size(), 3U);
    EXPECT_EQ(report["outlines"][0]["result"], "added");
    EXPECT_EQ(report["outlines"][0]["folder"], "News");
    EXPECT_EQ(report["outlines"][1]["result"], "bad");
    EXPECT_FALSE(report["outlines"][1]["reason"].is_null());
    EXPECT_EQ(report["outlines"][2]["result"], "added");
    EXPECT_EQ(json({"feeds"})["feeds"].size(), 2U);
    EXPECT_THAT(run({"import", file}, 4).err, HasSubstr("0 feeds added, 2 known, 1 bad."));
}

TEST_F(OPMLVerbs, ImportHasTheAgentFetch) {
    run({"import", "--json", writeList()}, 4);
    EXPECT_TRUE(Support::turnUntil([&] {
        return server.getRequestCount("/feed") > 0 && server.getRequestCount("/other") > 0;
    }));
}

TEST_F(OPMLVerbs, ExportGivesFoldersAndAttributesBack) {
    run({"import", "--no-fetch", writeList()}, 4);
    const std::string out = run({"export"}).out;
    EXPECT_THAT(out, HasSubstr("<outline text=\"News\">\n"));
    EXPECT_THAT(out, HasSubstr("xmlUrl=\"" + server.url("/feed") + "\""));
    EXPECT_THAT(out, HasSubstr("category=\"/a/b\""));
    EXPECT_THAT(run({"export", "--flat"}).out, Not(HasSubstr("News")));
    const JSON all = json({"export"});
    ASSERT_EQ(all["feeds"].size(), 2U);
    EXPECT_EQ(all["feeds"][0]["folder"], "News");
    EXPECT_EQ(all["feeds"][1]["folder"], "");
    run({"rm", server.url("/feed")});
    EXPECT_THAT(run({"export"}).out, Not(HasSubstr("News")));
}

TEST_F(OPMLVerbs, ImportReadsStandardInput) {
    const Support::ChildResult result =
        runInShell("printf '%s\\n' \"$1\" | \"$0\" import --no-fetch -", {server.url("/feed")});
    EXPECT_EQ(result.status, 0) << result.err;
    EXPECT_EQ(json({"feeds"})["feeds"].size(), 1U);
}

TEST_F(OPMLVerbs, ImportRefusesWhatHasNoFeeds) {
    const std::string empty = home.writeFile("empty.opml", "<opml><body/></opml>");
    EXPECT_THAT(run({"import", empty}, 1).err, HasSubstr("there are no feeds in "));
    run({"import", home / "no such file"}, 5);
}

TEST_F(OPMLVerbs, ImportFindsAllFeedsOfRealLists) {
    const char* corpus = std::getenv("ORVANE_CORPUS");
    if (!corpus) GTEST_SKIP() << "ORVANE_CORPUS is not set";
    const std::string folder = std::string(corpus) + "/opml";
    const std::vector<Row> rows = manifest(folder);
    ASSERT_FALSE(rows.empty());
    for (const Row& row : rows) {
        const Support::ChildResult result =
            runOrvane({"import", "--dry-run", "--json", folder + "/files/" + row.file});
        std::set<std::string> urls;
        if (result.status != 1) {
            const JSON report = JSON::parse(result.out);
            for (const JSON& each : report["outlines"]) {
                urls.insert(each["url"].get<std::string>());
            }
        }
        EXPECT_NE(result.status, -1) << row.file;
        if (row.distinct < 0) continue;
        EXPECT_EQ(urls.size(), static_cast<std::size_t>(row.distinct)) << row.file << result.err;
    }
}
