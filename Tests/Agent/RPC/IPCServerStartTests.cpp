// The server in the process of the test, which another program on the bus calls.

#include "Agent/IPCServer.h"

#include "Agent/RPC/AgentService.h"
#include "Agent/RPC/ArgumentTypes.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Bus.h"
#include "Foundation/BusPeer.h"
#include "Foundation/NetError.h"
#include "Foundation/NotificationCenter.h"
#include "Support/LogCapture.h"
#include "Support/PrivateBus.h"
#include "Support/TurnUntil.h"

#include <gtest/gtest.h>

#include <functional>
#include <future>
#include <string>
#include <vector>

using namespace Foundation;
using namespace Orvane;

namespace {

class IPCServerStart : public testing::Test {
 protected:
    IPCServerStart() {
        NotificationCenter::getLocal()->addObserver(&mReceiver, IPCServer::kCallHandledNotification,
                                                    nullptr);
    }
    ~IPCServerStart() noexcept override {
        NotificationCenter::getLocal()->removeObserver(&mReceiver);
        Bus::user().releaseName(RPC::kServiceName);
    }

    /// Calls from a thread, while the loop turns.
    BusMessage call(
        const char* member, const std::function<void(BusMessage&)>& fill = [](BusMessage&) {},
        const char* object = RPC::kObjectPath) {
        std::string error;
        const auto connection = BusConnection::open(bus.getAddress(), error);
        auto answer = std::async(std::launch::async, [&] {
            BusMessage message =
                connection->newCall({RPC::kServiceName, object, RPC::kInterface, member});
            fill(message);
            return connection->call(message, 30);
        });
        EXPECT_TRUE(Support::turnUntil(
            [&] { return answer.wait_for(std::chrono::seconds(0)) == std::future_status::ready; }));
        return answer.get();
    }
    std::string errorOf(const char* member) { return call(member).getErrorName(); }

    AutoreleasePool pool;
    Support::PrivateBus bus;
    Support::LogCapture log;
    int calls = 0;

 private:
    void called(Notification*) { ++calls; }
    MethodReceiver<Notification, IPCServerStart> mReceiver{this, &IPCServerStart::called};
};

}  // namespace

TEST_F(IPCServerStart, CountsRefusedCallsAsActivityToo) {
    const Support::LoggingOn on({&gLogIPC});
    ASSERT_TRUE(IPCServer::startServer());
    EXPECT_TRUE(log.contains("[IPC] IPCServer: allocated and registered Mach port "));
    EXPECT_TRUE(log.contains("[IPC] MIG server started"));
    EXPECT_EQ(errorOf("entry_setRead"), "org.freedesktop.DBus.Error.InvalidArgs");
    EXPECT_EQ(calls, 1);
    EXPECT_EQ(errorOf("no_such"), "org.freedesktop.DBus.Error.UnknownMethod");
    EXPECT_EQ(calls, 1);
    EXPECT_EQ(IPCServer::getCaller(), "");
}

TEST_F(IPCServerStart, FailsWhereAnotherIsTheAgent) {
    BusPeer other(bus);
    other.own(RPC::kServiceName);
    EXPECT_FALSE(IPCServer::startServer());
    EXPECT_TRUE(log.contains("IPCServer: bootstrap_register(): 17 File exists"));
}

TEST_F(IPCServerStart, FailsWithoutABusAndServesOnceThereIsOne) {
    ASSERT_TRUE(Bus::user().connect());
    bus.die();
    ASSERT_TRUE(Support::turnUntil([] { return !Bus::user().isConnected(); }));
    EXPECT_FALSE(IPCServer::startServer());
    EXPECT_TRUE(log.contains("IPCServer: mach_port_allocate(): 107 Transport endpoint is not"));
    bus.start();
    ASSERT_TRUE(Support::turnUntil([] { return Bus::user().isConnected(); }));
    EXPECT_EQ(errorOf("no_such"), "org.freedesktop.DBus.Error.UnknownMethod");
}

TEST_F(IPCServerStart, WarnsOfACallerThatSendsMoreThanItMay) {
    ASSERT_TRUE(IPCServer::startServer());
    const std::vector<std::int64_t> rows(RPC::kMaximumRowIDs + 1, 1);
    BusMessage reply = call("entries_setflags", [&](BusMessage& message) {
        message.append(std::span<const std::int64_t>(rows)).append(1).append(1);
    });
    std::int32_t status = 0;
    EXPECT_TRUE(reply.read(status));
    EXPECT_EQ(NetError::unwrapMachError(status), NetError(1002, 203));
    const std::string said = " sends more in a call of entries_setflags than may be sent";
    EXPECT_EQ(log.count(said), 1);
    EXPECT_TRUE(log.contains("IPCServer: " + reply.getDestination() + said));
}

TEST_F(IPCServerStart, DropsAReplyThatCannotBePutTogether) {
    ASSERT_TRUE(IPCServer::startServer());
    std::string said;
    int number = 0;
    const auto object = Bus::user().handleCalls("/odd", [&](BusMessage& request) {
        number = std::atoi(request.getSender().substr(3).c_str());
        BusMessage reply = request.newReply();
        reply.append(std::string("half\0a text", 11));
        testing::internal::CaptureStderr();
        IPCServer::_send(request, reply);
        said = testing::internal::GetCapturedStderr();
        Bus::user().replyError(request, "org.example.Odd", "the caller need not wait");
    });
    EXPECT_EQ(call(
                  "any", [](BusMessage&) {}, "/odd")
                  .getErrorName(),
              "org.example.Odd");
    EXPECT_EQ(said, OVFormat("22: badly generated MIG reply for port %x\n", number));
}
