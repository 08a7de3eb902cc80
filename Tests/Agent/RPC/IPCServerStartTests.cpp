// The server in the process of the test, which another program on the bus calls.

#include "Agent/IPCServer.h"

#include "Agent/RPC/AgentService.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Bus.h"
#include "Foundation/BusPeer.h"
#include "Foundation/NotificationCenter.h"
#include "Support/LogCapture.h"
#include "Support/PrivateBus.h"
#include "Support/TurnUntil.h"

#include <gtest/gtest.h>

#include <future>

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

    /// Calls from a thread, while the loop turns. The name of the error.
    std::string call(const char* member) {
        std::string error;
        const auto connection = BusConnection::open(bus.getAddress(), error);
        auto answer = std::async(std::launch::async, [&] {
            BusMessage message =
                connection->newCall({RPC::kServiceName, RPC::kObjectPath, RPC::kInterface, member});
            return connection->call(message, 30).getErrorName();
        });
        EXPECT_TRUE(Support::turnUntil(
            [&] { return answer.wait_for(std::chrono::seconds(0)) == std::future_status::ready; }));
        return answer.get();
    }

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
    EXPECT_EQ(call("entry_setRead"), "org.freedesktop.DBus.Error.InvalidArgs");
    EXPECT_EQ(calls, 1);
    EXPECT_EQ(call("no_such"), "org.freedesktop.DBus.Error.UnknownMethod");
    EXPECT_EQ(calls, 1);
    EXPECT_EQ(IPCServer::getCaller(), "");
}

TEST_F(IPCServerStart, FailsWhereAnotherIsTheAgent) {
    BusPeer other(bus);
    other.own(RPC::kServiceName);
    EXPECT_FALSE(IPCServer::startServer());
    EXPECT_TRUE(log.contains("IPCServer: bootstrap_register(): 17 File exists"));
}
