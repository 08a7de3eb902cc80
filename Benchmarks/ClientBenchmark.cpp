// What does it cost to have the agent change a flag of an entry, next to a bare echo by sd-bus that
// commits the same change with sqlite3?
//
// The same for 50 callers at once: what do the slowest calls, one in a hundred, take?
//
// The same for 50 callers at once: what do the slowest calls take, one in a hundred?
//
// Both sides are processes on one bus. The bare one keeps its statements, and has the settings of
// the agent's database: a write-ahead log, and each commit on the disk. Both change the flag and
// its date of one row, and count the unread entries of its feed.

#include "Agent/RPC/AgentService.h"
#include "Agent/RPC/Routines.h"
#include "Benchmarks/Measure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Bus.h"
#include "Model/Schema.h"
#include "SQLite/Database.h"
#include "Support/EnvVar.h"
#include "Support/PipedChild.h"
#include "Support/PrivateBus.h"
#include "Support/TempDir.h"

#include <sqlite3.h>
#include <systemd/sd-bus.h>

#include <algorithm>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <list>
#include <sstream>
#include <stdexcept>
#include <string>
#include <vector>

using namespace Orvane;
using Foundation::Bus;

namespace {

constexpr int kCalls = 200;
constexpr int kRounds = 9;
constexpr int kEntries = 1000;
constexpr int kCrowd = 50;
constexpr int kCrowdCalls = 40;
constexpr int kCrowdRows = 20;  ///< of each caller's own
constexpr int kCrowdRounds = 3;
constexpr const char* kBareName = "com.tarnwick.orvane.Bare";
constexpr const char* kBarePath = "/bare";
constexpr const char* kProgram = "/proc/self/exe";

void check(bool holds, const char* what) {
    if (!holds) throw std::runtime_error(what);
}

// The bare side.

sqlite3* sDatabase = nullptr;
sqlite3_stmt* sUpdate = nullptr;
sqlite3_stmt* sCount = nullptr;

void step(sqlite3_stmt* statement) {
    const int result = sqlite3_step(statement);
    check(result == SQLITE_DONE || result == SQLITE_ROW, sqlite3_errmsg(sDatabase));
    sqlite3_reset(statement);
}

int set(sd_bus_message* call, void*, sd_bus_error*) {
    std::int64_t row = 0;
    int value = 0;
    if (sd_bus_message_read(call, "xb", &row, &value) < 0) return -EINVAL;
    sqlite3_exec(sDatabase, "begin immediate", nullptr, nullptr, nullptr);
    sqlite3_bind_int(sUpdate, 1, value);
    sqlite3_bind_int64(sUpdate, 2, row);
    step(sUpdate);
    step(sCount);
    check(sqlite3_exec(sDatabase, "commit", nullptr, nullptr, nullptr) == SQLITE_OK, "commit");
    return sd_bus_reply_method_return(call, "i", 0);
}

const sd_bus_vtable kTable[] = {
    SD_BUS_VTABLE_START(0),
    SD_BUS_METHOD("Set", "xb", "i", set, SD_BUS_VTABLE_UNPRIVILEGED),
    SD_BUS_VTABLE_END,
};

void serveBare(const char* path) {
    check(sqlite3_open(path, &sDatabase) == SQLITE_OK, "open");
    sqlite3_exec(sDatabase, "pragma synchronous=full", nullptr, nullptr, nullptr);
    sqlite3_prepare_v2(sDatabase,
                       "update Entries set read=?, localDateFlagsUpdated=1 where rowID=?", -1,
                       &sUpdate, nullptr);
    sqlite3_prepare_v2(sDatabase,
                       "update Subscriptions set unreadCount=(select count(*) from Entries"
                       " where feed=1 and read=0) where rowID=2",
                       -1, &sCount, nullptr);
    sd_bus* bus = nullptr;
    check(sd_bus_open_user(&bus) >= 0, "bus");
    check(sd_bus_add_object_vtable(bus, nullptr, kBarePath, kBareName, kTable, nullptr) >= 0,
          "object");
    check(sd_bus_request_name(bus, kBareName, 0) >= 0, "name");
    std::printf("ready\n");
    std::fflush(stdout);
    for (;;) {
        const int result = sd_bus_process(bus, nullptr);
        if (result < 0) return;
        if (result == 0) sd_bus_wait(bus, UINT64_MAX);
    }
}

// The caller.

void seed(const std::string& path) {
    const Foundation::AutoreleasePool pool;
    std::filesystem::create_directories(std::filesystem::path(path).parent_path());
    SQLite::Database::initialize();
    SQLite::Database& db = *SQLite::gDatabase;
    db.open(path.c_str(), true);
    Schema::createDatabase();
    db.useWriteAheadLog();
    db.execute(
        "insert into Clients (rowID,signature,dateUsed) values (1,'org.example.Reader',1);"
        "insert into Feeds (rowID,url,identifier) values (1,'http://example.org/1','f1');"
        "insert into Subscriptions (rowID,client,feed,refreshInterval,expirationInterval,"
        "  refreshesInBackground) values (1,1,0,-1,-1,1),(2,1,1,-1,-1,1);"
        "with recursive n(i) as (select 1 union all select i+1 from n where i<%d)"
        " insert into Entries (rowID,identifier,feed,current,read,flagged,localDateCreated)"
        " select i,'e'||i,1,1,0,0,1000 from n",
        kEntries);
    db.close(true);
}

class Caller {
 public:
    Caller() {
        check(sd_bus_open_user(&mBus) >= 0, "bus");
        check(RPC::AgentService::instance().lookUp(mPort) == 0, "no agent");
    }
    ~Caller() { sd_bus_flush_close_unref(mBus); }

    void callAgent() {
        for (int i = 0; i < kCalls; ++i) {
            callAgent(i + 1, mAgentValue);
        }
        mAgentValue = !mAgentValue;
    }
    void callBare() {
        for (int i = 0; i < kCalls; ++i) {
            callBare(i + 1, mBareValue);
        }
        mBareValue = !mBareValue;
    }
    void callAgent(std::int64_t row, bool value) const {
        check(RPC::ipc_entry_setRead(mPort, row, value) == 0, "the agent failed");
    }
    void callBare(std::int64_t row, bool value) const {
        sd_bus_message* reply = nullptr;
        const int result = sd_bus_call_method(mBus, kBareName, kBarePath, kBareName, "Set", nullptr,
                                              &reply, "xb", row, int{value});
        sd_bus_message_unref(reply);
        check(result >= 0, "the bare side failed");
    }

 private:
    sd_bus* mBus = nullptr;
    std::uint32_t mPort = 0;
    bool mAgentValue = true;
    bool mBareValue = true;
};

// Many callers.

/// Waits for the end of the input, calls, and writes what each call took.
void callMany(bool isBare, int number) {
    const Foundation::AutoreleasePool pool;
    const Caller caller;
    std::printf("ready\n");
    std::fflush(stdout);
    while (std::getchar() != EOF) {
    }
    for (int i = 0; i < kCrowdCalls; ++i) {
        const std::int64_t row = number * kCrowdRows + i % kCrowdRows + 1;
        const bool value = i / kCrowdRows % 2 == 0;
        std::printf("%.9f ", Benchmarks::secondsOf([&] {
                        isBare ? caller.callBare(row, value) : caller.callAgent(row, value);
                    }));
    }
    std::printf("\n");
}

/// What the slowest calls of a crowd take, one in a hundred.
double slowCallOfCrowd(const char* kind) {
    std::list<Support::PipedChild> children;
    for (int i = 0; i < kCrowd; ++i) {
        children.emplace_back(
            std::vector<std::string>{kProgram, "--call", kind, std::to_string(i)});
        check(children.back().readLine() == "ready", "no caller");
    }
    for (Support::PipedChild& child : children) {
        child.closeInput();
    }
    std::vector<double> times;
    for (Support::PipedChild& child : children) {
        std::istringstream line(child.readLine());
        for (double seconds = 0; line >> seconds;) {
            times.push_back(seconds);
        }
        check(child.wait() == 0, "a caller failed");
    }
    check(times.size() == kCrowd * kCrowdCalls, "a call is lost");
    std::sort(times.begin(), times.end());
    return times[times.size() * 99 / 100];
}

void compareCrowds() {
    std::vector<double> agent;
    std::vector<double> bare;
    for (int i = 0; i < kCrowdRounds; ++i) {
        agent.push_back(slowCallOfCrowd("agent"));
        bare.push_back(slowCallOfCrowd("bare"));
    }
    const Benchmarks::Comparison slowest{Benchmarks::median(agent), Benchmarks::median(bare)};
    Benchmarks::report("the slowest of 100 calls, of 50 callers", slowest, 1, "the same, bare");
}

void run() {
    const Support::TempDir home;
    const Support::EnvVar data("XDG_DATA_HOME", home.path().c_str());
    const Support::EnvVar config("XDG_CONFIG_HOME", home.path().c_str());
    home.makeDirectory("dbus-1");
    home.makeDirectory("dbus-1/services");
    home.writeFile("dbus-1/services/com.tarnwick.orvane.ipc.service",
                   "[D-BUS Service]\nName=com.tarnwick.orvane.ipc\nExec=" ORVANE_AGENT "\n");
    const Support::PrivateBus bus;
    seed(home / "Orvane/Database/Database.sqlite3");
    seed(home / "bare.sqlite3");
    Support::PipedChild bare({kProgram, "--serve", home / "bare.sqlite3"});
    check(bare.readLine() == "ready", "no bare side");
    Caller caller;
    caller.callAgent();
    caller.callBare();
    compareCrowds();
    const Benchmarks::Comparison calls =
        Benchmarks::compare([&] { caller.callAgent(); }, [&] { caller.callBare(); }, kRounds);
    kill(static_cast<pid_t>(Bus::user().getProcessID(RPC::kServiceName)), SIGTERM);
    Benchmarks::report("a call that changes a flag", calls, kCalls, "sd-bus echo with its commit");
    std::printf("client_benchmark %.2f\n", calls.ratio());
}

}  // namespace

int main(int argc, char** argv) {
    try {
        const std::string mode = argc > 1 ? argv[1] : "";
        if (mode == "--serve") {
            serveBare(argv[2]);
        } else if (mode == "--call") {
            callMany(std::string(argv[2]) == "bare", std::atoi(argv[3]));
        } else {
            run();
        }
    } catch (const std::exception& exception) {
        std::fprintf(stderr, "%s\n", exception.what());
        return 1;
    }
    return 0;
}
