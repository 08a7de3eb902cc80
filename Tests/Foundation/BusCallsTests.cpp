#include "Foundation/Bus.h"
#include "Foundation/BusPeer.h"
#include "Support/LogCapture.h"
#include "Support/PrivateBus.h"
#include "Support/TurnUntil.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <future>

using namespace Foundation;
using Support::LogCapture;
using Support::PrivateBus;
using Support::turnUntil;

namespace {

constexpr const char* kPath = "/com/tarnwick/orvane/Test";
constexpr const char* kInterface = "com.tarnwick.orvane.Test";
constexpr double kSeconds = 30;
constexpr const char* kIntrospectable = "org.freedesktop.DBus.Introspectable";

/// Another process that calls this one, which has to turn its loop to answer.
class Caller {
 public:
    explicit Caller(const PrivateBus& bus) {
        std::string error;
        mConnection = BusConnection::open(bus.getAddress(), error);
    }

    BusMessage newCall(const char* path, const char* interface, const char* member) {
        mName = Bus::user().getUniqueName();
        return mConnection->newCall({mName.c_str(), path, interface, member});
    }
    /// Sends a call, and wants no answer.
    void send(BusMessage call) {
        BusConnection::Messages ignored;
        EXPECT_TRUE(mConnection->send(call, ignored));
        EXPECT_TRUE(mConnection->flush(10, ignored));
    }
    /// Calls, while the loop turns.
    BusMessage call(BusMessage message) {
        auto answer =
            std::async(std::launch::async, [&] { return mConnection->call(message, kSeconds); });
        EXPECT_TRUE(turnUntil(
            [&] { return answer.wait_for(std::chrono::seconds(0)) == std::future_status::ready; }));
        return answer.get();
    }
    BusMessage call(const char* path, const char* interface, const char* member) {
        return call(newCall(path, interface, member));
    }
    void ping() {
        BusMessage message = mConnection->newCall(
            {"org.freedesktop.DBus", "/org/freedesktop/DBus", "org.freedesktop.DBus", "GetId"});
        EXPECT_TRUE(mConnection->call(message, 10).isValid());
    }
    const std::string& name() const { return mConnection->getUniqueName(); }

 private:
    std::unique_ptr<BusConnection> mConnection;
    std::string mName;
};

class BusCalls : public testing::Test {
 protected:
    PrivateBus daemon;
    Bus& bus = Bus::user();
    Caller caller{daemon};
};

}  // namespace

TEST_F(BusCalls, AreAnsweredByTheHandlerOfTheirObject) {
    std::string told;
    const auto object = bus.handleCalls(kPath, [&](BusMessage& call) {
        std::uint8_t small = 0;
        std::span<const std::int64_t> numbers;
        EXPECT_EQ(call.getSignature(), "yax");
        EXPECT_TRUE(call.read(small));
        EXPECT_TRUE(call.read(numbers));
        told = call.getInterface() + " " + call.getMember() + " " + call.getSender();
        BusMessage reply = call.newReply();
        EXPECT_TRUE(bus.send(reply.append(numbers[1] + small)));
    });
    const std::vector<std::int64_t> numbers = {5, 1LL << 40};
    BusMessage call = caller.newCall(kPath, kInterface, "Add");
    call.append(std::uint8_t{200}).append(std::span<const std::int64_t>(numbers));
    BusMessage reply = caller.call(call);
    std::int64_t sum = 0;
    EXPECT_TRUE(reply.read(sum));
    EXPECT_EQ(sum, (1LL << 40) + 200);
    EXPECT_EQ(told, std::string(kInterface) + " Add " + caller.name());
}

TEST_F(BusCalls, ReadAnEmptyArray) {
    const auto object = bus.handleCalls(kPath, [&](BusMessage& call) {
        std::span<const std::int64_t> numbers = {};
        const bool isRead = call.read(numbers);
        BusMessage reply = call.newReply();
        bus.send(reply.append(isRead && numbers.empty()));
    });
    BusMessage call = caller.newCall(kPath, kInterface, "Empty");
    bool isEmpty = false;
    EXPECT_TRUE(caller.call(call.append(std::span<const std::int64_t>())).read(isEmpty));
    EXPECT_TRUE(isEmpty);
}

TEST_F(BusCalls, ToObjectsThatAreNotThereAreErrors) {
    auto object = bus.handleCalls(kPath, [&](BusMessage& call) {
        bus.replyError(call, "com.tarnwick.orvane.Test.Error", "not so");
    });
    EXPECT_EQ(caller.call("/elsewhere", kInterface, "Any").getErrorName(),
              "org.freedesktop.DBus.Error.UnknownObject");
    const BusMessage refused = caller.call(kPath, kInterface, "Any");
    EXPECT_EQ(refused.getErrorName(), "com.tarnwick.orvane.Test.Error");
    EXPECT_EQ(refused.getErrorText(), "not so");
    object = nullptr;
    EXPECT_EQ(caller.call(kPath, kInterface, "Any").getErrorName(),
              "org.freedesktop.DBus.Error.UnknownObject");
}

TEST_F(BusCalls, ThatMakeTheHandlerThrowAreErrors) {
    LogCapture log;
    const auto object =
        bus.handleCalls(kPath, [](BusMessage&) { throw std::runtime_error("bad call"); });
    EXPECT_EQ(caller.call(kPath, kInterface, "Any").getErrorName(),
              "org.freedesktop.DBus.Error.Failed");
    EXPECT_TRUE(log.contains("\"bad call\" caught in void Foundation::Bus::dispatchCall"));
}

TEST_F(BusCalls, MayBeAnsweredLater) {
    BusMessage kept;
    const auto object = bus.handleCalls(kPath, [&](BusMessage& call) {
        kept = call;
        bus.onLaterTurn([&] {
            BusMessage reply = kept.newReply();
            EXPECT_TRUE(bus.send(reply.append("done")));
        });
    });
    std::string text;
    EXPECT_TRUE(caller.call(kPath, kInterface, "Later").read(text));
    EXPECT_EQ(text, "done");
}

TEST_F(BusCalls, ThatHaveArrivedAreDeliveredWithoutALoop) {
    int count = 0;
    const auto object = bus.handleCalls(kPath, [&](BusMessage&) { ++count; });
    for (int i = 0; i < 200; ++i) {
        caller.send(caller.newCall(kPath, kInterface, "Count"));
    }
    caller.ping();
    bus.deliverArrived();
    EXPECT_EQ(count, 200);
}

TEST_F(BusCalls, LetTheTreeOfObjectsBeLookedAt) {
    const auto object = bus.handleCalls(kPath, [](BusMessage&) {});
    const auto sibling = bus.handleCalls("/com/tarnwick/orvane/Other/deep", [](BusMessage&) {});
    std::string text;
    EXPECT_TRUE(caller.call("/", kIntrospectable, "Introspect").read(text));
    EXPECT_EQ(text, "<node>\n <node name=\"com\"/>\n</node>\n");
    EXPECT_TRUE(caller.call("/com/tarnwick/orvane", kIntrospectable, "Introspect").read(text));
    EXPECT_EQ(text, "<node>\n <node name=\"Other\"/>\n <node name=\"Test\"/>\n</node>\n");
    EXPECT_EQ(caller.call("/com/tarn", kIntrospectable, "Introspect").getErrorName(),
              "org.freedesktop.DBus.Error.UnknownObject");
}

TEST_F(BusCalls, TellWhichProcessIsBehindAName) {
    EXPECT_EQ(bus.getProcessID(caller.name()), static_cast<std::uint32_t>(getpid()));
    EXPECT_EQ(bus.getProcessID("org.example.Nobody"), 0u);
}

TEST_F(BusCalls, AreNotStartedForIfTheyMayNotBe) {
    EXPECT_FALSE(bus.canStart("org.example.Nobody"));
    EXPECT_TRUE(bus.canStart("org.freedesktop.DBus"));
    const BusMethod method = {"org.example.Nobody", kPath, kInterface, "Any"};
    EXPECT_EQ(bus.callMethod(method).getErrorName(), "org.freedesktop.DBus.Error.ServiceUnknown");
    BusMessage call = bus.newCall(method);
    EXPECT_EQ(bus.call(call.withoutStart(), 10).getErrorName(),
              "org.freedesktop.DBus.Error.NameHasNoOwner");
}
