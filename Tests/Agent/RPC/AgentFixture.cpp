#include "Agent/RPC/AgentFixture.h"

#include "Foundation/Bus.h"
#include "Foundation/URL.h"
#include "Model/ClientCore.h"
#include "Model/Schema.h"
#include "SQLite/Cursor.h"
#include "Utilities/FileSystem.h"

#include <unistd.h>

#include <chrono>
#include <csignal>
#include <filesystem>
#include <stdexcept>

using namespace Foundation;
using namespace Orvane;

AgentFixture::AgentFixture() {
    SQLite::Database::initialize();
    const Ref<URL> url = URL::urlWithFileSystemPath(base.path().c_str(), true);
    Compatibility::FileSystem::setStorageBaseURL(url);
    setProgram(ORVANE_AGENT);
    seed();
    log.clear();
}

AgentFixture::~AgentFixture() noexcept {
    SQLite::gDatabase->close(false);
    const pid_t running = agent();
    if (running > 0 && running != getpid()) kill(running, SIGKILL);
    RPC::AgentService::instance()._forget();
    AgentLink::setMaker(nullptr);
    Compatibility::FileSystem::setStorageBaseURL(nullptr);
}

void AgentFixture::setProgram(const std::string& command) const {
    std::filesystem::create_directories(base.path() / "dbus-1/services");
    base.writeFile("dbus-1/services/com.tarnwick.orvane.ipc.service",
                   "[D-BUS Service]\nName=com.tarnwick.orvane.ipc\nExec=" + command + "\n");
    Bus::user().callMethod(
        {"org.freedesktop.DBus", "/org/freedesktop/DBus", "org.freedesktop.DBus", "ReloadConfig"});
}

void AgentFixture::seed() const {
    std::filesystem::create_directories(std::filesystem::path(path).parent_path());
    SQLite::Database& db = *SQLite::gDatabase;
    db.open(path.c_str(), true);
    Schema::createDatabase();
    db.execute(
        "insert into Clients (rowID,signature,dateUsed) values (1,'org.example.Reader',1);"
        "insert into Feeds (rowID,url,identifier) values (1,'http://example.org/1','f1'),"
        " (2,'file:///nowhere/2','f2');"
        "insert into Subscriptions (rowID,client,feed,refreshInterval,expirationInterval,"
        "  refreshesInBackground) values (1,1,0,-1,-1,1),(2,1,1,0,0,1),(3,1,2,0,0,1);"
        "with recursive n(i) as (select 1 union all select i+1 from n where i<20)"
        " insert into Entries (rowID,identifier,feed,current,read,flagged,localDateCreated)"
        " select i,'e'||i,1,1,0,0,1000 from n;"
        "insert into Authors (rowID,name) values (1,'Ann');"
        "insert into Enclosures (rowID,entry,url) values (1,1,'http://example.org/a.mp3')");
    db.close(true);
}

void AgentFixture::openSession() {
    IPCClient::connect();
    ClientCore::openClientSession();
}

std::uint32_t AgentFixture::port() {
    client().lookupServerPort();
    return client().getServerPort();
}

pid_t AgentFixture::agent() {
    return static_cast<pid_t>(Bus::user().getProcessID(RPC::kServiceName));
}

void AgentFixture::killAgent() {
    ASSERT_GT(agent(), 0);
    kill(agent(), SIGKILL);
    awaitNoAgent();
}

void AgentFixture::awaitNoAgent() {
    await([] { return Bus::user().getNameOwner(RPC::kServiceName).empty(); });
}

void AgentFixture::await(const std::function<bool()>& condition) {
    using std::chrono::steady_clock;
    const auto end = steady_clock::now() + std::chrono::seconds(60);
    while (!condition()) {
        if (steady_clock::now() > end) throw std::runtime_error("this never comes");
    }
}

NetError AgentFixture::errorOf(const std::function<void()>& call) {
    try {
        call();
    } catch (const NetException& exception) {
        return exception.getError();
    }
    return NetError::None;
}

std::string AgentFixture::textInFile(const std::string& query) const {
    SQLite::Database reader;
    reader.open(path.c_str(), false);
    const SQLite::Cursor cursor(&reader, "%s", query.c_str());
    const char* text = cursor.hasRow() ? cursor.cStringColumn(0) : nullptr;
    return text ? text : "none";
}

int AgentFixture::inFile(const std::string& query) const {
    SQLite::Database reader;
    reader.open(path.c_str(), false);
    return reader.execScalar("%s", query.c_str());
}
