#include "Benchmarks/BareEcho.h"

#include "Foundation/AutoreleasePool.h"
#include "Model/Schema.h"
#include "SQLite/Database.h"

#include <sqlite3.h>
#include <systemd/sd-bus.h>

#include <cstdio>
#include <filesystem>
#include <stdexcept>

namespace Benchmarks::BareEcho {

namespace {

constexpr const char* kName = "com.tarnwick.orvane.Bare";
constexpr const char* kPath = "/bare";

sqlite3* sDatabase = nullptr;
sqlite3_stmt* sUpdate = nullptr;
sqlite3_stmt* sCount = nullptr;

void check(bool holds, const char* what) {
    if (!holds) throw std::runtime_error(what);
}

void step(sqlite3_stmt* statement) {
    const int result = sqlite3_step(statement);
    check(result == SQLITE_DONE || result == SQLITE_ROW, sqlite3_errmsg(sDatabase));
    sqlite3_reset(statement);
}

void change(std::int64_t row, int value) {
    sqlite3_exec(sDatabase, "begin immediate", nullptr, nullptr, nullptr);
    sqlite3_bind_int(sUpdate, 1, value);
    sqlite3_bind_int64(sUpdate, 2, row);
    step(sUpdate);
    step(sCount);
    check(sqlite3_exec(sDatabase, "commit", nullptr, nullptr, nullptr) == SQLITE_OK, "commit");
}

int set(sd_bus_message* call, void*, sd_bus_error*) {
    std::int64_t row = 0;
    int value = 0;
    if (sd_bus_message_read(call, "xb", &row, &value) < 0) return -EINVAL;
    try {
        change(row, value);
    } catch (const std::exception& exception) {
        std::fprintf(stderr, "%s\n", exception.what());
        return -EIO;
    }
    return sd_bus_reply_method_return(call, "i", 0);
}

const sd_bus_vtable kTable[] = {
    SD_BUS_VTABLE_START(0),
    SD_BUS_METHOD("Set", "xb", "i", set, SD_BUS_VTABLE_UNPRIVILEGED),
    SD_BUS_VTABLE_END,
};

void open(const char* path) {
    check(sqlite3_open(path, &sDatabase) == SQLITE_OK, "open");
    sqlite3_exec(sDatabase, "pragma synchronous=full", nullptr, nullptr, nullptr);
    sqlite3_prepare_v2(sDatabase,
                       "update Entries set read=?, localDateFlagsUpdated=1 where rowID=?", -1,
                       &sUpdate, nullptr);
    sqlite3_prepare_v2(sDatabase,
                       "update Subscriptions set unreadCount=(select count(*) from Entries"
                       " where feed=1 and read=0) where rowID=2",
                       -1, &sCount, nullptr);
}

}  // namespace

void seed(const std::string& path, int entries) {
    const Foundation::AutoreleasePool pool;
    std::filesystem::create_directories(std::filesystem::path(path).parent_path());
    SQLite::Database::initialize();
    SQLite::Database& db = *SQLite::gDatabase;
    db.open(path.c_str(), true);
    Orvane::Schema::createDatabase();
    db.useWriteAheadLog();
    db.execute(
        "insert into Clients (rowID,signature,dateUsed) values (1,'org.example.Reader',1);"
        "insert into Feeds (rowID,url,identifier) values (1,'http://example.org/1','f1');"
        "insert into Subscriptions (rowID,client,feed,refreshInterval,expirationInterval,"
        "  refreshesInBackground) values (1,1,0,-1,-1,1),(2,1,1,-1,-1,1);"
        "with recursive n(i) as (select 1 union all select i+1 from n where i<%d)"
        " insert into Entries (rowID,identifier,feed,current,read,flagged,localDateCreated)"
        " select i,'e'||i,1,1,0,0,1000 from n",
        entries);
    db.close(true);
}

void serve(const char* path) {
    open(path);
    sd_bus* bus = nullptr;
    check(sd_bus_open_user(&bus) >= 0, "bus");
    check(sd_bus_add_object_vtable(bus, nullptr, kPath, kName, kTable, nullptr) >= 0, "object");
    check(sd_bus_request_name(bus, kName, 0) >= 0, "name");
    std::printf("ready\n");
    std::fflush(stdout);
    for (;;) {
        const int result = sd_bus_process(bus, nullptr);
        if (result < 0) return;
        if (result == 0) sd_bus_wait(bus, UINT64_MAX);
    }
}

Caller::Caller() {
    check(sd_bus_open_user(&mBus) >= 0, "bus");
}

Caller::~Caller() {
    sd_bus_flush_close_unref(mBus);
}

void Caller::call(std::int64_t row, bool value) const {
    sd_bus_message* reply = nullptr;
    const int result = sd_bus_call_method(mBus, kName, kPath, kName, "Set", nullptr, &reply, "xb",
                                          row, int{value});
    sd_bus_message_unref(reply);
    check(result >= 0, "the bare side failed");
}

}  // namespace Benchmarks::BareEcho
