// How long after a commit do the caches of another process know of it, next to a bare signal with
// the same payload on the same bus?
//
// A process that writes has committed a change of 100,000 rows, all of which this one holds. The
// time runs from there, over the making of the message, until this process has unloaded the rows
// and has told its observers. The bare side makes and sends the same arguments by sd-bus in a
// process of its own; here they are read, as the other side needs them, and nothing is done.

#include "Benchmarks/Measure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Bus.h"
#include "Foundation/BusCenter.h"
#include "Foundation/Clock.h"
#include "Foundation/NotificationCenter.h"
#include "Model/EntryCore.h"
#include "Model/Schema.h"
#include "SQLite/Database.h"
#include "SQLite/TableOf.h"
#include "Support/PipedChild.h"
#include "Support/PrivateBus.h"
#include "Support/TempDir.h"
#include "Support/TurnUntil.h"

#include <systemd/sd-bus.h>

#include <cstdio>
#include <cstdlib>
#include <ctime>
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

/// The machine's own time, which is the same in all processes.
double now() {
    timespec time = {};
    clock_gettime(CLOCK_MONOTONIC, &time);
    return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_nsec) / 1e9;
}

void tellStart() {
    std::printf("%.9f\n", now());
    std::fflush(stdout);
}

void check(int result) {
    if (result < 0) throw std::runtime_error("sd-bus failed");
}

// The processes that post.

void write(const char* path) {
    const AutoreleasePool pool;
    if (!Bus::user().requestName(BusCenter::kAgentName)) throw std::runtime_error("no name");
    SQLite::Database::initialize();
    gDatabase->open(path, true);
    gDatabase->setPostsNotifications(true);
    gDatabase->execute("UPDATE Entries SET read = 1 - read");
    tellStart();
    gDatabase->_postChangeNotification();
    Bus::user().flush(60);
}

void appendChanges(sd_bus_message* signal) {
    check(sd_bus_message_append(signal, "ss", "name", "object"));
    check(sd_bus_message_open_container(signal, 'a', "{sv}"));
    check(sd_bus_message_open_container(signal, 'e', "sv"));
    check(sd_bus_message_append_basic(signal, 's', EntryCore::kTableName));
    check(sd_bus_message_open_container(signal, 'v', "a{sv}"));
    check(sd_bus_message_open_container(signal, 'a', "{sv}"));
    for (int row = 1; row <= kRows; ++row) {
        check(sd_bus_message_append(signal, "{sv}", std::to_string(row).c_str(), "x",
                                    static_cast<std::int64_t>(23)));
    }
    for (int i = 0; i < 4; ++i) {
        check(sd_bus_message_close_container(signal));
    }
}

sd_bus* openBus(const char* address) {
    sd_bus* bus = nullptr;
    check(sd_bus_new(&bus));
    check(sd_bus_set_address(bus, address));
    check(sd_bus_set_bus_client(bus, 1));
    check(sd_bus_start(bus));
    return bus;
}

void signal(const char* address) {
    sd_bus* bus = openBus(address);
    tellStart();
    sd_bus_message* message = nullptr;
    check(sd_bus_message_new_signal(bus, &message, BusCenter::kPath, "bare.Interface", "Posted"));
    appendChanges(message);
    check(sd_bus_send(bus, message, nullptr));
    sd_bus_message_unref(message);
    sd_bus_flush_close_unref(bus);
}

// The process that receives.

/// The seconds since the time that a child told.
double secondsSinceStart(Support::PipedChild& child, double end) {
    const std::string start = child.readLine();
    if (start.empty() || child.wait() != 0) throw std::runtime_error("a child failed");
    return end - std::strtod(start.c_str(), nullptr);
}

/// A reader with all rows in its cache.
class Reader {
 public:
    explicit Reader(std::string path) : mPath(std::move(path)) {
        gDatabase->open(mPath.c_str(), false);
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
        Support::PipedChild writer({kProgram, "write", mPath});
        if (!Support::turnUntil([this] { return mEnd != 0; })) throw std::runtime_error("no news");
        for (const Ref<EntryCore>& row : mRows) {
            if (row->isLoaded()) throw std::runtime_error("a row is out of date");
        }
        return secondsSinceStart(writer, mEnd);
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
    void receive(Notification*) { mEnd = now(); }

    std::string mPath;
    std::vector<Ref<EntryCore>> mRows;
    double mEnd = 0;
    Orvane::MethodReceiver<Notification, Reader> mReceiver{this, &Reader::receive};
};

/// The same with nothing between the program and the library.
class BareReader {
 public:
    explicit BareReader(std::string address) : mAddress(std::move(address)) {
        mBus = openBus(mAddress.c_str());
        check(sd_bus_match_signal(mBus, nullptr, nullptr, nullptr, "bare.Interface", "Posted",
                                  receive, this));
    }
    ~BareReader() { sd_bus_flush_close_unref(mBus); }
    BareReader(const BareReader&) = delete;
    BareReader& operator=(const BareReader&) = delete;

    double measure() {
        mEnd = 0;
        Support::PipedChild sender({kProgram, "signal", mAddress});
        while (mEnd == 0) {
            if (sd_bus_process(mBus, nullptr) == 0) sd_bus_wait(mBus, UINT64_MAX);
        }
        return secondsSinceStart(sender, mEnd);
    }

 private:
    static int receive(sd_bus_message* message, void* self, sd_bus_error*) {
        if (countRows(message) == kRows) static_cast<BareReader*>(self)->mEnd = now();
        return 0;
    }
    static int countRows(sd_bus_message* message) {
        int count = 0;
        long long sum = 0;
        const char* key = nullptr;
        sd_bus_message_skip(message, "ss");
        sd_bus_message_enter_container(message, 'a', "{sv}");
        sd_bus_message_enter_container(message, 'e', "sv");
        sd_bus_message_read_basic(message, 's', &key);
        sd_bus_message_enter_container(message, 'v', "a{sv}");
        sd_bus_message_enter_container(message, 'a', "{sv}");
        std::int64_t action = 0;
        for (; sd_bus_message_read(message, "{sv}", &key, "x", &action) > 0; ++count) {
            sum += std::atoll(key) + action;
        }
        Benchmarks::keep(sum);
        return count;
    }

    std::string mAddress;
    sd_bus* mBus = nullptr;
    double mEnd = 0;
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
    BareReader bare(bus.getAddress());
    std::vector<double> measured;
    std::vector<double> floor;
    for (int i = 0; i < kRounds; ++i) {
        measured.push_back(reader.measure());
        floor.push_back(bare.measure());
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
        signal(argv[2]);
    } else {
        compareBoth();
    }
    return 0;
} catch (const std::exception& exception) {
    std::fprintf(stderr, "change_benchmark: %s\n", exception.what());
    return 1;
}
