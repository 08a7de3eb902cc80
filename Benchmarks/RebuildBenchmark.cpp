#include "Benchmarks/Measure.h"
#include "FeedParser/DifferenceEngine.h"
#include "FeedParser/Parser.h"
#include "FeedParser/ParserPort.h"
#include "Foundation/Data.h"
#include "Foundation/URL.h"
#include "Model/ContentCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"
#include "Model/FeedRefresher.h"
#include "Model/FeederFactory.h"
#include "Model/MinistryOfTruth.h"
#include "Model/Schema.h"
#include "SQLite/Database.h"
#include "SQLite/FakeCenter.h"
#include "SQLite/TableOf.h"
#include "SQLite/Transaction.h"
#include "Support/LogCapture.h"
#include "Support/TempDir.h"
#include "Utilities/FileSystem.h"

#include <fmt/format.h>
#include <sqlite3.h>
#include <sys/resource.h>

#include <filesystem>
#include <fstream>
#include <stdexcept>
#include <string>
#include <vector>

/// What does it cost to make a broken database anew from 1,000 saved documents, and to bring 20,000
/// archived entries back from their files when they are first asked for?
///
/// The peer is a program that parses the same bytes with the same parser and inserts what it finds
/// with plain sqlite3, into the same tables with the same indexes, in the same transactions: one
/// for all documents, and one for each feed's archived entries. Its texts are tidied, so that both
/// sides store the same bytes. It compares nothing, hashes nothing and keeps nothing.

using namespace Benchmarks;
using namespace Foundation;
using namespace Orvane;
namespace fs = std::filesystem;
using SQLite::gDatabase;

namespace {

constexpr int kFeeds = 1'000;
constexpr int kCurrentEntries = 10;  ///< in each document
constexpr int kOldEntries = 20;      ///< of each feed
constexpr int kRounds = 3;

std::string entryText(int feed, int number) {
    std::string paragraphs;
    for (int i = 0; i < 6; ++i) {
        paragraphs += fmt::format(
            "&lt;p&gt;Paragraph {} of entry {} in feed {}, which says &lt;b&gt;no more&lt;/b&gt; "
            "than the others do, at some length, and links to &lt;a "
            "href=\"http://example.com/{}/{}\"&gt;itself&lt;/a&gt;.&lt;/p&gt;\n",
            i, number, feed, feed, number);
    }
    return fmt::format(
        "<item><title>Entry {1} of feed {0}</title><link>http://example.com/{0}/{1}</link>"
        "<guid>http://example.com/{0}/{1}</guid>"
        "<pubDate>Tue, 02 May 2006 {2:02}:{3:02}:00 GMT</pubDate>"
        "<description>{4}</description></item>",
        feed, number, number % 24, feed % 60, paragraphs);
}

std::string documentText(int feed) {
    std::string items;
    for (int i = 0; i < kCurrentEntries; ++i) {
        items += entryText(feed, i) + "\n";
    }
    return fmt::format(
        "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<rss version=\"2.0\"><channel>"
        "<title>Feed {0}</title><link>http://example.com/{0}</link>\n{1}</channel></rss>",
        feed, items);
}

/// The feeder as it is when a document is there already: parses and merges.
class MergingFeeder : public FeedRefresher {
 public:
    explicit MergingFeeder(FeedCore* feed) : mFeed(feed) {}
    void removed() override { mFeed = nullptr; }
    bool needsRefresh() const override { return false; }
    bool refresh(bool, bool) override { return false; }
    void refreshFromData(Data* data) override {
        mFeed->setXMLData(data);
        const Ref<FeedCore> parsed = DocumentParser::current()->parseFeed(data, mFeed->mURL);
        if (!parsed) throw std::runtime_error("no feed");
        parsed->mURL.setValue(mFeed->mURL);
        DifferenceEngine(mFeed, false).updateFrom(parsed);
    }
    NetError getStatus() const override { return {}; }
    bool hasChanged() const override { return true; }

 private:
    FeedCore* mFeed;
};

class MergingFeeders : public FeederFactory {
 public:
    bool supportsURL(const URL*) const override { return true; }
    Returner<FeedRefresher> makeFeeder(FeedCore* feed) override {
        return Returner<FeedRefresher>::adopted(new MergingFeeder(feed));
    }
};

/// The files of the truth.
class Truth {
 public:
    explicit Truth(const fs::path& base) : mStorage(base / "Orvane") {
        fs::create_directories(mStorage / "Feeds");
        std::string feeds, subscriptions;
        for (int i = 1; i <= kFeeds; ++i) {
            const AutoreleasePool pool;
            writeFeed(i);
            const std::string key = fmt::format("<key>{}</key>", i);
            feeds +=
                fmt::format("{}<dict><key>URL</key><string>{}</string></dict>", key, address(i));
            subscriptions += fmt::format(
                "{0}<dict><key>Client</key><integer>1</integer><key>Feed</key>"
                "<integer>{1}</integer></dict>",
                key, i);
        }
        write("Clients.plist",
              fmt::format("<plist><dict><key>Clients</key><dict><key>1</key><dict>"
                          "<key>Signature</key><string>com.example.reader</string></dict></dict>"
                          "<key>Feeds</key><dict>{}</dict>"
                          "<key>Subscriptions</key><dict>{}</dict></dict></plist>",
                          feeds, subscriptions));
    }
    static std::string address(int feed) { return fmt::format("http://example.com/{}/feed", feed); }
    const std::string& identifier(int feed) const { return mIdentifiers[feed - 1]; }
    fs::path document(int feed) const { return mStorage / "Feeds" / (identifier(feed) + ".xml"); }
    fs::path directory(int feed) const { return mStorage / "Feeds" / identifier(feed); }

 private:
    void writeFeed(int number) {
        const Ref<Data> text = Data::adopt(address(number));
        const Ref<String> identifier = text->SHA1HashString();
        mIdentifiers.push_back(identifier->utf8());
        write("Feeds/" + identifier->utf8() + ".xml", documentText(number));
        fs::create_directory(directory(number));
        for (int i = 0; i < kOldEntries; ++i) {
            const int old = 1000 + i;
            const Ref<Data> id = Data::adopt(identifier->utf8() +
                                             fmt::format("http://example.com/{}/{}", number, old));
            const Ref<String> entry = id->SHA1HashString();
            write("Feeds/" + identifier->utf8() + "/" + entry->utf8() + ".xml",
                  entryText(number, old));
        }
    }
    void write(const std::string& name, const std::string& content) const {
        std::ofstream(mStorage / name, std::ios::binary) << content;
    }

    const fs::path mStorage;
    std::vector<std::string> mIdentifiers;
};

/// Parses and inserts, with nothing around sqlite3.
class Peer {
 public:
    explicit Peer(const Truth& truth) : mTruth(truth) {}
    ~Peer() { close(); }
    Peer(const Peer&) = delete;
    Peer& operator=(const Peer&) = delete;

    /// Begins with a copy of a database without rows.
    void open(const fs::path& empty, const fs::path& path) {
        close();
        fs::remove(path);
        fs::remove(path.string() + "-wal");
        fs::copy_file(empty, path);
        check(sqlite3_open_v2(path.c_str(), &mDB, SQLITE_OPEN_READWRITE | SQLITE_OPEN_NOMUTEX,
                              nullptr));
        run("PRAGMA temp_store = MEMORY; PRAGMA journal_mode = WAL; PRAGMA synchronous = FULL");
        mContent = compile(ContentCore::columnList().insertText("Contents").c_str());
        mEntry = compile(EntryCore::columnList().insertText("Entries").c_str());
        mFeed = compile("insert into Feeds (rowID, identifier, url, title) values (?, ?, ?, ?)");
        mCount = 0;
    }
    void insertDocuments() {
        run("begin immediate transaction");
        for (int i = 1; i <= kFeeds; ++i) {
            const AutoreleasePool pool;
            insertDocument(i);
        }
        run("commit");
    }
    void insertOldEntries() {
        for (int i = 1; i <= kFeeds; ++i) {
            const AutoreleasePool pool;
            run("begin immediate transaction");
            for (const auto& file : fs::directory_iterator(mTruth.directory(i))) {
                const Ref<Data> data = read(file.path());
                const FeedParser::Parser parser(data, nullptr);
                insert(*parser.getInfo()->getEntry(), i, file.path().stem());
            }
            run("commit");
        }
    }
    int count() const { return mCount; }

 private:
    void close() {
        for (sqlite3_stmt* statement : {mContent, mEntry, mFeed})
            sqlite3_finalize(statement);
        mContent = mEntry = mFeed = nullptr;
        sqlite3_close(std::exchange(mDB, nullptr));
    }
    static Ref<Data> read(const fs::path& path) {
        const Ref<URL> url{URL::urlWithFileSystemPath(path.c_str(), false)};
        return Data::dataFromResource(url);
    }
    void insertDocument(int feed) {
        const Ref<Data> data = read(mTruth.document(feed));
        const FeedParser::Parser parser(data, nullptr);
        FeedCore* const parsed = parser.getInfo()->getFeed();
        check(sqlite3_bind_int64(mFeed, 1, feed));
        bindText(mFeed, 2, mTruth.identifier(feed));
        bindText(mFeed, 3, Truth::address(feed));
        bindText(mFeed, 4, parsed->mTitle.getValue()->utf8());
        finish(mFeed);
        for (const Ref<SQLite::Row>& row : parsed->mEntries.getNewRows()) {
            insert(static_cast<const EntryCore&>(*row), feed, {});
        }
    }
    /// A column that is not bound stays null.
    void insert(const EntryCore& entry, int feed, const std::string& identifier) {
        ++mCount;
        bindContent(EntryCore::Content, entry.getContent());
        bindContent(EntryCore::Summary, entry.getSummary());
        bindContent(EntryCore::XMLRepresentation, entry.getXMLRepresentation());
        bindText(mEntry, EntryCore::Identifier + 1,
                 identifier.empty() ? fmt::format("{:040x}", mCount) : identifier);
        bindText(mEntry, EntryCore::ID + 1, entry.mID.getValue()->utf8());
        bindText(mEntry, EntryCore::Title + 1, entry.mTitle.getValue()->utf8());
        bindText(mEntry, EntryCore::AlternateURL + 1, entry.mAlternateURL.getValue()->text());
        const std::string hash = fmt::format("{:040x}", mCount);
        for (const int column : {EntryCore::SummaryHash, EntryCore::XMLRepresentationHash}) {
            bindText(mEntry, column + 1, hash);
        }
        for (const int column :
             {EntryCore::DatePublished, EntryCore::LocalDateCreated, EntryCore::LocalDateUpdated}) {
            check(sqlite3_bind_double(mEntry, column + 1, 160'000'000.0 + mCount));
        }
        check(sqlite3_bind_int64(mEntry, EntryCore::Feed + 1, feed));
        check(sqlite3_bind_int64(mEntry, EntryCore::Read + 1, 1));
        finish(mEntry);
    }
    void bindContent(int column, ContentCore* content) {
        if (!content) {
            check(sqlite3_bind_null(mEntry, column + 1));
            return;
        }
        const Data* bytes = content->getData();
        check(sqlite3_bind_blob(mContent, 1, bytes->getBytes(),
                                static_cast<int>(bytes->getLength()), SQLITE_TRANSIENT));
        const String* type = content->mMIMEType;
        bindText(mContent, 2, type ? type->utf8() : "");
        finish(mContent);
        check(sqlite3_bind_int64(mEntry, column + 1, sqlite3_last_insert_rowid(mDB)));
    }

    void check(int result) const {
        if (result != SQLITE_OK) throw std::runtime_error(sqlite3_errmsg(mDB));
    }
    void run(const char* sql) { check(sqlite3_exec(mDB, sql, nullptr, nullptr, nullptr)); }
    sqlite3_stmt* compile(const char* sql) {
        sqlite3_stmt* statement = nullptr;
        check(sqlite3_prepare_v2(mDB, sql, -1, &statement, nullptr));
        return statement;
    }
    void bindText(sqlite3_stmt* statement, int index, const std::string& text) {
        check(sqlite3_bind_text(statement, index, text.data(), static_cast<int>(text.size()),
                                SQLITE_TRANSIENT));
    }
    void finish(sqlite3_stmt* statement) {
        const int result = sqlite3_step(statement);
        check(result == SQLITE_DONE ? sqlite3_reset(statement) : result);
    }

    const Truth& mTruth;
    sqlite3* mDB = nullptr;
    sqlite3_stmt* mContent = nullptr;
    sqlite3_stmt* mEntry = nullptr;
    sqlite3_stmt* mFeed = nullptr;
    int mCount = 0;
};

void askForEntries() {
    for (int i = 1; i <= kFeeds; ++i) {
        const AutoreleasePool pool;
        const Ref<FeedCore> feed = SQLite::TableOf<FeedCore>::instance()->rowWithID(i);
        feed->getEntries(nullptr);
    }
}

void requireRows(const char* what, int count, int expected) {
    if (count != expected) {
        throw std::runtime_error(fmt::format("{}: {} rows, not {}", what, count, expected));
    }
}

int entries() {
    return gDatabase->execScalar("select count(*) from Entries");
}

void measure(const fs::path& base) {
    const Truth truth(base);
    const fs::path empty = base / "empty.sqlite3";
    {
        SQLite::Database::initialize();
        gDatabase->open(empty.c_str(), true);
        Schema::createDatabase();
        gDatabase->close(true);
    }
    MinistryOfTruth* const ministry = MinistryOfTruth::instance();
    ministry->openDatabase();
    Peer peer(truth);
    const auto begin = [&] { peer.open(empty, base / "peer.sqlite3"); };
    const Comparison rebuild = compare([&] { ministry->recoverBrokenDatabase(nullptr); },
                                       [&] { peer.insertDocuments(); }, kRounds, begin);
    requireRows("rebuilt", entries(), kFeeds * kCurrentEntries);
    requireRows("peer", peer.count(), kFeeds * kCurrentEntries);
    report("rebuild the entry of a document", rebuild, kFeeds * kCurrentEntries, "parse, insert");
    rusage usage = {};
    getrusage(RUSAGE_SELF, &usage);
    std::printf("largest size %ld MB\n", usage.ru_maxrss / 1024);

    const Comparison recover = compare(
        askForEntries, [&] { peer.insertOldEntries(); }, kRounds,
        [&] {
            begin();
            ministry->recoverBrokenDatabase(nullptr);
        });
    requireRows("recovered", entries(), kFeeds * (kCurrentEntries + kOldEntries));
    requireRows("peer", peer.count(), kFeeds * kOldEntries);
    report("recover an archived entry", recover, kFeeds * kOldEntries, "parse, insert");
    std::printf("rebuild_ratio %.2f\nrecover_ratio %.2f\n", rebuild.ratio(), recover.ratio());
}

}  // namespace

int main() {
    const AutoreleasePool pool;
    const Support::TempDir base;
    setenv("XDG_DATA_HOME", base.path().c_str(), 1);
    const Support::LogCapture quiet;
    FakeCenter noBus;
    FeedParser::ParserPort parser;
    DocumentParser::setCurrent(&parser);
    MergingFeeders feeders;
    FeederFactory::setCurrent(&feeders);
    try {
        measure(base.path());
    } catch (const std::exception& exception) {
        std::fprintf(stderr, "%s\n", exception.what());
        return 1;
    }
    gDatabase->close(false);
    return 0;
}
