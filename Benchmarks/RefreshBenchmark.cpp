#include "Benchmarks/PlainRows.h"
#include "FeedParser/ParserPort.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/RunLoop.h"
#include "Foundation/URL.h"
#include "Model/FeedCore.h"
#include "Model/Schema.h"
#include "Net/NetPorts.h"
#include "SQLite/Cursor.h"
#include "SQLite/Database.h"
#include "SQLite/TableOf.h"
#include "Support/ChildProcess.h"
#include "Support/ScriptedServer.h"
#include "Support/TempDir.h"
#include "Utilities/FileSystem.h"

#include <libxml/xmlreader.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdio>
#include <exception>
#include <filesystem>
#include <fstream>
#include <limits>

/// What does a round of refreshes cost?
///
/// Feeds with nothing new are set beside curl asking for the same with the same condition, and
/// those that send the same bytes again beside curl fetching them. A first round, which parses and
/// stores 50 entries of each feed, is set beside the sum of curl fetching the documents, a walk of
/// libxml2's reader over them, and sqlite3 inserting the same rows, a transaction a feed; both
/// databases write as they do in earnest. All of it is processor time, for the server, a process of
/// its own on this machine, takes the rest.

using namespace Benchmarks;
using namespace Foundation;
using namespace Orvane;
using SQLite::gDatabase;

namespace {

constexpr int kEntries = 50;
constexpr int kTextBytes = 2048;
constexpr int kFeeds = 1000;
constexpr int kQuietRounds = 5;
constexpr const char* kTag = "\"1\"";
constexpr const char* kInEarnest = "PRAGMA journal_mode = WAL; PRAGMA synchronous = FULL";

std::string documentOf(const std::string& path) {
    std::string xml = "<rss version=\"2.0\"><channel><title>News</title>";
    for (int i = 0; i < kEntries; ++i) {
        xml += fmt::format(
            "<item><title>The title of entry {0} of {1}</title>"
            "<guid isPermaLink=\"false\">{1}-{0}</guid>"
            "<pubDate>Tue, 06 Jun 2006 10:00:00 GMT</pubDate><description>{2}</description></item>",
            i, path, std::string(kTextBytes, static_cast<char>('a' + i % 26)));
    }
    return xml + "</channel></rss>";
}

/// Below "/tagged/" with a validator, which is heeded; elsewhere without.
Support::ServerAnswer answerTo(const Support::ServerRequest& request) {
    const bool isTagged = request.path().starts_with("/tagged/");
    if (isTagged && request.header("if-none-match") == kTag) {
        return Support::ServerAnswer(304).header("ETag", kTag);
    }
    Support::ServerAnswer answer;
    answer.header("Content-Type", "application/rss+xml").body(documentOf(request.path()));
    if (isTagged) answer.header("ETag", kTag);
    return answer;
}

/// The server, in a process that ends with this one.
class ServerProcess {
 public:
    ServerProcess() {
        int toParent[2], toChild[2];
        if (pipe(toParent) != 0 || pipe(toChild) != 0) throw std::runtime_error("pipe");
        mPID = fork();
        if (mPID == 0) {
            close(toChild[1]);
            serve(toParent[1], toChild[0]);
        }
        close(toChild[0]);
        mEnd = toChild[1];
        require(read(toParent[0], &mPort, sizeof mPort) == sizeof mPort, "no server");
    }
    ~ServerProcess() {
        close(mEnd);
        waitpid(mPID, nullptr, 0);
    }
    ServerProcess(const ServerProcess&) = delete;
    ServerProcess& operator=(const ServerProcess&) = delete;

    std::string url(const char* kind, int feed) const {
        return fmt::format("http://127.0.0.1:{}/{}/{}.xml", mPort, kind, feed);
    }

 private:
    [[noreturn]] static void serve(int port, int end) {
        {
            Support::ScriptedServer server;
            server.answerOthersBy(answerTo);
            const int number = server.getPort();
            static_cast<void>(!write(port, &number, sizeof number));
            char nothing;
            static_cast<void>(!read(end, &nothing, 1));
        }
        _exit(0);
    }

    pid_t mPID = -1;
    int mPort = 0;
    int mEnd = -1;
};

double processorSeconds() {
    rusage usage{};
    getrusage(RUSAGE_SELF, &usage);
    const auto seconds = [](const timeval& time) {
        return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_usec) * 1e-6;
    };
    return seconds(usage.ru_utime) + seconds(usage.ru_stime);
}

double residentMegabytes() {
    std::size_t size = 0, resident = 0;
    std::ifstream("/proc/self/statm") >> size >> resident;
    return static_cast<double>(resident) * static_cast<double>(sysconf(_SC_PAGESIZE)) / 1e6;
}

/// The feeds of one kind, in the process's database.
class Feeds {
 public:
    Feeds(const ServerProcess& server, const char* kind, int count) : mServer(server), mKind(kind) {
        for (int i = 0; i < count; ++i) {
            const AutoreleasePool pool;
            const Ref<FeedCore> feed = Returner<FeedCore>::adopted(new FeedCore);
            feed->mURL.setValue(URL::url(String::string(server.url(kind, i))));
            feed->getIdentifier();
            feed->saveChanges();
            mFeeds.push_back(feed);
        }
    }

    int count() const { return static_cast<int>(mFeeds.size()); }
    const std::vector<Ref<FeedCore>>& feeds() const { return mFeeds; }

    /// The processor time of a round over all of them, which must change so many.
    double refresh(int changes) {
        const double start = processorSeconds();
        mEnds = mChanges = 0;
        MethodReceiver<Notification, Feeds> receiver(this, &Feeds::ended);
        NotificationCenter::getLocal()->addObserver(
            &receiver, FeedCore::kEndedUpdateLocalNotification, nullptr);
        for (const Ref<FeedCore>& feed : mFeeds) {
            const AutoreleasePool pool;
            feed->refresh(false, true);
        }
        if (mEnds < count()) RunLoop::current().run();
        NotificationCenter::getLocal()->removeObserver(&receiver);
        gDatabase->saveRows();
        require(mChanges == changes, "other feeds have changed than were to");
        return processorSeconds() - start;
    }
    /// The processor time of curl for the same.
    double curl(const Support::TempDir& directory, const std::string& header) const {
        std::string list;
        for (int i = 0; i < count(); ++i) {
            list += fmt::format("url=\"{}\"\noutput=\"/dev/null\"\n", mServer.url(mKind, i));
        }
        std::vector<std::string> command{"/usr/bin/curl",
                                         "-s",
                                         "-Z",
                                         "--parallel-max",
                                         "4",
                                         "--noproxy",
                                         "*",
                                         "-K",
                                         directory.writeFile("urls", list)};
        if (!header.empty()) command.insert(command.end(), {"-H", header});
        const Support::ChildResult result = Support::runChild(command);
        require(result.status == 0, "curl failed");
        return result.processorSeconds;
    }

 private:
    void ended(Notification* notification) {
        const FeedCore* feed = notification->getObject<FeedCore>();
        require(feed->getLastError().code == 0, "a refresh failed");
        const Dictionary* info = notification->info;
        if (info && info->contains("DidChange")) ++mChanges;
        if (++mEnds == count()) RunLoop::current().stop();
    }

    const ServerProcess& mServer;
    const char* mKind;
    std::vector<Ref<FeedCore>> mFeeds;
    int mEnds = 0;
    int mChanges = 0;
};

/// The least of several rounds on both sides.
Comparison quiet(Feeds& feeds, const Support::TempDir& directory, const std::string& header) {
    constexpr double kMost = std::numeric_limits<double>::infinity();
    Comparison least{kMost, kMost};
    for (int i = 0; i < kQuietRounds; ++i) {
        least.measured = std::min(least.measured, feeds.refresh(0));
        least.floor = std::min(least.floor, feeds.curl(directory, header));
    }
    return least;
}

/// The processor time of a walk over the documents.
double walk(const Feeds& feeds) {
    double seconds = 0;
    for (const Ref<FeedCore>& feed : feeds.feeds()) {
        const AutoreleasePool pool;
        const Ref<Data> bytes = feed->getXMLData();
        const double start = processorSeconds();
        xmlTextReaderPtr reader =
            xmlReaderForMemory(static_cast<const char*>(bytes->getBytes()),
                               static_cast<int>(bytes->getLength()), nullptr, nullptr, 0);
        while (xmlTextReaderRead(reader) == 1) {
        }
        xmlFreeTextReader(reader);
        seconds += processorSeconds() - start;
    }
    return seconds;
}

/// The processor time of inserting the rows that the feeds have into a copy of the file.
double insert(const Feeds& feeds, const std::string& path, const std::string& plainPath) {
    Plain reader(path, "");
    Plain plain(plainPath, kInEarnest);
    double seconds = 0;
    for (const Ref<FeedCore>& feed : feeds.feeds()) {
        const long long rowID = feed->getRowID();
        const std::string contents = fmt::format(
            "rowID in (select content from Entries where feed={0} union select summary from "
            "Entries where feed={0} union select xmlRepresentation from Entries where feed={0})",
            rowID);
        const ImportedRows rows(reader, rowID, contents, kEntries);
        require(rows.count() == 3 * kEntries, "rows are missing");
        const double start = processorSeconds();
        rows.insertInto(plain);
        seconds += processorSeconds() - start;
    }
    return seconds;
}

struct FirstRound {
    Comparison costs{0, 0};
    int feeds = 0;
};

/// Adds feeds, and refreshes them for the first time.
FirstRound first(Feeds& feeds, const Support::TempDir& directory, const std::string& path) {
    const std::string plainPath = directory / "Plain.sqlite3";
    gDatabase->executeText(SQLite::SQLText("PRAGMA wal_checkpoint(TRUNCATE)"));
    for (const char* suffix : {"", "-wal", "-shm"}) {
        std::filesystem::remove(plainPath + suffix);
    }
    std::filesystem::copy_file(path, plainPath);
    FirstRound round;
    round.feeds = feeds.count();
    round.costs.measured = feeds.refresh(feeds.count());
    const double fetching = feeds.curl(directory, "");
    const double walking = walk(feeds);
    const double inserting = insert(feeds, path, plainPath);
    round.costs.floor = fetching + walking + inserting;
    std::printf("  a feed's: curl %.0f us, libxml2 %.0f us, sqlite3 %.0f us\n",
                fetching / round.feeds * 1e6, walking / round.feeds * 1e6,
                inserting / round.feeds * 1e6);
    return round;
}

}  // namespace

int main(int argc, char** argv) try {
    // The server is made before anything that a fork would copy.
    const ServerProcess server;
    const bool isLarge = argc > 1 && std::string(argv[1]) == "large";
    const AutoreleasePool pool;
    const Support::TempDir directory;
    const Ref<URL> base{URL::urlWithFileSystemPath(directory.path().c_str(), true)};
    Compatibility::FileSystem::setStorageBaseURL(base);
    const std::string path = directory / "Database.sqlite3";
    SQLite::Database::initialize();
    gDatabase->open(path.c_str(), true);
    Schema::createDatabase();
    const NetPorts ports;

    Feeds tagged(server, "tagged", kFeeds);
    const FirstRound import = first(tagged, directory, path);
    report("a first round, for a feed", import.costs, kFeeds, "curl, libxml2 and sqlite3");
    const Comparison unchanged = quiet(tagged, directory, fmt::format("If-None-Match: {}", kTag));
    report("a round with nothing new, for a feed", unchanged, kFeeds, "curl -Z");
    const double before = residentMegabytes();
    for (int i = 0; i < 100; ++i) {
        const AutoreleasePool inner;
        tagged.refresh(0);
    }
    std::printf("resident: %.0f MB, after 100 rounds more %.0f MB\n", before, residentMegabytes());

    Feeds same(server, "same", kFeeds);
    same.refresh(kFeeds);
    const Comparison identical = quiet(same, directory, "");
    report("a round of the same bytes, for a feed", identical, kFeeds, "curl -Z");

    if (isLarge) {
        Feeds many(server, "many", 10 * kFeeds);
        const FirstRound large = first(many, directory, path);
        report("ten times the feeds, for a feed", large.costs, 10 * kFeeds,
               "curl, libxml2 and sqlite3");
        std::printf("refresh_scale %.2f\n", large.costs.measured / import.costs.measured);
    }
    gDatabase->close(true);
    std::printf("refresh_unchanged %.2f\n", unchanged.ratio());
    std::printf("refresh_identical %.2f\n", identical.ratio());
    std::printf("refresh_first %.2f\n", import.costs.ratio());
    return 0;
} catch (const std::exception& exception) {
    std::fprintf(stderr, "refresh_benchmark: %s\n", exception.what());
    return 1;
}
