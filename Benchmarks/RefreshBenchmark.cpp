#include "Benchmarks/FeedServer.h"
#include "Benchmarks/PlainRows.h"
#include "FeedParser/ParserPort.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/RunLoop.h"
#include "Foundation/URL.h"
#include "Model/FeedCore.h"
#include "Model/Schema.h"
#include "Net/MemoryReturn.h"
#include "Net/NetPorts.h"
#include "SQLite/Cursor.h"
#include "SQLite/Database.h"
#include "SQLite/TableOf.h"
#include "Support/ChildProcess.h"
#include "Support/PrivateBus.h"
#include "Support/TempDir.h"
#include "Utilities/FileSystem.h"

#include <libxml/xmlreader.h>
#include <sys/resource.h>
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
///
/// The feeds are subscribed to, and what changes is announced on a message bus. A round asks once
/// for each feed, over four connections at most, and with its condition from the second round on.
/// A hundred rounds must leave the process no larger than ten: of feeds with nothing new, and of
/// feeds from which an entry falls out for each that comes.

using namespace Benchmarks;
using namespace Foundation;
using namespace Orvane;
using SQLite::gDatabase;

namespace {

constexpr int kFeeds = 1000;
constexpr int kTimes = 10;  ///< as many feeds in the large round
constexpr int kRollingFeeds = 100;
constexpr int kQuietRounds = 5;
constexpr int kMemoryRounds = 100;
constexpr int kMostConnections = 4;
/// What an allocator leaves here and there.
constexpr double kFlatMegabytes = 2;
constexpr const char* kInEarnest = "PRAGMA journal_mode = WAL; PRAGMA synchronous = FULL";

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
    Feeds(FeedServer& server, const char* kind, int count) : mServer(server), mKind(kind) {
        for (int i = 0; i < count; ++i) {
            const AutoreleasePool pool;
            const Ref<FeedCore> feed = Returner<FeedCore>::adopted(new FeedCore);
            feed->mURL.setValue(URL::url(String::string(server.url(kind, i))));
            feed->getIdentifier();
            feed->saveChanges();
            mFeeds.push_back(feed);
            gDatabase->execute(
                "insert into Subscriptions (client, feed, refreshInterval, refreshesInBackground, "
                "unreadCount) values (1, %lld, 1800, 1, 0)",
                feed->getRowID());
        }
    }

    int count() const { return static_cast<int>(mFeeds.size()); }
    const std::vector<Ref<FeedCore>>& feeds() const { return mFeeds; }

    /// The processor time of a round over all of them, which must change so many.
    double refresh(int changes) {
        mServer.startRound();
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
        const double seconds = processorSeconds() - start;
        require(mChanges == changes, "other feeds have changed than were to");
        require(mServer.getRequests() == count(), "not each feed was asked for once");
        require(mServer.getConnections() <= kMostConnections, "too many connections");
        return seconds;
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

    FeedServer& mServer;
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

/// Goes through many rounds, after which the process must be no larger than after the tenth.
void stayFlat(Feeds& feeds, int changes, const char* what) {
    double early = 0;
    for (int i = 1; i <= kMemoryRounds; ++i) {
        const AutoreleasePool pool;
        feeds.refresh(changes);
        if (i == 10) early = residentMegabytes();
    }
    const double late = residentMegabytes();
    std::printf("resident after 10 and %d rounds of %s: %.1f and %.1f MB\n", kMemoryRounds, what,
                early, late);
    require(late - early <= kFlatMegabytes, "memory is lost from round to round");
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
    // Before the floors, which are in this process too.
    std::printf("resident with %d feeds: %.1f MB\n", feeds.count(), residentMegabytes());
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
    FeedServer server;
    const Support::PrivateBus bus;
    MemoryReturn::keepRoomForDocuments();
    const bool isLarge = argc > 1 && std::string(argv[1]) == "large";
    const AutoreleasePool pool;
    const Support::TempDir directory;
    const Ref<URL> base{URL::urlWithFileSystemPath(directory.path().c_str(), true)};
    Compatibility::FileSystem::setStorageBaseURL(base);
    const std::string path = directory / "Database.sqlite3";
    SQLite::Database::initialize();
    gDatabase->open(path.c_str(), true);
    Schema::createDatabase();
    gDatabase->setPostsNotifications(true);
    gDatabase->execute("insert into Clients (rowID, signature) values (1, 'org.example.Reader')");
    const NetPorts ports;

    Feeds tagged(server, "tagged", kFeeds);
    const FirstRound import = first(tagged, directory, path);
    report("a first round, for a feed", import.costs, kFeeds, "curl, libxml2 and sqlite3");
    tagged.refresh(0);
    require(server.getUnchanged() == kFeeds, "a feed was fetched again right after the first time");
    const std::string condition = fmt::format("If-None-Match: {}", kTag);
    const Comparison unchanged = quiet(tagged, directory, condition);
    report("a round with nothing new, for a feed", unchanged, kFeeds, "curl -Z");
    stayFlat(tagged, 0, "nothing new");

    Feeds same(server, "same", kFeeds);
    same.refresh(kFeeds);
    const Comparison identical = quiet(same, directory, "");
    report("a round of the same bytes, for a feed", identical, kFeeds, "curl -Z");

    Feeds rolling(server, "rolling", kRollingFeeds);
    stayFlat(rolling, kRollingFeeds, "an entry more in each feed");

    if (isLarge) {
        Feeds many(server, "tagged-many", kTimes * kFeeds);
        const FirstRound large = first(many, directory, path);
        report("ten times the feeds, first, for a feed", large.costs, kTimes * kFeeds,
               "curl, libxml2 and sqlite3");
        const Comparison idle = quiet(many, directory, condition);
        report("ten times the feeds, nothing new, for a feed", idle, kTimes * kFeeds, "curl -Z");
        std::printf("refresh_unchanged_scale %.2f\n", idle.measured / unchanged.measured);
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
