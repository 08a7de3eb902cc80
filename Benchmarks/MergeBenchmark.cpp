#include "Benchmarks/Measure.h"
#include "Benchmarks/PlainRows.h"
#include "FeedParser/DifferenceEngine.h"
#include "FeedParser/Documents.h"
#include "FeedParser/EngineMap.h"
#include "FeedParser/ParserPort.h"
#include "Foundation/ArrayOf.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Data.h"
#include "Foundation/URL.h"
#include "Model/ContentCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"
#include "Model/Schema.h"
#include "SQLite/Cursor.h"
#include "SQLite/Database.h"
#include "SQLite/TableOf.h"
#include "Support/TempDir.h"
#include "Utilities/FileSystem.h"

#include <fmt/format.h>

#include <cstdio>
#include <exception>
#include <filesystem>
#include <stdexcept>
#include <string>
#include <vector>

/// What does merging a document cost?
///
/// A document of 50 entries that have not changed is set beside its two queries and the hashes of
/// its sources: that is all that there is to do for it. A first document, from its bytes on, is set
/// beside parsing it and inserting the same rows with sqlite3, in a copy of the file, one
/// transaction a feed. Neither side waits for the disk.

using namespace Benchmarks;
using namespace Foundation;
using namespace Orvane;
using SQLite::gDatabase;

namespace {

constexpr int kEntries = 50;
constexpr int kTextBytes = 2048;
constexpr int kFeeds = 1000;
constexpr int kUnchangedRounds = 301;

std::string urlOf(int feed) {
    return fmt::format("http://www.example.org/feeds/{}.xml", feed);
}

std::vector<Post> postsOf(int feed) {
    std::vector<Post> posts;
    for (int i = 0; i < kEntries; ++i) {
        Post post{fmt::format("tag:example.org,2006:{}-{}", feed, i),
                  fmt::format("The title of entry {} of feed {}", i, feed)};
        post.text.assign(kTextBytes, static_cast<char>('a' + i % 26));
        posts.push_back(post);
    }
    return posts;
}

/// The document of a feed as it comes from the network.
Ref<Data> bytesOf(int feed) {
    std::string xml = "<rss version=\"2.0\"><channel><title>News</title>";
    for (const Post& post : postsOf(feed)) {
        xml += fmt::format(
            "<item><title>{}</title><guid>{}</guid><pubDate>Tue, 06 Jun 2006 10:00:00 GMT</pubDate>"
            "<description>{}</description></item>",
            post.title, post.guid, post.text);
    }
    return Data::adopt(xml + "</channel></rss>");
}

/// The same, parsed.
FeedCore* documentOf(int feed) {
    const Ref<URL> url = URL::url(String::string(urlOf(feed)));
    const Ref<Data> bytes = bytesOf(feed);
    FeedCore* parsed = FeedParser::ParserPort().parseFeed(bytes, url);
    parsed->mURL.setValue(url);
    return parsed;
}

/// Makes the process's database with the feeds and their subscriptions, and a copy of its file.
void makeFiles(const std::string& path, const std::string& plainPath) {
    SQLite::Database::initialize();
    gDatabase->open(path.c_str(), true);
    Schema::createDatabase();
    gDatabase->execute("INSERT INTO Clients (rowID, signature) VALUES (1, 'reader')");
    for (int i = 1; i <= kFeeds; ++i) {
        const AutoreleasePool pool;
        makeStoredFeed(urlOf(i).c_str());
        gDatabase->execute(
            "INSERT INTO Subscriptions (client, feed, expirationDate, unreadCount) VALUES "
            "(1, %d, 0, 0)",
            i);
    }
    gDatabase->close(true);
    std::filesystem::copy_file(path, plainPath);
    gDatabase->open(path.c_str(), true);
    gDatabase->executeText(SQLite::SQLText(kDoNotWait));
}

struct Import {
    Comparison merge{0, 0};  ///< without the parse
    double parse = 0;
};

/// Parses and merges the first documents, by turns with inserting the same rows.
Import measureImport(const std::string& path, const std::string& plainPath) {
    Plain reader(path, kDoNotWait);
    Plain plain(plainPath, kDoNotWait);
    Import total;
    long long lastContent = 0;
    FeedParser::ParserPort parser;
    for (int i = 1; i <= kFeeds; ++i) {
        const AutoreleasePool pool;
        const Ref<FeedCore> feed = SQLite::TableOf<FeedCore>::instance()->rowWithID(i);
        const Ref<Data> bytes = bytesOf(i);
        Ref<FeedCore> parsed;
        total.parse += secondsOf([&] { parsed = parser.parseFeed(bytes, feed->mURL.getValue()); });
        parsed->mURL.setValue(feed->mURL.getValue());
        DifferenceEngine engine(feed, false);
        total.merge.measured += secondsOf([&] { engine.updateFrom(parsed); });
        require(engine.getAddedCount() == kEntries, "entries are missing");
        const ImportedRows rows(reader, i, fmt::format("rowID>{}", lastContent), kEntries);
        require(rows.count() == 3 * kEntries, "rows are missing");
        total.merge.floor += secondsOf([&] { rows.insertInto(plain); });
        lastContent = gDatabase->execScalar("SELECT max(rowID) FROM Contents");
    }
    return total;
}

/// What must be done for a document: the two queries, and a hash for each source.
class Floor {
 public:
    Floor(const std::string& path, FeedCore* parsed) : mFile(path, kDoNotWait) {
        EngineMap map;
        const Ref<ArrayOf<EntryCore>> entries = parsed->getEntries(nullptr).allRows();
        map.addEntries(entries);
        mArchive = fmt::format(
            "select e.rowID, e.identifier, c.data   from Entries as e, Contents as c  where "
            "e.feed=1 and e.current and not (e.{})    and e.xmlRepresentation = c.rowID",
            map.getIdentifiersSQL());
        mPrune =
            fmt::format("SELECT xmlRepresentationHash FROM Entries WHERE feed=1 and current and {}",
                        map.getIdentifiersSQL());
        for (EntryCore* entry : *entries)
            mSources.emplace_back(entry->getXMLRepresentation()->mData.getValue());
    }

    void run() {
        const AutoreleasePool pool;
        for (const Ref<Data>& source : mSources) {
            const Ref<String> hash = source->SHA1HashString();
            keep(hash);
        }
        require(mFile.count(mArchive) == 0, "there is something to archive");
        require(mFile.count(mPrune) == kEntries, "something has changed");
    }

 private:
    Plain mFile;
    std::string mArchive, mPrune;
    std::vector<Ref<Data>> mSources;
};

Comparison measureUnchanged(const std::string& path) {
    const Ref<FeedCore> feed = SQLite::TableOf<FeedCore>::instance()->rowWithID(1);
    const AutoreleasePool pool;
    Floor floor(path, documentOf(1));
    Ref<FeedCore> parsed;
    return compare(
        [&] {
            const AutoreleasePool inner;
            DifferenceEngine engine(feed, false);
            require(!engine.updateFrom(parsed), "something has changed");
        },
        [&] { floor.run(); }, kUnchangedRounds,
        [&] {
            const AutoreleasePool inner;
            parsed = documentOf(1);
        });
}

}  // namespace

int main() try {
    const AutoreleasePool pool;
    const Support::TempDir directory;
    const Ref<URL> base{URL::urlWithFileSystemPath(directory.path().c_str(), true)};
    Compatibility::FileSystem::setStorageBaseURL(base);
    const std::string path = directory / "Database.sqlite3",
                      plainPath = directory / "Plain.sqlite3";
    makeFiles(path, plainPath);
    const Import import = measureImport(path, plainPath);
    report("merge an entry of a first document", import.merge, kFeeds * kEntries, "sqlite3");
    const Comparison whole{import.parse + import.merge.measured, import.parse + import.merge.floor};
    report("the same from its bytes on", whole, kFeeds * kEntries, "parser and sqlite3");
    const Comparison unchanged = measureUnchanged(path);
    report("merge an unchanged document", unchanged, 1, "two queries and 50 hashes");
    gDatabase->close(true);
    std::printf("merge_import %.2f\n", whole.ratio());
    std::printf("merge_unchanged %.2f\n", unchanged.ratio());
    return 0;
} catch (const std::exception& exception) {
    std::fprintf(stderr, "merge_benchmark: %s\n", exception.what());
    return 1;
}
