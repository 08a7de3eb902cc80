// How long after a commit do the caches of another process know of it, next to a bare signal with
// the same payload on the same bus?
//
// A process that writes has committed a change of 100,000 rows, all of which this one holds. The
// time runs from there, over the making of the message, until this process has unloaded the rows
// and has told its observers. The bare side makes and sends the same arguments by sd-bus in a
// process of its own; here they are read, as the other side needs them, and nothing is done.

#include "Benchmarks/BareSignal.h"
#include "Benchmarks/Measure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Bus.h"
#include "Foundation/BusCenter.h"
#include "Foundation/NotificationCenter.h"
#include "Model/EntryCore.h"
#include "Model/Schema.h"
#include "SQLite/Database.h"
#include "SQLite/TableOf.h"
#include "Support/PrivateBus.h"
#include "Support/TempDir.h"
#include "Support/TurnUntil.h"

#include <cstdio>
#include <stdexcept>
#include <string>
#include <vector>

using namespace Foundation;
using Orvane::EntryCore;
using SQLite::gDatabase;
using SQLite::TableOf;

namespace {

constexpr int kRows = 100'000;
constexpr int kRounds = 7;
constexpr const char* kProgram = "/proc/self/exe";

// The process that posts.

void write(const char* path) {
    const AutoreleasePool pool;
    if (!Bus::user().requestName(BusCenter::kAgentName)) throw std::runtime_error("no name");
    SQLite::Database::initialize();
    gDatabase->open(path, true);
    gDatabase->setPostsNotifications(true);
    while (Benchmarks::isAskedAgain()) {
        gDatabase->execute("UPDATE Entries SET read = 1 - read");
        Benchmarks::tellStart();
        gDatabase->_postChangeNotification();
        Bus::user().flush(60);
    }
}

// The process that receives.

/// A reader with all rows in its cache.
class Reader {
 public:
    explicit Reader(const std::string& path) : mWriter({kProgram, "write", path}) {
        gDatabase->open(path.c_str(), false);
        NotificationCenter::getLocal()->addObserver(
            &mReceiver, SQLite::Table::kRowsChangedNotification, TableOf<EntryCore>::instance());
    }
    ~Reader() {
        NotificationCenter::getLocal()->removeObserver(&mReceiver);
        mRows.clear();
        gDatabase->close(false);
    }
    Reader(const Reader&) = delete;
    Reader& operator=(const Reader&) = delete;

    double measure() {
        load();
        mEnd = 0;
        mWriter.writeLine("");
        if (!Support::turnUntil([this] { return mEnd != 0; })) throw std::runtime_error("no news");
        for (const Ref<EntryCore>& row : mRows) {
            if (row->isLoaded()) throw std::runtime_error("a row is out of date");
        }
        return Benchmarks::secondsSinceStart(mWriter, mEnd);
    }

 private:
    void load() {
        mRows.clear();
        const AutoreleasePool pool;
        const auto query = TableOf<EntryCore>::instance()->allRows();
        const Ref<ArrayOf<EntryCore>> rows = query->allRows();
        for (EntryCore* row : *rows) {
            mRows.emplace_back(row);
        }
        if (mRows.size() != kRows) throw std::runtime_error("rows are missing");
    }
    void receive(Notification*) { mEnd = Benchmarks::machineSeconds(); }

    Support::PipedChild mWriter;
    std::vector<Ref<EntryCore>> mRows;
    double mEnd = 0;
    Orvane::MethodReceiver<Notification, Reader> mReceiver{this, &Reader::receive};
};

void makeFile(const std::string& path) {
    SQLite::Database::initialize();
    gDatabase->open(path.c_str(), true);
    Orvane::Schema::createDatabase();
    gDatabase->execute(
        "WITH RECURSIVE n(i) AS (SELECT 1 UNION ALL SELECT i + 1 FROM n WHERE i < %d) "
        "INSERT INTO Entries (identifier, title, read) SELECT i, 'Entry ' || i, 0 FROM n",
        kRows);
    gDatabase->close(true);
}

void compareBoth() {
    const AutoreleasePool pool;
    const Support::PrivateBus bus;
    const Support::TempDir directory;
    const std::string path = directory / "Database.sqlite3";
    makeFile(path);
    Reader reader(path);
    Benchmarks::BareSignal bare(bus.getAddress());
    Support::PipedChild sender({kProgram, "signal", bus.getAddress()});
    std::vector<double> measured;
    std::vector<double> floor;
    for (int i = 0; i < kRounds; ++i) {
        measured.push_back(reader.measure());
        floor.push_back(bare.measure(sender, kRows));
    }
    const Benchmarks::Comparison c = {Benchmarks::median(measured), Benchmarks::median(floor)};
    Benchmarks::report("a change of a row to another process", c, kRows, "a bare signal");
    std::printf("store_change_latency %.2f\n", c.ratio());
}

}  // namespace

int main(int argc, char** argv) try {
    const std::string role = argc > 2 ? argv[1] : "";
    if (role == "write") {
        write(argv[2]);
    } else if (role == "signal") {
        Benchmarks::BareSignal::serve(argv[2], EntryCore::kTableName, kRows);
    } else {
        compareBoth();
    }
    return 0;
} catch (const std::exception& exception) {
    std::fprintf(stderr, "change_benchmark: %s\n", exception.what());
    return 1;
}
