// The agent as a process: how it is started, and how it ends.

#include "Agent/AgentProcess.h"
#include "Agent/RPC/AgentService.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Bus.h"
#include "Foundation/BusCenter.h"
#include "Foundation/BusConnection.h"
#include "Foundation/UniqueFD.h"
#include "SQLite/Database.h"
#include "Support/ChildProcess.h"
#include "Support/FileAccess.h"
#include "Support/PrivateBus.h"

#include <fcntl.h>
#include <gmock/gmock.h>
#include <sys/file.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <cstring>
#include <optional>
#include <vector>

using namespace Foundation;
namespace RPC = Orvane::RPC;
using Support::BackgroundProcess;
using Support::ChildResult;
using Support::EnvVar;
using Support::runChild;
using Support::turnUntil;
using testing::HasSubstr;
using testing::Not;
namespace fs = std::filesystem;

namespace {

constexpr const char* kRunning = "Orvane Agent finished setup; starting runloop";

class AgentProcess : public AgentProcessTest {
 protected:
    /// Starts it, with its log in a file.
    void start() {
        const std::string command = "exec " ORVANE_AGENT " 2> '" + (home / "log") + "'";
        agent.emplace(std::vector<std::string>{"sh", "-c", command});
        ASSERT_TRUE(hasLogged(kRunning)) << log();
    }
    /// Sends the signal, and gives the exit status.
    int end(int signal) {
        kill(agent->getPID(), signal);
        int status = -1;
        const auto hasEnded = [&] {
            return waitpid(agent->getPID(), &status, WNOHANG) == agent->getPID();
        };
        EXPECT_TRUE(turnUntil(hasEnded)) << log();
        return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    }
    /// Runs it to its end.
    static ChildResult run() { return runChild({ORVANE_AGENT}); }

    std::optional<BackgroundProcess> agent;
};

class AgentOnBus : public AgentProcess {
 protected:
    Support::PrivateBus bus;
};

TEST_F(AgentOnBus, StartsByHandAndEndsInOrderAtSIGTERM) {
    start();
    EXPECT_TRUE(fs::exists(database()));
    EXPECT_FALSE(Bus::user().getNameOwner(BusCenter::kAgentName).empty());
    EXPECT_EQ(end(SIGTERM), 0);
    const std::string said = log();
    std::size_t last = 0;
    for (const char* line :
         {"----- Orvane Agent STARTING -----", "LaunchListener: Checking in with svcd",
          "    ... not launched by svcd (SVC_KEY_IS_MANAGED == 0)", "Starting AgentTask",
          "Orvane Agent starting API MIG server", kRunning,
          "***** LaunchListener got signal: 15 (Terminated) x1", "Orvane Agent exited runloop",
          "===== Closing database =====", "----- Orvane Agent EXITING with status 0 -----\n\n"}) {
        const std::size_t place = said.find(line, last);
        ASSERT_NE(place, std::string::npos) << line << "\nis missing or out of order in\n" << said;
        last = place;
    }
    // The last connection has put the log of changes back into the file.
    EXPECT_FALSE(fs::exists(database().string() + "-wal"));
    EXPECT_TRUE(Bus::user().getNameOwner(BusCenter::kAgentName).empty());
}

TEST_F(AgentOnBus, SetsNoStartIntervalAtSIGTERM) {
    start();
    EXPECT_EQ(end(SIGTERM), 0);
    EXPECT_THAT(log(), Not(HasSubstr("Scheduling restart")));
}

TEST_F(AgentOnBus, IgnoresBrokenPipes) {
    start();
    kill(agent->getPID(), SIGPIPE);
    EXPECT_EQ(end(SIGTERM), 0);
    EXPECT_THAT(log(), HasSubstr("EXITING with status 0"));
}

TEST_F(AgentOnBus, LeavesTheWorkToWhoeverIsTheAgent) {
    ASSERT_TRUE(Bus::user().requestName(BusCenter::kAgentName));
    const ChildResult result = run();
    EXPECT_EQ(result.status, 0);
    EXPECT_THAT(result.err, HasSubstr("Another process owns com.tarnwick.orvane.ipc"));
    EXPECT_THAT(result.err, Not(HasSubstr("Starting AgentTask")));
    EXPECT_FALSE(fs::exists(database()));
    Bus::user().releaseName(BusCenter::kAgentName);
}

TEST_F(AgentOnBus, TwoAtOnceAreOneAgent) {
    start();
    const ChildResult second = run();
    EXPECT_EQ(second.status, 0);
    EXPECT_THAT(second.err, HasSubstr("Another process owns com.tarnwick.orvane.ipc"));
    EXPECT_EQ(end(SIGTERM), 0);
}

TEST_F(AgentOnBus, FailsIfTheDatabaseCannotBeOpened) {
    fs::create_directories(home.path() / "data/Orvane");
    home.writeFile("data/Orvane/Database", "in the way");
    const ChildResult result = run();
    EXPECT_EQ(result.status, 1);
    EXPECT_THAT(result.err, HasSubstr("int OVAgentFrameworkMain()"));
    EXPECT_THAT(result.err, HasSubstr("----- Orvane Agent EXITING with status 1 -----"));
    EXPECT_THAT(result.err, Not(HasSubstr(kRunning)));
    EXPECT_TRUE(Bus::user().getNameOwner(BusCenter::kAgentName).empty());
}

TEST_F(AgentOnBus, FailsIfTheDiskIsFull) {
    ChildResult result;
    {
        const Support::FileSizeLimit limit(4096);
        result = run();
    }
    EXPECT_EQ(result.status, 1);
    // Reported when all that was built has gone.
    EXPECT_LT(result.err.find("Closing database"), result.err.find("int OVAgentFrameworkMain()"));
    EXPECT_THAT(result.err, HasSubstr("int OVAgentFrameworkMain()"));
    // With room, the next start is a start like any other.
    start();
    EXPECT_EQ(end(SIGTERM), 0);
}

TEST_F(AgentOnBus, StartsAgainAfterACrash) {
    start();
    EXPECT_EQ(end(SIGKILL), -1);
    agent.reset();
    fs::remove(home / "log");
    start();
    EXPECT_EQ(end(SIGTERM), 0);
}

TEST_F(AgentProcess, GoesOnWithoutABus) {
    // Nor can one be started.
    const EnvVar noBus("DBUS_SESSION_BUS_ADDRESS", "unix:path=/nonexistent/bus");
    const EnvVar noPrograms("PATH", home.makeDirectory("empty").c_str());
    const std::string command = "exec " ORVANE_AGENT " 2> '" + (home / "log") + "'";
    agent.emplace(std::vector<std::string>{"/bin/sh", "-c", command});
    ASSERT_TRUE(hasLogged(kRunning)) << log();
    EXPECT_THAT(log(), HasSubstr("No message bus: the agent goes on, but nobody can call it"));
    EXPECT_EQ(end(SIGTERM), 0);
}

TEST_F(AgentOnBus, ServesWhatCameBeforeItEnds) {
    start();
    std::string error;
    const auto peer = BusConnection::open(bus.getAddress(), error);
    ASSERT_TRUE(peer) << error;
    // While it stands still, a call reaches it, and behind that the word to end.
    kill(agent->getPID(), SIGSTOP);
    BusConnection::Messages came;
    BusMessage call = peer->newCall({.destination = RPC::kServiceName,
                                     .path = RPC::kObjectPath,
                                     .interface = RPC::kInterface,
                                     .member = "client_create"});
    call.append("org.example.Reader");
    ASSERT_TRUE(peer->send(call, came));
    BusMessage question = peer->newCall({.destination = "org.freedesktop.DBus",
                                         .path = "/org/freedesktop/DBus",
                                         .interface = "org.freedesktop.DBus",
                                         .member = "GetId"});
    ASSERT_TRUE(peer->call(question, 60).isValid());
    kill(agent->getPID(), SIGTERM);
    EXPECT_EQ(end(SIGCONT), 0);

    // What the call did has been saved.
    const AutoreleasePool pool;
    SQLite::Database file;
    file.open(database().c_str(), false);
    EXPECT_EQ(file.execScalar("select count(*) from Clients"), 1) << log();
}

TEST_F(AgentOnBus, WaitsForTheAgentBeforeItToClose) {
    fs::create_directories(home.path() / "data/Orvane");
    const UniqueFD before(open((home / "data/Orvane/.agent").c_str(), O_RDWR | O_CREAT, 0600));
    ASSERT_EQ(flock(before.get(), LOCK_EX), 0);
    const std::string command = "exec " ORVANE_AGENT " 2> '" + (home / "log") + "'";
    agent.emplace(std::vector<std::string>{"sh", "-c", command});
    ASSERT_TRUE(turnUntil([] { return !Bus::user().getNameOwner(BusCenter::kAgentName).empty(); }));
    EXPECT_FALSE(fs::exists(database()));
    ASSERT_EQ(flock(before.get(), LOCK_UN), 0);
    ASSERT_TRUE(hasLogged(kRunning)) << log();
    EXPECT_EQ(end(SIGTERM), 0);
}

TEST_F(AgentProcess, LeavesTheWorkToAnAgentThatNoBusKnows) {
    const EnvVar noBus("DBUS_SESSION_BUS_ADDRESS", "unix:path=/nonexistent/bus");
    const EnvVar noPrograms("PATH", home.makeDirectory("empty").c_str());
    const std::string command = "exec " ORVANE_AGENT " 2> '" + (home / "log") + "'";
    agent.emplace(std::vector<std::string>{"/bin/sh", "-c", command});
    ASSERT_TRUE(hasLogged(kRunning)) << log();
    const ChildResult second = run();
    EXPECT_EQ(second.status, 0);
    EXPECT_THAT(second.err, HasSubstr("Another process works on the storage"));
    EXPECT_THAT(second.err, Not(HasSubstr("Starting AgentTask")));
    EXPECT_EQ(end(SIGTERM), 0);
}

/// A bus that can start the agent.
class AgentActivation : public AgentProcessTest {
 protected:
    AgentActivation() {
        const std::string services = home / "data/dbus-1/services";
        fs::create_directories(services);
        fs::copy(ORVANE_DBUS_SERVICE, services + "/com.tarnwick.orvane.ipc.service");
        bus.emplace();
    }
    ~AgentActivation() override {
        const pid_t pid = agentPID();
        if (pid != 0 && pid != getpid()) kill(pid, SIGKILL);
    }

    /// The process that owns the name; 0 if none does.
    static pid_t agentPID() {
        BusMessage reply = Bus::user().callMethod({.destination = "org.freedesktop.DBus",
                                                   .path = "/org/freedesktop/DBus",
                                                   .interface = "org.freedesktop.DBus",
                                                   .member = "GetConnectionUnixProcessID"},
                                                  BusCenter::kAgentName);
        std::uint32_t pid = 0;
        return reply.isValid() && reply.read(pid) ? static_cast<pid_t>(pid) : 0;
    }
    /// Any call will do: libraries answer this one.
    static BusMessage ping() {
        return Bus::user().callMethod({.destination = BusCenter::kAgentName,
                                       .path = "/",
                                       .interface = "org.freedesktop.DBus.Peer",
                                       .member = "Ping"});
    }

    std::optional<Support::PrivateBus> bus;
};

TEST_F(AgentActivation, StartsForACall) {
    EXPECT_EQ(agentPID(), 0);
    ping();
    const pid_t first = agentPID();
    ASSERT_NE(first, 0);
    EXPECT_TRUE(turnUntil([&] { return fs::exists(database()); }));

    kill(first, SIGTERM);
    ASSERT_TRUE(turnUntil([&] { return agentPID() == 0; }));
    ping();
    const pid_t second = agentPID();
    EXPECT_NE(second, 0);
    EXPECT_NE(second, first);
}

TEST_F(AgentActivation, StartsForALookUp) {
    Bus::user().callMethod({.destination = "org.freedesktop.DBus",
                            .path = "/org/freedesktop/DBus",
                            .interface = "org.freedesktop.DBus",
                            .member = "StartServiceByName"},
                           BusCenter::kAgentName, std::uint32_t{0});
    EXPECT_NE(agentPID(), 0);
}

/// A listening socket of systemd's that starts the agent at the first connection.
class AgentSocket : public AgentProcess {
 protected:
    std::string path() const { return home / "Render.socket"; }
    /// Lets systemd listen.
    void startSocket() {
        std::string variables;
        for (const char* name : {"HOME", "XDG_DATA_HOME", "XDG_CONFIG_HOME", "XDG_RUNTIME_DIR",
                                 "DBUS_SESSION_BUS_ADDRESS", "DBUS_SYSTEM_BUS_ADDRESS", "OVLog",
                                 "OVLogIPC", "OVUseSystemLog"}) {
            variables += std::string(" -E ") + name;
        }
        const std::string command = "exec systemd-socket-activate --listen='" + path() +
                                    "' --fdname=Render" + variables + " " ORVANE_AGENT " 2> '" +
                                    (home / "log") + "'";
        agent.emplace(std::vector<std::string>{"sh", "-c", command});
    }
    UniqueFD connectWhenItListens() const {
        UniqueFD connection;
        EXPECT_TRUE(turnUntil([&] {
            connection = connectToIt();
            return static_cast<bool>(connection);
        }));
        return connection;
    }
    /// Waits for the other end to be closed.
    static bool isEnded(const UniqueFD& connection) {
        char byte = 0;
        return turnUntil([&] { return recv(connection.get(), &byte, 1, MSG_DONTWAIT) == 0; });
    }
    UniqueFD connectToIt() const {
        sockaddr_un address = {};
        address.sun_family = AF_UNIX;
        std::strncpy(address.sun_path, path().c_str(), sizeof address.sun_path - 1);
        UniqueFD made(socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0));
        if (connect(made.get(), reinterpret_cast<const sockaddr*>(&address), sizeof address) != 0) {
            made.close();
        }
        return made;
    }

    Support::PrivateBus bus;
};

TEST_F(AgentSocket, StartsForAConnection) {
    startSocket();
    const UniqueFD connection = connectWhenItListens();
    ASSERT_TRUE(hasLogged(kRunning)) << log();
    EXPECT_THAT(log(), HasSubstr("    ... checked in with svcd!"));
    // It is told that there are no pages, and does not wait to start the next agent too.
    EXPECT_TRUE(isEnded(connection));
    EXPECT_EQ(end(SIGTERM), 0);
}

TEST_F(AgentSocket, LeavesNoConnectionWaitingWhereAnotherIsTheAgent) {
    ASSERT_TRUE(Bus::user().requestName(BusCenter::kAgentName));
    startSocket();
    const UniqueFD connection = connectWhenItListens();
    EXPECT_TRUE(isEnded(connection)) << log();
    EXPECT_THAT(log(), HasSubstr("Another process owns com.tarnwick.orvane.ipc"));
    Bus::user().releaseName(BusCenter::kAgentName);
}

}  // namespace
