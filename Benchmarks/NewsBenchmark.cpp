// How long after a commit does the delegate of an application in another process hear of it, next
// to a bare signal with the same payload on the same bus?
//
// A process that writes has committed a change of entries' flags. The time runs from there, over
// the making of the message, until this process has let go of what it had read of the rows, has
// found out what has happened to which entries of which feeds, and calls the delegate with them.
// That is done for an application with one feed, and for one with 1,000 feeds and 100,000 entries.

#include "Benchmarks/BareSignal.h"
#include "Benchmarks/Measure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Bus.h"
#include "Foundation/Clock.h"
#include "Model/EntryCore.h"
#include "Model/Schema.h"
#include "SQLite/Database.h"
#include "Support/EnvVar.h"
#include "Support/PrivateBus.h"
#include "Support/TempDir.h"
#include "Support/TurnUntil.h"

#include <Orvane/Orvane.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <stdexcept>
#include <string>
#include <vector>

using namespace Foundation;
using SQLite::gDatabase;

namespace {

constexpr int kFeeds = 1000;
constexpr int kEntriesOfFeed = 100;
constexpr int kRounds = 21;
constexpr const char* kProgram = "/proc/self/exe";
constexpr const char* kSmall = "org.example.Small";
constexpr const char* kLarge = "org.example.Large";

// The process that posts.

void write(const char* path, int rows) {
    const AutoreleasePool pool;
    if (!Bus::user().requestName(BusCenter::kAgentName)) throw std::runtime_error("no name");
    SQLite::Database::initialize();
    gDatabase->open(path, true);
    gDatabase->setPostsNotifications(true);
    while (Benchmarks::isAskedAgain()) {
        gDatabase->execute(
            "update Entries set flagged=1-flagged, localDateFlagsUpdated=%f where rowID<=%d",
            Clock::current().now(), rows);
        Benchmarks::tellStart();
        gDatabase->_postChangeNotification();
        Bus::user().flush(60);
    }
}

// The process that receives.

/// An application that waits for its entries to change.
class Application : public OVClientDelegate {
 public:
    explicit Application(const char* identifier)
        : mClient(OVClient::clientForBundleIdentifier(identifier)) {
        if (!mClient) throw std::runtime_error("no client");
        mClient->setDelegate(this);
    }
    ~Application() override { mClient->setDelegate(nullptr); }
    Application(const Application&) = delete;
    Application& operator=(const Application&) = delete;

    double measure(Support::PipedChild& writer, int rows) {
        mRows = rows;
        mEnd = 0;
        writer.writeLine("");
        if (!Support::turnUntil([this] { return mEnd != 0; })) throw std::runtime_error("no news");
        return Benchmarks::secondsSinceStart(writer, mEnd);
    }

    void feedDidChangeFlagsInEntries(const std::shared_ptr<OVFeed>& /*feed*/,
                                     const OVEntry::List& entries) override {
        if (entries.size() == static_cast<std::size_t>(mRows)) {
            mEnd = Benchmarks::machineSeconds();
        }
    }

 private:
    std::shared_ptr<OVClient> mClient;
    int mRows = 0;
    double mEnd = 0;
};

void seed(const std::string& path) {
    std::filesystem::create_directories(std::filesystem::path(path).parent_path());
    const double now = Clock::current().now();
    SQLite::Database::initialize();
    gDatabase->open(path.c_str(), true);
    Orvane::Schema::createDatabase();
    gDatabase->useWriteAheadLog();
    gDatabase->execute(
        "insert into Clients (rowID,signature,private,dateUsed) values (1,'%s',0,%f),(2,'%s',0,%f);"
        "insert into Subscriptions (client,feed,refreshInterval,expirationInterval,"
        " refreshesInBackground) values (1,0,1800,1209600,1),(2,0,1800,1209600,1);"
        "with recursive n(i) as (select 1 union all select i+1 from n where i<%d)"
        " insert into Feeds (rowID,url,identifier,title)"
        " select i,'http://example.org/'||i,'f'||i,'Feed '||i from n;"
        "insert into Subscriptions (client,feed,refreshInterval,expirationInterval,"
        " refreshesInBackground) select 2,rowID,0,0,1 from Feeds union all select 1,1,0,0,1;"
        "with recursive n(i) as (select 0 union all select i+1 from n where i<%d)"
        " insert into Entries (identifier,feed,title,current,read,flagged,localDateCreated,"
        "  localDateUpdated,localDateXmlChanged,localDateFlagsUpdated)"
        " select 'e'||i,i/%d+1,'Title of entry number '||i,1,i%%3=0,0,%f,%f,%f,0 from n",
        kSmall, now, kLarge, now, kFeeds, kFeeds * kEntriesOfFeed - 1, kEntriesOfFeed, now - 1000,
        now - 1000, now - 1000);
    gDatabase->close(true);
}

/// The ratio.
double compare(const char* identifier, const std::string& path, const std::string& address,
               int rows) {
    Application application(identifier);
    Benchmarks::BareSignal bare(address);
    Support::PipedChild writer({kProgram, "write", path, std::to_string(rows)});
    Support::PipedChild sender({kProgram, "signal", address, std::to_string(rows)});
    // What is done once is not asked about.
    application.measure(writer, rows);
    bare.measure(sender, rows);
    std::vector<double> measured;
    std::vector<double> floor;
    for (int i = 0; i < kRounds; ++i) {
        measured.push_back(application.measure(writer, rows));
        floor.push_back(bare.measure(sender, rows));
    }
    const Benchmarks::Comparison c = {Benchmarks::median(measured), Benchmarks::median(floor)};
    const std::string what =
        OVFormat("%d of an application with %d entries", rows,
                 identifier == kLarge ? kFeeds * kEntriesOfFeed : kEntriesOfFeed);
    Benchmarks::report(what.c_str(), c, 1, "a bare signal");
    return c.ratio();
}

void run() {
    const AutoreleasePool pool;
    const Support::TempDir home;
    const Support::EnvVar data("XDG_DATA_HOME", home.path().c_str());
    const Support::EnvVar config("XDG_CONFIG_HOME", home.path().c_str());
    const Support::PrivateBus bus;
    const std::string path = home / "Orvane/Database/Database.sqlite3";
    seed(path);
    double ratio = 0;
    for (const char* identifier : {kSmall, kLarge}) {
        for (const int rows : {1, kEntriesOfFeed}) {
            ratio = std::max(ratio, compare(identifier, path, bus.getAddress(), rows));
        }
    }
    std::printf("news_benchmark %.2f\n", ratio);
}

}  // namespace

int main(int argc, char** argv) {
    try {
        const std::string role = argc > 3 ? argv[1] : "";
        if (role == "write") {
            write(argv[2], std::atoi(argv[3]));
        } else if (role == "signal") {
            Benchmarks::BareSignal::serve(argv[2], Orvane::EntryCore::kTableName,
                                          std::atoi(argv[3]));
        } else {
            run();
        }
    } catch (const std::exception& exception) {
        std::fprintf(stderr, "news_benchmark: %s\n", exception.what());
        return 1;
    }
    return 0;
}
