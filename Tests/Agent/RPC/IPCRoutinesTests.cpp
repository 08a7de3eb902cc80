#include "Agent/IPCRoutines.h"

#include "Agent/IPCServer.h"
#include "Agent/IPCValues.h"
#include "Agent/OVMIGRoutineWrapper.h"
#include "Agent/RPC/Routines.h"
#include "Foundation/AssertionFailure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/NetException.h"
#include "Foundation/NotificationCenter.h"
#include "Model/ClientCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"
#include "Model/SubscriptionCore.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

using namespace Foundation;
using namespace Orvane;
using Support::LogCapture;

namespace {

constexpr std::int32_t kFailed = -0x8000000 + (1002 << 14) + 203;
constexpr const char* kWhere =
    "caught in kern_return_t OVMIGRoutineWrapper(mig_routine_t, mach_msg_header_t *, "
    "mach_msg_header_t *)";

std::span<const std::uint8_t> bytes(std::string_view text) {
    return {reinterpret_cast<const std::uint8_t*>(text.data()), text.size()};
}

/// Notes what is posted for calls.
class Calls {
 public:
    Calls() {
        NotificationCenter::getLocal()->addObserver(&mReceiver, IPCServer::kCallHandledNotification,
                                                    nullptr);
    }
    ~Calls() { NotificationCenter::getLocal()->removeObserver(&mReceiver); }
    std::vector<std::string> objects;

 private:
    void called(Notification* notification) {
        objects.push_back(static_cast<String*>(notification->object)->utf8());
    }
    MethodReceiver<Notification, Calls> mReceiver{this, &Calls::called};
};

}  // namespace

// What clients of other versions say by number.
static_assert(ClientCore::Private == 1);
static_assert(SubscriptionCore::RefreshInterval == 2);
static_assert(SubscriptionCore::ExpirationInterval == 3);
static_assert(SubscriptionCore::RefreshesInBackground == 5);
static_assert(SubscriptionCore::DownloadsEnclosures == 6);
static_assert(SubscriptionCore::MaxEnclosureSize == 7);
static_assert(FeedCore::Login == 20);
static_assert(EntryCore::Read == 22);
static_assert(EntryCore::Flagged == 23);

TEST(IPCRoutines, ServeAllOfTheTableAndNothingElse) {
    int count = 0;
    for (int number = -1; number < 300; ++number) {
        const bool isServed = OrvaneIPC_server_routine(number) != nullptr;
        EXPECT_EQ(isServed, RPC::findRoutine(number) != nullptr) << number;
        if (isServed) ++count;
    }
    EXPECT_EQ(count, 27);
}

TEST(OVMIGRoutineWrapper, GivesZeroForARoutineThatReturns) {
    LogCapture log;
    const Support::LoggingOn on({&gLogIPC});
    bool hasRun = false;
    EXPECT_EQ(OVMIGRoutineWrapper([&] { hasRun = true; }), 0);
    EXPECT_TRUE(hasRun);
    EXPECT_TRUE(log.contains("[IPC] ...successful exit from OVMIGRoutineWrapper"));
}

TEST(OVMIGRoutineWrapper, GivesTheErrorOfANetException) {
    LogCapture log;
    EXPECT_EQ(OVMIGRoutineWrapper([] { throw NetException(1002, 200); }),
              NetError(1002, 200).wrapAsMachError());
    EXPECT_EQ(OVMIGRoutineWrapper([] { throw NetException(NetError::kPOSIX, 2); }), 0xC002);
    EXPECT_EQ(log.count(kWhere), 2);
}

TEST(OVMIGRoutineWrapper, GivesAnIPCErrorForAnythingElse) {
    LogCapture log;
    EXPECT_EQ(OVMIGRoutineWrapper([] { OV_ASSERT(false); }), kFailed);
    EXPECT_EQ(OVMIGRoutineWrapper([] { throw std::runtime_error("odd"); }), kFailed);
    EXPECT_EQ(OVMIGRoutineWrapper([] { throw 1; }), kFailed);
    EXPECT_EQ(log.count(kWhere), 3);
}

TEST(OVReceivedRPC, LogsAndPostsEveryCall) {
    const AutoreleasePool pool;
    LogCapture log;
    const Support::LoggingOn on({&gLogIPC});
    const Calls calls;
    OVReceivedRPC(145, "entry_setRead");
    EXPECT_TRUE(log.contains("[IPC] Received Message \"entry_setRead\""));
    EXPECT_EQ(calls.objects, std::vector<std::string>{""});
}

TEST(IPCValues, AreNullForNothing) {
    const AutoreleasePool pool;
    EXPECT_EQ(static_cast<String*>(getLongString({})), nullptr);
    EXPECT_EQ(static_cast<String*>(getCString255("")), nullptr);
    EXPECT_EQ(static_cast<URL*>(getURL({})), nullptr);
    EXPECT_EQ(static_cast<URL*>(getURL(bytes("no url"))), nullptr);
}

TEST(IPCValues, AreTextsOfUTF8) {
    const AutoreleasePool pool;
    LogCapture log;
    EXPECT_EQ(getLongString(bytes("\xc3\xa4"))->utf8(), "\xc3\xa4");
    EXPECT_EQ(getCString255("uid")->utf8(), "uid");
    EXPECT_EQ(getURL(bytes("http://example.org/"))->text(), "http://example.org/");
    try {
        static_cast<void>(static_cast<String*>(getLongString(bytes("\xc3"))));
        FAIL();
    } catch (const AssertionFailure& failure) {
        EXPECT_STREQ(failure.what(), "Couldn't convert string from UTF-8");
    }
    EXPECT_THROW(static_cast<void>(static_cast<URL*>(getURL(bytes("\xff")))), AssertionFailure);
}
