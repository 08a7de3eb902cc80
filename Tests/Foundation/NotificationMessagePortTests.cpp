#include "Foundation/NotificationMessagePort.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Data.h"
#include "Foundation/DictionaryOf.h"
#include "Foundation/DistributedNotificationCenter.h"
#include "Foundation/LocalCenter.h"
#include "Foundation/NotificationRecorder.h"
#include "Foundation/RunLoop.h"
#include "Support/LogCapture.h"
#include "Support/ManualClock.h"

#include <gtest/gtest.h>

#include <semaphore>
#include <thread>

using namespace Foundation;
using Support::LogCapture;
using Support::LoggingOn;
using Support::ManualClock;

namespace {

using Notes = std::vector<std::string>;

/// A thread that does one thing at a time, when it is told to, while the test waits.
class OtherThread {
 public:
    ~OtherThread() {
        mTask = nullptr;
        mBegin.release();
        mThread.join();
    }
    void run(const std::function<void()>& task) {
        mTask = task;
        mBegin.release();
        mEnd.acquire();
    }

 private:
    void work() {
        for (;;) {
            mBegin.acquire();
            if (!mTask) return;
            mTask();
            mEnd.release();
        }
    }

    std::binary_semaphore mBegin{0};
    std::binary_semaphore mEnd{0};
    std::function<void()> mTask;
    std::thread mThread{[this] { work(); }};
};

class ExposedPort : public NotificationMessagePort {
 public:
    explicit ExposedPort(std::size_t capacity = kCapacity)
        : NotificationMessagePort(nullptr, capacity) {}
    using NotificationMessagePort::invalidate;
    using NotificationMessagePort::receive;
};

/// No pool is open while the other thread runs: there is one stack of pools for the process, and
/// whoever has a pool keeps the others out.
class NotificationMessagePortTest : public testing::Test {
 protected:
    NotificationMessagePortTest() {
        recorder.objectsAreStrings = true;
        DistributedNotificationCenter::setInstance(&center);
        AutoreleasePool pool;
        NotificationCenter::getLocal()->addObserver(recorder, nullptr, nullptr);
    }
    ~NotificationMessagePortTest() override {
        AutoreleasePool pool;
        NotificationCenter::getLocal()->removeObserver(recorder);
        DistributedNotificationCenter::setInstance(nullptr);
        recorder.lastInfo = nullptr;
    }
    /// From the other thread. What is sent is new, and owned by the relay alone afterwards.
    void send(NotificationMessagePort& port, const char* name, const char* object = nullptr) {
        other.run([&] {
            const Ref<String> nameString = String::string(name);
            const Ref<String> objectString =
                object ? Ref<String>(String::string(object)) : Ref<String>();
            const Notification notification{nameString.get(), objectString.get(), nullptr};
            port.sendNotification(&notification);
        });
    }
    /// Lets the timers of the other thread fire that are due.
    void turnOther() {
        other.run([] { RunLoop::current().turn(); });
    }
    Notes noted() { return std::exchange(recorder.notes, {}); }

    ManualClock clock;
    RunLoop& loop = RunLoop::current();
    OtherThread other;
    LocalCenter platform;
    DistributedNotificationCenter center{&platform};
    NotificationRecorder recorder;
};

}  // namespace

TEST_F(NotificationMessagePortTest, HasAFixedName) {
    LogCapture log;
    LoggingOn on({&gLogMsg});
    try {
        const NotificationMessagePort port;
        EXPECT_TRUE(log.contains("Created MessagePort \"com.tarnwick.orvane.notification\" on "));
    } catch (const AssertionFailure& e) {
        EXPECT_STREQ(e.what(),
                     "Failed to create new PFMessagePort named 'com.tarnwick.orvane.notification'")
            << "unless the process's own is there already";
    }
}

TEST_F(NotificationMessagePortTest, DeliversAtOnceOnItsOwnLoop) {
    ExposedPort port;
    const Ref<String> name = String::string("x");
    const Notification notification{name.get(), nullptr, nullptr};
    port.sendNotification(&notification);
    EXPECT_EQ(noted(), Notes({"x"}));
}

TEST_F(NotificationMessagePortTest, RelaysFromOtherThreadsInTurnsOfItsLoop) {
    ExposedPort port;
    send(port, "x", "a");
    send(port, "y");
    EXPECT_EQ(noted(), Notes());
    loop.turn();
    EXPECT_EQ(noted(), Notes({"x a", "y"}));
}

TEST_F(NotificationMessagePortTest, GivesUpTheValuesAfterTheDelivery) {
    ExposedPort port;
    const Ref<String> name = String::string(std::string("name"));
    const Ref<String> object = String::string(std::string("object"));
    const Ref<Dictionary> info = DictionaryOf<String, String>::dictionary({});
    const Notification notification{name.get(), object.get(), info.get()};
    other.run([&] { port.sendNotification(&notification); });
    EXPECT_EQ(name->getRetainCount(), 2u);
    EXPECT_EQ(object->getRetainCount(), 2u);
    EXPECT_EQ(info->getRetainCount(), 2u);
    loop.turn();
    EXPECT_EQ(recorder.lastInfo.get(), info.get());
    {
        AutoreleasePool pool;
        recorder.lastInfo = nullptr;
    }
    EXPECT_EQ(name->getRetainCount(), 1u);
    EXPECT_EQ(object->getRetainCount(), 1u);
    EXPECT_EQ(info->getRetainCount(), 1u);
}

TEST_F(NotificationMessagePortTest, AFullPortRecoversInOrder) {
    ExposedPort port(1);
    LogCapture log;
    LoggingOn on({&gLogMsg});
    for (const char* name : {"a", "b", "c"}) {
        send(port, name);
    }
    // The second and the third each find the port full, and the second stays first.
    EXPECT_EQ(log.count("[Msg] Notification queue is full ... will retry in 0.5 sec"), 2);
    loop.turn();
    EXPECT_EQ(noted(), Notes({"a"}));

    clock.jumpTo(clock.now() + 0.49);
    turnOther();
    loop.turn();
    EXPECT_EQ(noted(), Notes());
    clock.jumpTo(clock.now() + 0.01);
    turnOther();
    EXPECT_FALSE(log.contains("stopping retry timer"));
    loop.turn();
    EXPECT_EQ(noted(), Notes({"b"}));

    clock.jumpTo(clock.now() + 0.5);
    turnOther();
    EXPECT_EQ(log.count("[Msg] All notifications sent; stopping retry timer"), 1);
    loop.turn();
    EXPECT_EQ(noted(), Notes({"c"}));

    clock.jumpTo(clock.now() + 10);
    turnOther();
    send(port, "d");
    loop.turn();
    EXPECT_EQ(noted(), Notes({"d"}));
    EXPECT_EQ(log.count("stopping retry timer"), 1) << "only said of a timer that there was";
}

TEST_F(NotificationMessagePortTest, RetriesForAsLongAsThePortIsFull) {
    ExposedPort port(1);
    LogCapture log;
    LoggingOn on({&gLogMsg});
    send(port, "a");
    send(port, "b");
    for (int i = 0; i < 20; ++i) {
        clock.jumpTo(clock.now() + 0.5);
        turnOther();
    }
    EXPECT_EQ(log.count("Notification queue is full"), 21);
    loop.turn();
    clock.jumpTo(clock.now() + 0.5);
    turnOther();
    loop.turn();
    EXPECT_EQ(noted(), Notes({"a", "b"}));
}

TEST_F(NotificationMessagePortTest, DropsWithAWarningWhatCannotBeSentAtAll) {
    ExposedPort port;
    port.invalidate();
    LogCapture log;
    const Ref<String> name = String::string(std::string("name"));
    const Notification notification{name.get(), nullptr, nullptr};
    for (int i = 1; i <= 2; ++i) {
        other.run([&] { port.sendNotification(&notification); });
        EXPECT_EQ(log.count("[WARNING] Failed to relay distributed notification: PFMessagePort err "
                            "-3"),
                  i);
        EXPECT_EQ(name->getRetainCount(), 1u);
    }
}

TEST_F(NotificationMessagePortTest, AssertsThatAMessageIsANotification) {
    ExposedPort port;
    LogCapture log;
    AutoreleasePool pool;
    const Ref<Data> empty = Data::adopt("");
    for (Data* data : {static_cast<Data*>(nullptr), empty.get()}) {
        EXPECT_THROW(Ref<Data>(port.receive(0, data)), AssertionFailure);
    }
    EXPECT_EQ(log.count("[WARNING]"), 2);
    EXPECT_EQ(noted(), Notes());
}

TEST_F(NotificationMessagePortTest, ReleasesWhatItCouldNotRelay) {
    const Ref<String> name = String::string(std::string("name"));
    {
        ExposedPort port(0);
        const Notification notification{name.get(), nullptr, nullptr};
        other.run([&] { port.sendNotification(&notification); });
        EXPECT_EQ(name->getRetainCount(), 2u);
    }
    EXPECT_EQ(name->getRetainCount(), 1u);
}
