#include "Agent/LaunchListener.h"

#include "Agent/LaunchListenerTest.h"
#include "Agent/ServerSocket.h"
#include "Foundation/ArrayOf.h"
#include "Foundation/Number.h"
#include "Foundation/RunLoop.h"
#include "Foundation/UniqueFD.h"

#include <fcntl.h>
#include <gmock/gmock.h>
#include <sys/resource.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <cstring>
#include <initializer_list>
#include <stdexcept>

using namespace Foundation;
using namespace Orvane;
using testing::ElementsAre;
using testing::IsEmpty;
using Reply = ServiceManager::Reply;
using Strings = std::vector<std::string>;

namespace {

/// Keeps the connections that it is given.
class FakeServer : public ServerSocket {
 public:
    void accept(int connection) override {
        connections.emplace_back(connection);
        if (throws) throw std::runtime_error("full");
    }
    std::vector<UniqueFD> connections;
    bool throws = false;
};

#ifndef __SANITIZE_ADDRESS__
/// The process can open nothing more while this lives.
class NoMoreDescriptors {
 public:
    NoMoreDescriptors() {
        getrlimit(RLIMIT_NOFILE, &mLimit);
        const UniqueFD next(fcntl(0, F_DUPFD_CLOEXEC, 0));
        const rlimit full{static_cast<rlim_t>(next.get()), mLimit.rlim_max};
        setrlimit(RLIMIT_NOFILE, &full);
    }
    ~NoMoreDescriptors() { setrlimit(RLIMIT_NOFILE, &mLimit); }
    NoMoreDescriptors(const NoMoreDescriptors&) = delete;
    NoMoreDescriptors& operator=(const NoMoreDescriptors&) = delete;

 private:
    rlimit mLimit = {};
};
#endif

TEST_F(LaunchListenerTest, IsContentWithoutAManager) {
    services.managed = false;
    EXPECT_THAT(sayings(),
                ElementsAre("[IPC] LaunchListener: initializing",
                            "[IPC] LaunchListener: Checking in with svcd",
                            "[IPC]     ... not launched by svcd (SVC_KEY_IS_MANAGED == 0)"));
    EXPECT_EQ(services.checkIns, 0);
    EXPECT_FALSE(listener->isManaged());
    log.clear();
    EXPECT_EQ(listener->getMachServerPort("com.tarnwick.orvane.ipc"), 0);
    EXPECT_THAT(log.lines(), IsEmpty());
}

TEST_F(LaunchListenerTest, ChecksInOnce) {
    give("Render", {listen("a")});
    EXPECT_EQ(sayings().back(), "[IPC]     ... checked in with svcd!");
    EXPECT_EQ(services.checkIns, 1);
    EXPECT_TRUE(listener->isManaged());
}

struct BadReply {
    const char* name;
    Reply::Type type;
    int error;
    const char* saying;
};

class LaunchListenerReply : public LaunchListenerTest,
                            public testing::WithParamInterface<BadReply> {};

TEST_P(LaunchListenerReply, IsDropped) {
    services.reply.type = GetParam().type;
    services.reply.error = GetParam().error;
    if (GetParam().type == Reply::kDictionary) reply(nullptr, nullptr);
    const Strings said = sayings();
    EXPECT_EQ(said.size(), 3u);
    EXPECT_EQ(said.back(), GetParam().saying);
    EXPECT_FALSE(listener->isManaged());
}

INSTANTIATE_TEST_SUITE_P(
    Replies, LaunchListenerReply,
    testing::Values(
        BadReply{"None", Reply::kNone, 0, "[WARNING] Couldn't check in with svcd: no reply"},
        BadReply{"Empty", Reply::kDictionary, 0, "[IPC]     ... failed: mConfigDict is empty"},
        BadReply{"NoAccess", Reply::kError, EACCES, "[IPC]     ... not launched by svcd (EACCES)"},
        BadReply{"Error", Reply::kError, ENOENT,
                 "[WARNING] Couldn't check in with svcd: errno=2/No such file or directory"},
        BadReply{"Other", Reply::kOther, 0,
                 "[IPC]     ... failed: mConfigDict is unexpected type 3"}),
    [](const auto& each) { return each.param.name; });

TEST_F(LaunchListenerTest, FindsSocketsByTheirName) {
    const int first = listen("a");
    const int second = listen("b");
    give("Render", {first, second});
    make();
    const Array* found = listener->getSocketListeners("Render");
    ASSERT_EQ(found->count(), 2u);
    EXPECT_EQ(found->getAs<Number>(1)->getInteger(), second);
    EXPECT_EQ(listener->getServerSocket("Render"), first);
}

TEST_F(LaunchListenerTest, SaysWhySocketsAreMissing) {
    services.managed = false;
    make();
    log.clear();
    EXPECT_EQ(listener->getServerSocket("Render"), -1);
    EXPECT_THAT(log.lines(), ElementsAre("[WARNING] LaunchListener: getSocketListeners failed - "
                                         "no svcd configDict"));
    services.managed = true;

    reply("Other", Values::dictionary());
    make();
    log.clear();
    EXPECT_EQ(listener->getSocketListeners("Render"), nullptr);
    EXPECT_THAT(log.lines(), ElementsAre("[WARNING] LaunchListener: getSocketListeners failed - "
                                         "No socket dict"));

    give("Render", {});
    make();
    for (const char* name : {"Render", "Other"}) {
        log.clear();
        EXPECT_EQ(listener->getSocketListeners(name), nullptr);
        FakeServer server;
        EXPECT_FALSE(listener->registerServerSocket(&server, name));
        const std::string line = OVFormat(
            "[WARNING] LaunchListener: Sockets dict has no entry for key '%s'", std::string(name));
        EXPECT_THAT(log.lines(), ElementsAre(line, line));
    }
}

TEST_F(LaunchListenerTest, KnowsTheServiceThatItWasStartedFor) {
    const Ref<Values> ports = Values::dictionary();
    set(*ports, "com.tarnwick.orvane.ipc", Number::number(17));
    reply("MachServices", ports);
    make();
    log.clear();
    EXPECT_EQ(listener->getMachServerPort("com.tarnwick.orvane.ipc"), 17);
    EXPECT_THAT(log.lines(), IsEmpty());
    EXPECT_EQ(listener->getMachServerPort("other"), 0);
    EXPECT_THAT(log.lines(), ElementsAre("[WARNING] No 'other' key found in MachServices "
                                         "dictionary in svcd config!"));
}

TEST_F(LaunchListenerTest, SaysIfItWasStartedForNoService) {
    give("Render", {listen("a")});
    make();
    log.clear();
    EXPECT_EQ(listener->getMachServerPort("com.tarnwick.orvane.ipc"), 0);
    EXPECT_THAT(log.lines(), ElementsAre("[WARNING] No MachServices key found in svcd config!"));
}

TEST_F(LaunchListenerTest, HandsConnectionsOver) {
    const int first = listen("a");
    const int second = listen("b");
    give("Render", {first, second});
    make();
    FakeServer server;
    log.clear();
    ASSERT_TRUE(listener->registerServerSocket(&server, "Render"));
    const auto* pointer = static_cast<const void*>(static_cast<ServerSocket*>(&server));
    EXPECT_THAT(
        log.lines(),
        ElementsAre(OVFormat("[IPC] LaunchListener listening on fd %i for ServerSocket %p 'Render'",
                             first, pointer),
                    OVFormat("[IPC] LaunchListener listening on fd %i for ServerSocket %p 'Render'",
                             second, pointer)));
    turn();
    EXPECT_THAT(server.connections, IsEmpty());
    log.clear();
    const UniqueFD client = connectTo("b");
    turn();
    ASSERT_EQ(server.connections.size(), 1u);
    EXPECT_THAT(
        log.lines(),
        ElementsAre(
            OVFormat("[IPC] LaunchListener::fileDescriptorCallback -- type=1, kqueue=%i",
                     listener->getEventQueue()),
            OVFormat("[IPC] LaunchListener got socket event on fd %i: socket=%i, ServerSocket=%p",
                     second, server.connections[0].get(), pointer),
            "[IPC] LaunchListener finished socket event"));
    EXPECT_EQ(write(client.get(), "x", 1), 1);
    char byte = 0;
    EXPECT_EQ(read(server.connections[0].get(), &byte, 1), 1);
    EXPECT_EQ(byte, 'x');
}

TEST_F(LaunchListenerTest, TakesOneConnectionATurn) {
    give("Render", {listen("a")});
    make();
    FakeServer server;
    listener->registerServerSocket(&server, "Render");
    const UniqueFD first = connectTo("a");
    const UniqueFD second = connectTo("a");
    turn();
    EXPECT_EQ(log.count("got socket event"), static_cast<int>(server.connections.size()));
    while (server.connections.size() < 2) {
        turn();
    }
    EXPECT_EQ(log.count("fileDescriptorCallback"), 2);
}

TEST_F(LaunchListenerTest, ReportsAServerThatFailsAndGoesOn) {
    give("Render", {listen("a")});
    make();
    FakeServer server;
    server.throws = true;
    listener->registerServerSocket(&server, "Render");
    const UniqueFD first = connectTo("a");
    turn();
    EXPECT_TRUE(log.contains("fileDescriptorCallback()"));
    EXPECT_TRUE(log.contains("full"));
    server.throws = false;
    const UniqueFD second = connectTo("a");
    turn();
    EXPECT_EQ(server.connections.size(), 2u);
}

TEST_F(LaunchListenerTest, WantsSomebodyForConnections) {
    const int socket = listen("a");
    make();
    ASSERT_TRUE(listener->registerEvent(static_cast<std::uintptr_t>(socket), EventQueue::kRead,
                                        EventQueue::kAdd | EventQueue::kEnable, 0, 0, nullptr));
    const UniqueFD client = connectTo("a");
    turn();
    EXPECT_TRUE(log.contains("serverSocket"));
    // The connection is closed, not left open for good.
    char byte;
    EXPECT_EQ(read(client.get(), &byte, 1), 0);
}

TEST_F(LaunchListenerTest, NeverWaitsForSomeoneWhoHasGone) {
    const int first = listen("a");
    ASSERT_EQ(fcntl(first, F_SETFL, fcntl(first, F_GETFL) & ~O_NONBLOCK), 0);
    give("Render", {first});
    make();
    FakeServer server;
    ASSERT_TRUE(listener->registerServerSocket(&server, "Render"));
    EXPECT_NE(fcntl(first, F_GETFL) & O_NONBLOCK, 0);
}

#ifndef __SANITIZE_ADDRESS__  // the sanitizers open files of their own
TEST_F(LaunchListenerTest, TriesAgainInASecondIfThereIsNoDescriptorForAConnection) {
    Support::ManualClock clock;
    const int socket = listen("a");
    give("Render", {socket});
    make();
    FakeServer server;
    ASSERT_TRUE(listener->registerServerSocket(&server, "Render"));
    ASSERT_TRUE(listener->registerSignal(SIGTERM));
    const UniqueFD client = connectTo("a");
    const std::string warning =
        OVFormat("[WARNING] LaunchListener: accept(%i) failed, errno=%i", socket, EMFILE);
    {
        const NoMoreDescriptors full;
        turn();
        EXPECT_EQ(log.count(warning), 1);
        // Nothing else waits with it.
        raise(SIGTERM);
        turn();
        EXPECT_TRUE(log.contains("got signal: 15"));
        clock.advanceBy(0.9);
        EXPECT_EQ(log.count(warning), 1);
        clock.advanceBy(0.2);
        EXPECT_EQ(log.count(warning), 2);
    }
    EXPECT_THAT(server.connections, IsEmpty());
    clock.advanceBy(LaunchListener::kPauseSeconds);
    EXPECT_EQ(server.connections.size(), 1u);
}
#endif

TEST_F(LaunchListenerTest, SaysIfItCannotAccept) {
    Support::ManualClock clock;
    int fds[2];
    ASSERT_EQ(pipe2(fds, O_CLOEXEC), 0);
    const UniqueFD readEnd(fds[0]);
    const UniqueFD writeEnd(fds[1]);
    make();
    FakeServer server;
    listener->registerEvent(static_cast<std::uintptr_t>(readEnd.get()), EventQueue::kRead,
                            EventQueue::kAdd | EventQueue::kEnable, 0, 0, &server);
    ASSERT_EQ(write(writeEnd.get(), "x", 1), 1);
    turn();
    EXPECT_EQ(log.count(OVFormat("[WARNING] LaunchListener: accept(%i) failed, errno=%i",
                                 readEnd.get(), ENOTSOCK)),
              1);
    EXPECT_THAT(server.connections, IsEmpty());
}

TEST_F(LaunchListenerTest, SaysIfItCannotWatch) {
    make();
    log.clear();
    EXPECT_FALSE(listener->registerEvent(static_cast<std::uintptr_t>(-1), EventQueue::kRead,
                                         EventQueue::kAdd | EventQueue::kEnable, 0, 0, nullptr));
    EXPECT_FALSE(listener->registerSignal(SIGKILL));
    EXPECT_THAT(log.lines(),
                ElementsAre("[WARNING] LaunchListener: could not register kevent -1.  Error is "
                            "9/Bad file descriptor",
                            "[WARNING] LaunchListener: could not register kevent -6.  Error is "
                            "22/Invalid argument"));
}

TEST_F(LaunchListenerTest, RegistersAllSocketsThatItCan) {
    const int good = listen("a");
    give("Render", {1 << 20, good});
    make();
    FakeServer server;
    EXPECT_FALSE(listener->registerServerSocket(&server, "Render"));
    const UniqueFD client = connectTo("a");
    turn();
    EXPECT_EQ(server.connections.size(), 1u);
}

TEST_F(LaunchListenerTest, DoesNotKnowOtherEvents) {
    Support::ManualClock clock;
    int fds[2];
    ASSERT_EQ(pipe2(fds, O_CLOEXEC), 0);
    const UniqueFD readEnd(fds[0]);
    const UniqueFD writeEnd(fds[1]);
    make();
    listener->registerEvent(static_cast<std::uintptr_t>(writeEnd.get()), EventQueue::kWrite,
                            EventQueue::kAdd | EventQueue::kEnable, 0, 0, nullptr);
    turn();
    EXPECT_EQ(log.count("[WARNING] LaunchListener: Unknown event; filter=-2"), 1);
    clock.advanceBy(LaunchListener::kPauseSeconds);
    EXPECT_EQ(log.count("[WARNING] LaunchListener: Unknown event; filter=-2"), 2);
}

TEST_F(LaunchListenerTest, EndsTheRunAtASignal) {
    Support::ManualClock clock;
    make();
    ASSERT_TRUE(listener->registerSignal(SIGTERM));
    log.clear();
    raise(SIGTERM);
    raise(SIGTERM);
    const auto result = RunLoop::current().runInMode(RunLoop::kDefaultMode, 1, false);
    EXPECT_EQ(result, RunLoop::Result::Stopped);
    EXPECT_EQ(log.lines().back(), "***** LaunchListener got signal: 15 (Terminated) x2");
}

TEST_F(LaunchListenerTest, ServesTheDefaultModeAlone) {
    give("Render", {listen("a")});
    make();
    FakeServer server;
    listener->registerServerSocket(&server, "Render");
    const UniqueFD client = connectTo("a");
    RunLoop::current().turn("another");
    EXPECT_THAT(server.connections, IsEmpty());
    turn();
    EXPECT_EQ(server.connections.size(), 1u);
}

TEST_F(LaunchListenerTest, SaysIfAnEventCannotBeHad) {
    Support::ManualClock clock;
    make();
    ASSERT_TRUE(listener->registerSignal(SIGUSR2));
    // Something else that is always readable stands where the queue was.
    const UniqueFD other(open("/dev/zero", O_RDONLY | O_CLOEXEC));
    const int queue = listener->getEventQueue();
    const UniqueFD kept(fcntl(queue, F_DUPFD_CLOEXEC, 0));
    ASSERT_EQ(dup3(other.get(), queue, O_CLOEXEC), queue);
    log.clear();
    turn();
    EXPECT_EQ(log.count("[WARNING] LaunchListener: could not pick up event.  Error is "
                        "22/Invalid argument"),
              1);
    ASSERT_EQ(dup3(kept.get(), queue, O_CLOEXEC), queue);
    raise(SIGUSR2);
    clock.advanceBy(LaunchListener::kPauseSeconds);
    EXPECT_TRUE(log.contains("got signal: 12"));
}

}  // namespace
