#include "Bridges/ApplicationsTest.h"

#include "Agent/RPC/AgentService.h"
#include "Foundation/Bus.h"

#include <poll.h>
#include <sqlite3.h>

#include <algorithm>
#include <csignal>
#include <filesystem>
#include <sstream>

using Foundation::Bus;
using Foundation::BusConnection;
using Foundation::BusMessage;
using Support::turnUntil;
namespace RPC = Orvane::RPC;

namespace {

/// False for a process that its parent has still to be told of.
bool isRunning(pid_t process) {
    std::ifstream file("/proc/" + std::to_string(process) + "/stat");
    std::string word;
    for (int i = 0; i < 3; ++i) {
        file >> word;
    }
    return file && word != "Z" && word != "X";
}

}  // namespace

// An application.

TestApplication::TestApplication(const std::string& identifier, const std::string& log, bool turns)
    : mLog(log),
      mProcess({"/bin/sh", "-c", "exec \"$0\" \"$@\" 2>> '" + log + "'", TEST_APPLICATION,
                identifier, turns ? "" : "unturned"}) {}

std::string TestApplication::ask(const std::string& command) {
    send(command);
    return answer();
}

void TestApplication::send(const std::string& command) {
    mProcess.writeLine(command);
}

std::string TestApplication::answer() {
    std::string text;
    while (readLine(text)) {
        if (!text.empty()) return text.substr(2);
    }
    return {};
}

bool TestApplication::readLine(std::string& answer) {
    answer = mProcess.readLine();
    if (answer.empty()) return false;
    if (!answer.starts_with("! ")) return true;
    mTold.push_back(answer.substr(2));
    answer.clear();
    return true;
}

bool TestApplication::hasLogged(const std::string& text) const {
    return turnUntil([&] {
        std::ifstream file(mLog);
        const std::string all(std::istreambuf_iterator<char>(file), {});
        return all.find(text) != std::string::npos;
    });
}

bool TestApplication::hears(const std::string& event) {
    std::string text;
    do {
        EXPECT_EQ(text, "") << "is an answer to nothing";
        const auto found = std::find(mTold.begin(), mTold.end(), event);
        if (found == mTold.end()) continue;
        mTold.erase(found);
        return true;
    } while (readLine(text));
    ADD_FAILURE() << "not told: " << event << ", but: " << testing::PrintToString(mTold);
    return false;
}

bool TestApplication::hearsOfAll(const std::vector<std::string>& beginnings,
                                 std::set<std::string> titles) {
    const auto take = [&](const std::string& event) {
        const auto begins = [&](const std::string& each) { return event.starts_with(each); };
        if (std::none_of(beginnings.begin(), beginnings.end(), begins)) return false;
        std::istringstream words(event);
        for (std::string word; words >> word;) {
            titles.erase(word);
        }
        return true;
    };
    std::string text;
    while (!titles.empty()) {
        EXPECT_EQ(text, "") << "is an answer to nothing";
        std::erase_if(mTold, take);
        if (!titles.empty() && !readLine(text)) break;
    }
    return titles.empty();
}

// What goes over the bus.

BusMonitor::BusMonitor(const Support::PrivateBus& bus) {
    std::string error;
    mConnection = BusConnection::open(bus.getAddress(), error);
    if (!mConnection) throw std::runtime_error(error);
    BusMessage call = mConnection->newCall({"org.freedesktop.DBus", "/org/freedesktop/DBus",
                                            "org.freedesktop.DBus.Monitoring", "BecomeMonitor"});
    call.open('a', "s").append("type='method_call',interface='com.tarnwick.orvane.ipc'").close();
    call.append(std::uint32_t{0});
    const BusMessage reply = mConnection->call(call, 60);
    if (!reply.isValid()) throw std::runtime_error(reply.getErrorText());
}

bool BusMonitor::seesCall(const std::string& method) {
    return turnUntil([&] {
        mConnection->pump(64, mMessages);
        for (; !mMessages.empty(); mMessages.pop_front()) {
            if (mMessages.front().getMember() == method) return true;
        }
        return false;
    });
}

// The surroundings.

ApplicationsTest::ApplicationsTest() {
    // An application that has ended is noticed by its answers.
    std::signal(SIGPIPE, SIG_IGN);
    std::filesystem::create_directories(home.path() / "data/dbus-1/services");
    home.writeFile("data/dbus-1/services/com.tarnwick.orvane.ipc.service",
                   "[D-BUS Service]\nName=com.tarnwick.orvane.ipc\nExec=/bin/sh -c \"exec '" +
                       std::string(ORVANE_AGENT) + "' 2>> '" + (home / "log") + "'\"\n");
    Bus::user().callMethod(
        {"org.freedesktop.DBus", "/org/freedesktop/DBus", "org.freedesktop.DBus", "ReloadConfig"});
    serve({"One", "Two"});
}

ApplicationsTest::~ApplicationsTest() noexcept {
    first = nullptr;
    second = nullptr;
    const pid_t running = agent();
    if (running > 0) kill(running, SIGKILL);
    if (HasFailure()) std::fputs(log().c_str(), stderr);
}

std::unique_ptr<TestApplication> ApplicationsTest::application(const std::string& name,
                                                               bool turns) const {
    auto made = launch(name, turns);
    EXPECT_EQ(made->answer(), "ready");
    return made;
}

std::unique_ptr<TestApplication> ApplicationsTest::launch(const std::string& name,
                                                          bool turns) const {
    return std::make_unique<TestApplication>("org.example." + name, home / ("log of " + name),
                                             turns);
}

std::unique_ptr<TestApplication> ApplicationsTest::subscriber(const std::string& name,
                                                              bool turns) const {
    auto made = application(name, turns);
    EXPECT_EQ(made->ask("add " + url()), "added");
    return made;
}

void ApplicationsTest::subscribeTwo() {
    first = subscriber("First");
    second = subscriber("Second");
    // From now on it is told of changes of the count.
    EXPECT_EQ(second->ask("count feed"), "0");
    EXPECT_EQ(first->ask("refresh feed"), "started");
    EXPECT_TRUE(brings(*first, {"One", "Two"}));
    EXPECT_TRUE(brings(*second, {"One", "Two"}));
    EXPECT_TRUE(second->hears("count feed 2"));
}

bool ApplicationsTest::brings(TestApplication& application, const std::set<std::string>& titles) {
    // Later entries of a document count as first seen a little earlier than it, which may be before
    // the client was made.
    return application.hearsOfAll({"added", "updated"}, titles);
}

void ApplicationsTest::serve(const std::vector<std::string>& titles) {
    std::string document = "<rss version='2.0'><channel><title>The feed</title>";
    for (const std::string& title : titles) {
        document += "<item><guid>" + title + "</guid><title>" + title +
                    "</title><description>It says " + title + "</description></item>";
    }
    server.answer("/feed", Support::ServerAnswer().body(document + "</channel></rss>"));
}

pid_t ApplicationsTest::agent() {
    return static_cast<pid_t>(Bus::user().getProcessID(RPC::kServiceName));
}

void ApplicationsTest::endAgent(int signal) {
    const pid_t running = agent();
    ASSERT_GT(running, 0);
    kill(running, signal);
    // Only then is its database closed.
    ASSERT_TRUE(turnUntil([&] { return agent() == 0 && !isRunning(running); }));
}

bool ApplicationsTest::hasSavedSubscriptions() const {
    const std::filesystem::path storage = home.path() / "data/Orvane";
    return turnUntil([&] {
        return contentOf(storage / "Clients.plist").find(url()) != std::string::npos &&
               !std::filesystem::exists(storage / ".clients-changed");
    });
}

void ApplicationsTest::breakDatabase() const {
    sqlite3* file = nullptr;
    ASSERT_EQ(sqlite3_open(database().c_str(), &file), SQLITE_OK);
    EXPECT_EQ(sqlite3_exec(file,
                           "pragma writable_schema=on;"
                           "update sqlite_master set rootpage=1000000 where name='Entries';"
                           "pragma schema_version=9999",
                           nullptr, nullptr, nullptr),
              SQLITE_OK);
    sqlite3_close(file);
}

void ApplicationsTest::overwriteDatabase() const {
    for (const char* suffix : {"-wal", "-shm"}) {
        std::filesystem::remove(database().string() + suffix);
    }
    std::ofstream(database()) << std::string(8192, 'x');
}
