// The agent's end, as other programs on the bus see it.

#include "Agent/RPC/AgentFixture.h"
#include "Agent/RPC/InterfaceXML.h"
#include "Foundation/Bus.h"
#include "Foundation/BusPeer.h"
#include "Support/BackgroundProcess.h"
#include "Support/EnterNamespace.h"
#include "Support/TurnUntil.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sched.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <fstream>

using namespace Foundation;
using namespace Orvane;

namespace {

class IPCServerTest : public AgentFixture {
 protected:
    static BusMessage newCall(const char* member, const char* interface = RPC::kInterface,
                              const char* object = RPC::kObjectPath) {
        return Bus::user().newCall({RPC::kServiceName, object, interface, member});
    }
    static bool hasEnded(pid_t process) {
        std::ifstream status("/proc/" + std::to_string(process) + "/stat");
        std::string number, name, state;
        return !(status >> number >> name >> state) || state == "Z";
    }
    static std::string errorOf(BusMessage message) {
        return Bus::user().call(message, 30).getErrorName();
    }
};

constexpr const char* kInvalid = "org.freedesktop.DBus.Error.InvalidArgs";
constexpr const char* kUnknownMethod = "org.freedesktop.DBus.Error.UnknownMethod";

}  // namespace

TEST_F(IPCServerTest, DescribesItsInterface) {
    BusMessage call = newCall("Introspect", "org.freedesktop.DBus.Introspectable");
    BusMessage reply = Bus::user().call(call, 30);
    std::string text;
    EXPECT_TRUE(reply.read(text));
    EXPECT_EQ(text, RPC::describeObject());
}

TEST_F(IPCServerTest, RefusesWhatIsNoRoutine) {
    EXPECT_EQ(errorOf(newCall("no_such")), kUnknownMethod);
    EXPECT_EQ(errorOf(newCall("entry_setRead", "org.example.Other")),
              "org.freedesktop.DBus.Error.UnknownInterface");
    EXPECT_EQ(errorOf(newCall("entry_setRead", RPC::kInterface, "/elsewhere")),
              "org.freedesktop.DBus.Error.UnknownObject");
}

TEST_F(IPCServerTest, RefusesArgumentsOfOtherTypes) {
    EXPECT_EQ(errorOf(newCall("entry_setRead")), kInvalid);
    EXPECT_EQ(errorOf(newCall("entry_setRead").append(std::int64_t{1})), kInvalid);
    EXPECT_EQ(errorOf(newCall("entry_setRead").append(std::int64_t{1}).append(std::int32_t{1})),
              kInvalid);
    EXPECT_EQ(errorOf(newCall("entry_setRead").append(std::int64_t{1}).append(true).append(true)),
              kInvalid);
    EXPECT_EQ(errorOf(newCall("get_socket_path").append(std::string(20, 'x'))), kInvalid);
    EXPECT_EQ(inFile("select count(*) from Entries where read=1"), 0);
}

TEST_F(IPCServerTest, SendsResultsBehindAnyStatus) {
    BusMessage call = newCall("feed_refresh");
    call.append(std::int64_t{99}).append(true);
    BusMessage reply = Bus::user().call(call, 30);
    EXPECT_EQ(reply.getSignature(), "ix");
    std::int32_t status = 0;
    EXPECT_TRUE(reply.read(status));
    EXPECT_EQ(status, kBadRow);
}

TEST_F(IPCServerTest, ServesCallsThatWantNoAnswer) {
    client().startSkerrySync();
    BusPeer peer(bus);
    for (int i = 1; i <= 20; ++i) {
        BusMessage call = newCall("entry_setRead");
        EXPECT_TRUE(Bus::user().send(call.append(std::int64_t{i}).append(true)));
    }
    // Behind them.
    client().startSkerrySync();
    EXPECT_EQ(inFile("select count(*) from Entries where read=1"), 20);
}

TEST_F(IPCServerTest, AnswersWhatHasReachedItBeforeItQuits) {
    client().startSkerrySync();
    const pid_t running = agent();
    kill(running, SIGSTOP);
    for (int i = 1; i <= 20; ++i) {
        BusMessage call = newCall("entry_setRead");
        EXPECT_TRUE(Bus::user().send(call.append(std::int64_t{i}).append(true)));
    }
    EXPECT_TRUE(Bus::user().flush(30));
    EXPECT_EQ(agent(), running) << "asked behind the calls";
    kill(running, SIGTERM);
    kill(running, SIGCONT);
    awaitNoAgent();
    // A call of now starts another one, which waits for the first to have closed the database.
    client().startSkerrySync();
    EXPECT_EQ(inFile("select count(*) from Entries where read=1"), 20);
}

TEST_F(IPCServerTest, LeavesTheWorkToWhoTakesItsName) {
    // By hand, for an address that a bus gives has its identity, which the next one has not got.
    const Support::BackgroundProcess first({ORVANE_AGENT});
    ASSERT_TRUE(Support::turnUntil([&] { return agent() == first.getPID(); }));
    bus.die();
    bus.start();
    BusPeer other(bus);
    other.own(RPC::kServiceName);
    EXPECT_TRUE(Support::turnUntil([&] { return hasEnded(first.getPID()); }));
}

TEST_F(IPCServerTest, RefusesFilesOfACallerThatSeesOthers) {
    client().startSkerrySync();
    int results[2];
    ASSERT_EQ(pipe2(results, O_CLOEXEC), 0);
    const pid_t child = fork();
    if (child == 0) {
        alarm(120);
        std::int32_t statuses[2] = {0, 0};
        if (Support::enterNamespace(CLONE_NEWNS) != Support::EnteredNamespace::kNot) {
            std::string error;
            const auto connection = BusConnection::open(bus.getAddress(), error);
            int i = 0;
            for (const char* address : {"file:///nowhere/2", "feed:FILE:///nowhere/2"}) {
                BusMessage call = connection->newCall(
                    {RPC::kServiceName, RPC::kObjectPath, RPC::kInterface, "subscription_create"});
                const std::span<const std::uint8_t> none;
                call.append(std::int64_t{1}).append(std::uint8_t{0}).append(bytes(address));
                call.append(none).append(none).append(none);
                BusMessage reply = connection->call(call, 30);
                reply.read(statuses[i++]);
            }
        } else {
            statuses[0] = statuses[1] = -1;
        }
        const bool isWritten = write(results[1], statuses, sizeof(statuses)) == sizeof(statuses);
        _exit(isWritten ? 0 : 1);
    }
    // So that the end of the child is the end of what there is to read.
    close(results[1]);
    std::int32_t statuses[2] = {0, 0};
    EXPECT_EQ(read(results[0], statuses, sizeof(statuses)), ssize_t{sizeof(statuses)});
    waitpid(child, nullptr, 0);
    close(results[0]);
    if (statuses[0] == -1) GTEST_SKIP() << "no mount namespace";
    EXPECT_EQ(statuses[0], kFailed);
    EXPECT_EQ(statuses[1], kFailed);
}
