// What does it take from the start of a process to list the newest 200 of 100,000 entries of 1,000
// feeds, next to the program sqlite3 with the same query?
//
// Both are processes that are started, write the titles to a file, and end. The application opens
// its client as any does; nobody needs the agent for that.

#include "Benchmarks/Measure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Clock.h"
#include "Model/Schema.h"
#include "SQLite/Database.h"
#include "Support/ChildProcess.h"
#include "Support/EnvVar.h"
#include "Support/PrivateBus.h"
#include "Support/TempDir.h"

#include <algorithm>
#include <cstdio>
#include <filesystem>
#include <stdexcept>
#include <string>
#include <vector>

namespace {

constexpr int kFeeds = 1000;
constexpr int kEntries = 100'000;
constexpr int kListed = 200;
constexpr int kRounds = 15;
constexpr const char* kIdentifier = "org.example.Reader";

void seed(const std::string& path) {
    const Foundation::AutoreleasePool pool;
    std::filesystem::create_directories(std::filesystem::path(path).parent_path());
    const double now = Foundation::Clock::current().now();
    SQLite::Database::initialize();
    SQLite::Database& db = *SQLite::gDatabase;
    db.open(path.c_str(), true);
    Orvane::Schema::createDatabase();
    db.useWriteAheadLog();
    db.execute(
        "insert into Clients (rowID,signature,private,dateUsed) values (1,'%s',0,%f);"
        "with recursive n(i) as (select 1 union all select i+1 from n where i<%d)"
        " insert into Feeds (rowID,url,identifier,title)"
        " select i,'http://example.org/'||i,'f'||i,'Feed '||i from n;"
        "insert into Subscriptions (client,feed,refreshInterval,expirationInterval,"
        " refreshesInBackground) values (1,0,1800,1209600,1);"
        "insert into Subscriptions (client,feed,refreshInterval,expirationInterval,"
        " refreshesInBackground) select 1,rowID,0,0,1 from Feeds",
        kIdentifier, now, kFeeds);
    // As entries come: a few of each feed at a time.
    db.execute(
        "with recursive n(i) as (select 0 union all select i+1 from n where i<%d-1)"
        " insert into Entries (identifier,id,feed,title,alternateUrl,current,read,flagged,"
        "  localDateCreated,localDateUpdated,localDateXmlChanged,localDateFlagsUpdated)"
        " select printf('%%040d',i),'http://example.org/entries/'||i,i%%%d+1,"
        "  'Title of entry number '||i,'http://example.org/entries/'||i,1,i%%3=0,0,"
        "  %f+i,%f+i,%f+i,0 from n",
        kEntries, kFeeds, now - 1e6, now - 1e6, now - 1e6);
    db.close(true);
}

/// The statement of `OVClient::entries`.
std::string query() {
    const std::string order = " order by e.localDateCreated desc,e.rowID desc";
    return "select e.title from Entries as e where e.rowID in (select e.rowID"
           " from Subscriptions as s, Entries as e"
           " where s.client=(select rowID from Clients where signature='" +
           std::string(kIdentifier) +
           "') and s.feed!=0 and e.feed=s.feed"
           " and (ifnull(s.expirationDate,0)=0 or e.localDateCreated>s.expirationDate)" +
           order + " limit " + std::to_string(kListed) + " offset 0)" + order;
}

std::string outputOf(const std::vector<std::string>& command) {
    const Support::ChildResult result = Support::runChild(command);
    if (result.status != 0) throw std::runtime_error(command[0] + " failed: " + result.err);
    return result.out;
}

void run() {
    const Support::TempDir home;
    const Support::EnvVar data("XDG_DATA_HOME", home.path().c_str());
    const Support::EnvVar config("XDG_CONFIG_HOME", home.path().c_str());
    const Support::PrivateBus bus;
    const std::string path = home / "Orvane/Database/Database.sqlite3";
    seed(path);
    const std::vector<std::string> client = {LIST_CLIENT, kIdentifier, std::to_string(kListed)};
    const std::vector<std::string> bare = {"/usr/bin/sqlite3", "-readonly", path, query()};
    const std::string listed = outputOf(client);
    if (listed != outputOf(bare)) throw std::runtime_error("the lists differ");
    if (std::count(listed.begin(), listed.end(), '\n') != kListed) {
        throw std::runtime_error("entries are missing");
    }
    const Benchmarks::Comparison c =
        Benchmarks::compare([&] { outputOf(client); }, [&] { outputOf(bare); }, kRounds);
    Benchmarks::report("an application lists its newest entries", c, 1, "sqlite3, same query");
    std::printf("list_benchmark %.2f\n", c.ratio());
}

}  // namespace

int main() {
    try {
        run();
    } catch (const std::exception& exception) {
        std::fprintf(stderr, "list_benchmark: %s\n", exception.what());
        return 1;
    }
    return 0;
}
