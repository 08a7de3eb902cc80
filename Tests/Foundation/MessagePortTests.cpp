#include "Foundation/MessagePort.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Data.h"
#include "Foundation/RunLoop.h"
#include "Foundation/String.h"
#include "Support/LogCapture.h"

#include <glib.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <functional>
#include <regex>
#include <stdexcept>
#include <thread>

using namespace Foundation;
using Support::LogCapture;
using Support::LoggingOn;

namespace {

using Notes = std::vector<std::string>;

class RecordingPort : public MessagePort {
 public:
    using MessagePort::MessagePort;

    Notes notes;
    std::function<void()> also;

 private:
    Returner<Data> receive(MessageID id, Data* data) override {
        notes.push_back(std::to_string(id) + " " + std::string(data->view()));
        if (also) also();
        return nullptr;
    }
};

/// Takes what GLib's logger gets, as "level text".
class PlainLog {
 public:
    PlainLog()
        : mHandler(g_log_set_handler(
              "Orvane", G_LOG_LEVEL_MASK,
              [](const char*, GLogLevelFlags level, const char* text, gpointer self) {
                  const char* name = level == G_LOG_LEVEL_DEBUG ? "debug " : "other ";
                  static_cast<PlainLog*>(self)->lines.push_back(std::string(name) + text);
              },
              this)) {}
    ~PlainLog() { g_log_remove_handler("Orvane", mHandler); }

    Notes lines;

 private:
    guint mHandler;
};

class MessagePortTest : public testing::Test {
 protected:
    ~MessagePortTest() noexcept override = default;

    int send(MessagePort& port, MessageID id, const char* text) {
        const Ref<Data> data = Data::data(text, std::char_traits<char>::length(text));
        return port.sendFromAnyThread(id, data.get());
    }

    AutoreleasePool pool;
    RunLoop& loop = RunLoop::current();
    Ref<String> name = String::string("com.tarnwick.orvane.test");
};

}  // namespace

TEST_F(MessagePortTest, DeliversInTurnsOfItsLoopAndInOrder) {
    RecordingPort port(name.get());
    EXPECT_EQ(send(port, 1, "a"), 0);
    EXPECT_EQ(send(port, 2, "bc"), 0);
    EXPECT_EQ(port.notes, Notes());
    loop.turn();
    EXPECT_EQ(port.notes, Notes({"1 a", "2 bc"}));
    loop.turn();
    EXPECT_EQ(port.notes.size(), 2u);
}

TEST_F(MessagePortTest, ANullDataArrivesAsNoBytes) {
    RecordingPort port(name.get());
    EXPECT_EQ(port.sendFromAnyThread(7, nullptr), 0);
    loop.turn();
    EXPECT_EQ(port.notes, Notes({"7 "}));
}

TEST_F(MessagePortTest, CopiesTheDataWhenItIsSent) {
    RecordingPort port(name.get());
    char bytes[] = "old";
    const Ref<Data> data = Data::data(bytes, 3, false);
    port.sendFromAnyThread(0, data.get());
    bytes[0] = 'n';
    loop.turn();
    EXPECT_EQ(port.notes, Notes({"0 old"}));
}

TEST_F(MessagePortTest, RefusesAtOnceWhatItHasNoRoomFor) {
    RecordingPort port(name.get(), 2);
    EXPECT_EQ(send(port, 1, "a"), 0);
    EXPECT_EQ(send(port, 2, "b"), 0);
    EXPECT_EQ(send(port, 3, "c"), -1);
    loop.turn();
    EXPECT_EQ(send(port, 4, "d"), 0);
    loop.turn();
    EXPECT_EQ(port.notes, Notes({"1 a", "2 b", "4 d"}));
}

TEST_F(MessagePortTest, HoldsAsManyMessagesAsItsCapacity) {
    RecordingPort port(name.get());
    for (std::size_t i = 0; i < MessagePort::kCapacity; ++i) {
        ASSERT_EQ(send(port, 0, ""), 0);
    }
    EXPECT_EQ(send(port, 0, ""), kMessagePortSendWouldWait);
}

TEST_F(MessagePortTest, ServesEveryModeAndRunsInsideADelivery) {
    RecordingPort port(name.get());
    port.also = [&] {
        if (port.notes.size() == 1) loop.turn();
        if (port.notes.size() == 2) loop.turn("another mode");
        port.notes.push_back("end");
    };
    send(port, 1, "");
    send(port, 2, "");
    send(port, 3, "");
    loop.turn();
    EXPECT_EQ(port.notes, Notes({"1 ", "2 ", "3 ", "end", "end", "end"}));
}

TEST_F(MessagePortTest, TakesMessagesFromAnyThread) {
    RecordingPort port(name.get());
    std::thread other([&] {
        for (int i = 0; i < 100; ++i) {
            EXPECT_EQ(port.sendFromAnyThread(i, nullptr), 0);
        }
    });
    other.join();
    loop.turn();
    ASSERT_EQ(port.notes.size(), 100u);
    EXPECT_EQ(port.notes.back(), "99 ");
}

TEST_F(MessagePortTest, ReportsWhatReceiversThrowAndGoesOn) {
    RecordingPort port(name.get());
    LogCapture log;
    port.also = [] { throw std::runtime_error("bad receiver"); };
    send(port, 1, "");
    send(port, 2, "");
    loop.turn();
    EXPECT_EQ(port.notes.size(), 2u);
    EXPECT_EQ(log.count("[WARNING] std::runtime_error \"bad receiver\" caught in static Data "
                        "*Foundation::MessagePort::_callback("),
              2);
}

TEST_F(MessagePortTest, IsTheOnlyOneOfItsName) {
    LogCapture log;
    {
        RecordingPort port(name.get());
        try {
            RecordingPort again(name.get());
            FAIL();
        } catch (const AssertionFailure& e) {
            EXPECT_STREQ(e.what(),
                         "Failed to create new PFMessagePort named 'com.tarnwick.orvane.test'");
        }
        EXPECT_EQ(send(port, 1, "still there"), 0);
    }
    EXPECT_NO_THROW(RecordingPort(name.get()));
}

TEST_F(MessagePortTest, GetsANameOfItsOwnIfItHasNone) {
    LogCapture log;
    LoggingOn on({&gLogMsg});
    RecordingPort one(nullptr);
    RecordingPort two(nullptr);
    const std::regex text("\\[Msg\\] Created MessagePort \"Orvane_Anon_" +
                          std::to_string(getpid()) + "_[0-9A-F]{8}\" on RunLoop " +
                          OVFormat("%p", static_cast<void*>(&loop)));
    ASSERT_EQ(log.lines().size(), 2u);
    EXPECT_TRUE(std::regex_match(log.lines()[0], text)) << log.lines()[0];
    EXPECT_NE(log.lines()[0], log.lines()[1]);
}

TEST_F(MessagePortTest, LogsSendsPlainlyAndReceiptsAsUsual) {
    RecordingPort port(name.get(), 1);
    LogCapture log;
    LoggingOn on({&gLogMsg});
    PlainLog plain;
    send(port, 5, "abc");
    send(port, 6, "");
    const std::string pointer = OVFormat("%p", static_cast<void*>(&loop));
    EXPECT_EQ(log.lines(), Notes());
    EXPECT_EQ(plain.lines, Notes({"debug [Msg] Orvane: Sending (id=5, data=3 bytes) to MessagePort "
                                  "\"com.tarnwick.orvane.test\" from RunLoop " +
                                      pointer,
                                  "debug [Msg] Orvane: Sending (id=6, data=0 bytes) to MessagePort "
                                  "\"com.tarnwick.orvane.test\" from RunLoop " +
                                      pointer,
                                  "debug [Msg] Orvane: Error -1 from PFMessagePortSendRequest"}));
    loop.turn();
    EXPECT_EQ(log.lines(), Notes({"[Msg] MessagePort \"com.tarnwick.orvane.test\" received(id=5, "
                                  "data=3 bytes) on RunLoop " +
                                  pointer}));
}

TEST(RemoteMessagePort, FindsThePortsOfItsProcess) {
    EXPECT_EQ(RemoteMessagePort::create("no such port", getpid()), nullptr);
    std::unique_ptr<RemoteMessagePort> remote;
    {
        const auto local = LocalMessagePort::create("a port", 1, nullptr, nullptr);
        EXPECT_EQ(RemoteMessagePort::create("a port", getppid()), nullptr);
        remote = RemoteMessagePort::create("a port", getpid());
        ASSERT_NE(remote, nullptr);
        EXPECT_EQ(remote->send(0, "a"), 0);
    }
    EXPECT_EQ(remote->send(0, "a"), kMessagePortIsInvalid);
    EXPECT_EQ(RemoteMessagePort::create("a port", getpid()), nullptr);
}
