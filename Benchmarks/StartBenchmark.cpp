#include "Benchmarks/Measure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Clock.h"
#include "Foundation/URL.h"
#include "Model/MinistryOfTruth.h"
#include "SQLite/Database.h"
#include "SQLite/FakeCenter.h"
#include "SQLite/Transaction.h"
#include "Support/EnvVar.h"
#include "Support/LogCapture.h"
#include "Support/PipedChild.h"
#include "Support/PrivateBus.h"
#include "Support/TempDir.h"
#include "Utilities/FileSystem.h"

#include <sqlite3.h>

#include <csignal>
#include <cstring>
#include <fstream>
#include <stdexcept>
#include <string>

/// How long does the agent take from the start of its process until it serves, with 1,000 feeds and
/// 100,000 entries, and how much memory has it then?
///
/// The floor is a process that opens the file with plain sqlite3, walks the same three tables with
/// all their columns, and stops there. The aims are 300 ms and 60 MB.

using namespace Benchmarks;
using namespace Foundation;
using namespace Orvane;
using SQLite::gDatabase;

namespace {

constexpr int kFeeds = 1'000;
constexpr int kEntries = 100'000;
constexpr int kRounds = 7;
constexpr double kAimSeconds = 0.3;
constexpr double kAimMegabytes = 60;
constexpr const char* kReady = "Orvane Agent finished setup; starting runloop";

void makeRows() {
    const SQLite::Transaction transaction(true);
    const double now = Clock::current().now();
    gDatabase->execute(
        "insert into Clients (signature, private, dateUsed) "
        "values ('org.example.Reader', 0, %.3f)",
        now);
    gDatabase->execute(
        "insert into Feeds (url, identifier, title, refreshLocalDate, refreshEtag) "
        "with recursive n(i) as (select 1 union all select i + 1 from n where i < %d) "
        "select 'http://example.com/feeds/' || i, printf('%%040x', i), 'Feed number ' || i, %.3f, "
        "'\"' || i || '\"' from n",
        kFeeds, now);
    gDatabase->execute(
        "insert into Subscriptions (client, feed, refreshInterval, expirationInterval, "
        "refreshesInBackground, downloadsEnclosures, maxEnclosureSize, unreadCount) "
        "select 1, null, 0, 0, 1, 0, 0, 0 union all select 1, rowID, 0, 0, 1, 0, 0, 0 from Feeds");
    gDatabase->execute(
        "insert into Contents (mimeType, data) "
        "with recursive n(i) as (select 1 union all select i + 1 from n where i < %d) "
        "select 'text/html', hex(zeroblob(250)) from n",
        kEntries);
    gDatabase->execute(
        "insert into Entries (feed, identifier, title, content, localDateCreated, current, read, "
        "flagged) select 1 + rowID %% %d, printf('%%040x', rowID), 'Entry number ' || rowID, "
        "rowID, %.3f, 1, 1, 0 from Contents",
        kFeeds, now);
}

void makeDatabase(const std::string& base) {
    const AutoreleasePool pool;
    const Support::LogCapture log;
    FakeCenter center;
    const Ref<URL> url = URL::urlWithFileSystemPath(base.c_str(), true);
    Compatibility::FileSystem::setStorageBaseURL(url);
    MinistryOfTruth::instance()->openDatabase();
    makeRows();
    MinistryOfTruth::instance()->saveSubscriptions();
    gDatabase->close(true);
}

/// What the floor does: see above.
int walk(const char* file) {
    sqlite3* db = nullptr;
    if (sqlite3_open(file, &db) != SQLITE_OK) return 1;
    for (const char* table : {"Clients", "Feeds", "Subscriptions"}) {
        sqlite3_stmt* statement = nullptr;
        const std::string sql = std::string("select * from ") + table;
        if (sqlite3_prepare_v2(db, sql.c_str(), -1, &statement, nullptr) != SQLITE_OK) return 1;
        while (sqlite3_step(statement) == SQLITE_ROW) {
            for (int i = 0; i < sqlite3_column_count(statement); ++i) {
                keep(sqlite3_column_text(statement, i));
            }
        }
        sqlite3_finalize(statement);
    }
    std::printf("%s\n", kReady);
    std::fflush(stdout);
    return sqlite3_close(db) == SQLITE_OK ? 0 : 1;
}

double residentMegabytes(const std::string& pid) {
    std::ifstream file("/proc/" + pid + "/status");
    for (std::string line; std::getline(file, line);) {
        if (line.starts_with("VmRSS:")) return std::stod(line.substr(6)) / 1024;
    }
    return 0;
}

struct Start {
    double seconds;
    double megabytes;
};

/// Starts a program and waits for its word that it is ready. It says its process ID first.
Start start(const std::string& program) {
    Start result{};
    const std::string command = "echo $$; exec " + program + " 2>&1";
    std::string pid;
    Support::PipedChild child({"/bin/sh", "-c", command});
    result.seconds = secondsOf([&] {
        pid = child.readLine();
        for (std::string line; line.find(kReady) == std::string::npos;) {
            line = child.readLine();
            if (line.empty()) throw std::runtime_error(program + " does not start");
        }
    });
    result.megabytes = residentMegabytes(pid);
    kill(std::stoi(pid), SIGTERM);
    child.wait();
    return result;
}

}  // namespace

int main(int argc, char** argv) {
    if (argc == 3 && std::strcmp(argv[1], "walk") == 0) return walk(argv[2]);
    const Support::TempDir home;
    const Support::EnvVar data("XDG_DATA_HOME", home.path().c_str());
    const Support::EnvVar config("XDG_CONFIG_HOME", home.path().c_str());
    const Support::EnvVar noSystemBus("DBUS_SYSTEM_BUS_ADDRESS", "unix:path=/nonexistent/bus");
    const Support::EnvVar log("OVLog", "1");
    const Support::EnvVar toTerminal("OVUseSystemLog", "0");
    makeDatabase(home.path().string());
    const Support::PrivateBus bus;
    const std::string walker =
        std::string(argv[0]) + " walk " + (home / "Orvane/Database/Database.sqlite3");

    std::vector<double> seconds, floors, megabytes;
    for (int i = 0; i < kRounds; ++i) {
        const Start agent = start(ORVANE_AGENT);
        seconds.push_back(agent.seconds);
        megabytes.push_back(agent.megabytes);
        floors.push_back(start(walker).seconds);
    }
    std::printf("the agent serves after %.0f ms (aim %.0f), the floor after %.0f ms\n",
                median(seconds) * 1e3, kAimSeconds * 1e3, median(floors) * 1e3);
    std::printf("resident memory %.1f MB (aim %.0f)\n", median(megabytes), kAimMegabytes);
    std::printf("start_benchmark %.2f\n", median(seconds) / median(floors));
}
