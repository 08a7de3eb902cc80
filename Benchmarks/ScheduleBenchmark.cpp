#include "Agent/AgentTask.h"
#include "Benchmarks/Measure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/URL.h"
#include "Model/ClientCore.h"
#include "Model/FeedCore.h"
#include "Model/Schema.h"
#include "Model/SubscriptionCore.h"
#include "SQLite/CursorOf.h"
#include "SQLite/Database.h"
#include "SQLite/FakeCenter.h"
#include "SQLite/TableOf.h"
#include "Support/ManualClock.h"
#include "Support/TempDir.h"
#include "Utilities/FileSystem.h"

#include <fmt/format.h>
#include <sqlite3.h>

#include <cstdio>
#include <exception>
#include <stdexcept>
#include <string>

/// What does it cost to look over 10,000 feeds for those that are due, of which two clients have
/// one half each and share a tenth? None is: what starting one costs is another question. All rows
/// that a started agent has in memory are in memory.
///
/// It is set beside sqlite3 asking the same of the file with statements that are compiled once: the
/// feeds that are subscribed to, for each of them its subscriptions, and the feed's last date.

using namespace Benchmarks;
using namespace Foundation;
using namespace Orvane;
using SQLite::gDatabase;

namespace {

constexpr int kFeeds = 10'000;
constexpr int kRounds = 9;

void require(bool condition, const char* what) {
    if (!condition) throw std::runtime_error(what);
}

void makeFile(const std::string& path, double now) {
    SQLite::Database::initialize();
    gDatabase->open(path.c_str(), true);
    Schema::createDatabase();
    gDatabase->executeText(SQLite::SQLText(fmt::format(
        "begin;"
        "insert into Clients (rowID, signature, dateUsed) values (1, 'a', {0}), (2, 'b', {0});"
        "insert into Subscriptions (client, feed, refreshInterval) values (1, 0, 1800), (2, 0, 0);"
        "with n(i) as (select 1 union all select i+1 from n where i<{1}) insert into Feeds "
        "(identifier, url, refreshLocalDate) select 'feed'||i, 'http://e.org/'||i, {0}-i%1000 from "
        "n;"
        "insert into Subscriptions (client, feed, refreshInterval, refreshesInBackground) select "
        "1+rowID%2, rowID, 3600*(rowID%3), 1 from Feeds;"
        "insert into Subscriptions (client, feed, refreshInterval, refreshesInBackground) select "
        "2-rowID%2, rowID, 3600, 1 from Feeds where rowID%10=0;"
        "commit",
        now, kFeeds)));
}

template <class T>
void preload() {
    const auto query = SQLite::TableOf<T>::instance()->allRows();
    for (SQLite::CursorOf<T> cursor(*query); cursor.hasRow(); cursor.nextRow()) {
        const AutoreleasePool pool;
        const Ref<T> row = cursor.row();
    }
}

/// The same questions, asked of sqlite3.
class Plain {
 public:
    explicit Plain(const std::string& path) {
        check(sqlite3_open_v2(path.c_str(), &mDB, SQLITE_OPEN_READWRITE | SQLITE_OPEN_NOMUTEX,
                              nullptr));
        mFeeds = prepare(
            "select feed from Subscriptions where refreshInterval>=0 and feed>0 group by feed");
        mSubscriptions = prepare("select * from Subscriptions where feed=?");
        mDate = prepare("select refreshLocalDate from Feeds where rowID=?");
    }
    ~Plain() {
        for (sqlite3_stmt* statement : {mFeeds, mSubscriptions, mDate})
            sqlite3_finalize(statement);
        sqlite3_close(mDB);
    }
    Plain(const Plain&) = delete;
    Plain& operator=(const Plain&) = delete;

    void run() {
        int feeds = 0;
        while (sqlite3_step(mFeeds) == SQLITE_ROW) {
            const sqlite3_int64 feed = sqlite3_column_int64(mFeeds, 0);
            require(readAll(mSubscriptions, feed, 3) > 0, "a feed has no subscription");
            require(readAll(mDate, feed, 0) == 1, "a feed is missing");
            ++feeds;
        }
        check(sqlite3_reset(mFeeds));
        require(feeds == kFeeds, "feeds are missing");
    }

 private:
    sqlite3_stmt* prepare(const char* sql) const {
        sqlite3_stmt* statement = nullptr;
        check(sqlite3_prepare_v2(mDB, sql, -1, &statement, nullptr));
        return statement;
    }
    int readAll(sqlite3_stmt* statement, sqlite3_int64 feed, int column) const {
        check(sqlite3_bind_int64(statement, 1, feed));
        int rows = 0;
        for (; sqlite3_step(statement) == SQLITE_ROW; ++rows)
            keep(sqlite3_column_double(statement, column));
        check(sqlite3_reset(statement));
        return rows;
    }
    void check(int result) const { require(result == SQLITE_OK, sqlite3_errmsg(mDB)); }

    sqlite3* mDB = nullptr;
    sqlite3_stmt* mFeeds = nullptr;
    sqlite3_stmt* mSubscriptions = nullptr;
    sqlite3_stmt* mDate = nullptr;
};

}  // namespace

int main() try {
    const AutoreleasePool pool;
    const Support::TempDir directory;
    const Support::ManualClock clock;
    FakeCenter noBus;
    const std::string path = directory / "Database.sqlite3";
    makeFile(path, clock.now());
    preload<ClientCore>();
    preload<FeedCore>();
    preload<SubscriptionCore>();
    double next = 0;
    Comparison pass{0, 0};
    {
        AgentTask task;
        Plain plain(path);
        pass = compare(
            [&] {
                const AutoreleasePool inner;
                task.scheduleNextRefresh();
            },
            [&] { plain.run(); }, kRounds);
        next = task.getRefreshTimer().getTimeRemaining();
    }
    // The feed that was refreshed longest ago, with the shortest interval.
    require(next > 800 && next < 810, "the next date is wrong");
    report("look at a feed", pass, kFeeds, "sqlite3");
    std::printf("a pass over %d feeds takes %.0f ms\n", kFeeds, pass.measured * 1e3);
    std::printf("schedule_pass %.2f\n", pass.ratio());
    return 0;
} catch (const std::exception& exception) {
    std::fprintf(stderr, "schedule_benchmark: %s\n", exception.what());
    return 1;
}
