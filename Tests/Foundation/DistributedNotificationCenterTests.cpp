#include "Foundation/DistributedNotificationCenter.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/NotificationRecorder.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

using namespace Foundation;
using Support::LogCapture;
using Support::LoggingOn;

namespace {

using Notes = std::vector<std::string>;

/// A platform that notes subscriptions, and delivers when the test says so.
class FakePlatform : public PlatformCenter {
 public:
    void addObserver(void* observer, Callback callback, String* name, void* object) override {
        subscriptions.push_back(name->utf8() + (object ? " " : "") +
                                (object ? static_cast<String*>(object)->utf8() : ""));
        mObserver = observer;
        mCallback = callback;
    }
    void removeObserver(void*, String*, void*) override { ++removals; }
    void removeEveryObserver(void*) override { ++removals; }
    void post(String* name, void* object, Dictionary*, bool isUrgent) override {
        posts.push_back(name->utf8() + " " + static_cast<String*>(object)->utf8() +
                        (isUrgent ? " urgent" : ""));
    }
    /// As if a process had posted.
    void arrive(const char* name, const char* object) {
        const Ref<String> nameString = String::string(name);
        const Ref<String> objectString =
            object ? Ref<String>(String::string(object)) : Ref<String>();
        mCallback(this, mObserver, nameString.get(), objectString.get(), nullptr);
    }

    Notes subscriptions;
    Notes posts;
    int removals = 0;

 private:
    void* mObserver = nullptr;
    Callback mCallback = nullptr;
};

class DistributedNotificationCenterTest : public testing::Test {
 protected:
    DistributedNotificationCenterTest() {
        DistributedNotificationCenter::setInstance(&center);
        for (NotificationRecorder* recorder : {&a, &b}) {
            recorder->objectsAreStrings = true;
        }
    }
    ~DistributedNotificationCenterTest() noexcept override {
        for (NotificationRecorder* recorder : {&a, &b}) {
            center.removeObserver(*recorder);
        }
        DistributedNotificationCenter::setInstance(nullptr);
    }
    /// A new string each time.
    String* text(const char* utf8) { return String::string(utf8); }

    AutoreleasePool pool;
    FakePlatform platform;
    DistributedNotificationCenter center{&platform};
    NotificationRecorder a, b;
};

}  // namespace

TEST_F(DistributedNotificationCenterTest, IsTheOneThatTheCentresGive) {
    EXPECT_EQ(NotificationCenter::getDistributed(), &center);
    DistributedNotificationCenter::setInstance(nullptr);
    EXPECT_EQ(NotificationCenter::getDistributed(), DistributedNotificationCenter::instance());
    EXPECT_NE(NotificationCenter::getDistributed(), &center);
}

TEST_F(DistributedNotificationCenterTest, MakesEqualStringsOne) {
    String* first = center.getCanonicalString(text("sender"));
    EXPECT_EQ(first->view(), "sender");
    EXPECT_EQ(center.getCanonicalString(text("sender")), first);
    EXPECT_NE(center.getCanonicalString(text("other")), first);
    EXPECT_EQ(center.getCanonicalString(nullptr), nullptr);
}

TEST_F(DistributedNotificationCenterTest, SubscribesOncePerNameAndSender) {
    center.addObserver(a, text("x"), nullptr);
    center.addObserver(b, text("x"), text("s"));
    EXPECT_EQ(platform.subscriptions, Notes({"x", "x s"}));
    center.addObserver(b, text("x"), nullptr);
    center.addObserver(a, text("x"), text("s"));
    EXPECT_EQ(platform.subscriptions.size(), 2u);
    center.addObserver(a, text("y"), text("s"));
    EXPECT_EQ(platform.subscriptions, Notes({"x", "x s", "y s"}));
}

TEST_F(DistributedNotificationCenterTest, AnObserverOfAnySenderGetsEveryDelivery) {
    center.addObserver(a, text("x"), nullptr);
    center.addObserver(b, text("x"), text("s"));
    platform.arrive("x", "s");
    platform.arrive("x", "t");
    platform.arrive("x", nullptr);
    EXPECT_EQ(a.notes, Notes({"x s", "x t", "x"}));
    EXPECT_EQ(b.notes, Notes({"x s"}));
}

TEST_F(DistributedNotificationCenterTest, DeliversForEqualSendersInDifferentObjects) {
    center.addObserver(a, text("x"), text("s"));
    center.addObserver(b, text("x"), text("s"));
    platform.arrive("x", "s");
    platform.arrive("x", "s");
    EXPECT_EQ(a.notes, Notes({"x s", "x s"}));
    EXPECT_EQ(b.notes, a.notes);
    EXPECT_EQ(a.objects[0], a.objects[1]);
    EXPECT_EQ(a.objects[0], center.getCanonicalString(text("s")));
}

TEST_F(DistributedNotificationCenterTest, KeepsTheSubscriptionWhenObserversGo) {
    center.addObserver(a, text("x"), text("s"));
    center.removeObserver(a, text("x"), text("s"));
    platform.arrive("x", "s");
    center.addObserver(a, text("x"), text("s"));
    center.removeObserver(a);
    platform.arrive("x", "s");
    EXPECT_EQ(a.notes, Notes());
    center.addObserver(a, text("x"), text("s"));
    platform.arrive("x", "s");
    EXPECT_EQ(a.notes, Notes({"x s"}));
    EXPECT_EQ(platform.subscriptions.size(), 1u);
    EXPECT_EQ(platform.removals, 0);
}

TEST_F(DistributedNotificationCenterTest, AsksForAName) {
    LogCapture log;
    try {
        center.addObserver(a, nullptr, nullptr);
        FAIL();
    } catch (const AssertionFailure& e) {
        EXPECT_STREQ(e.what(), "notificationName");
    }
    EXPECT_EQ(platform.subscriptions, Notes());
}

TEST_F(DistributedNotificationCenterTest, PostsOnThePlatform) {
    center.addObserver(a, text("x"), nullptr);
    center.post(text("x"), text("s"), nullptr);
    center.post(text("x"), text("s"), nullptr, kNotificationDeliverImmediately);
    EXPECT_EQ(platform.posts, Notes({"x s", "x s urgent"}));
    EXPECT_EQ(a.notes, Notes());
}

TEST_F(DistributedNotificationCenterTest, ForgetsTheSendersOfPastDeliveries) {
    center.addObserver(a, text("x"), nullptr);
    Ref<String> kept;
    a.also = [&](Notification* notification) { kept = notification->getObject<String>(); };
    {
        AutoreleasePool inner;
        platform.arrive("x", "1,2,3");
    }
    EXPECT_EQ(kept->getRetainCount(), 1u);
    bool isInside = false;
    a.also = [&](Notification* notification) {
        if (std::exchange(isInside, true)) return;
        center.addObserver(b, text("y"), text("1,2,3"));
        platform.arrive("x", "1,2,3");
        EXPECT_EQ(notification->object, center.getCanonicalString(text("1,2,3")));
    };
    platform.arrive("x", "1,2,3");
    platform.arrive("y", "1,2,3");
    EXPECT_EQ(b.notes, Notes({"y 1,2,3"})) << "what an observer asks for meanwhile stays";
}

TEST_F(DistributedNotificationCenterTest, LogsBothLegs) {
    LogCapture log;
    LoggingOn on({&gLogMsg});
    center.addObserver(a, text("x"), text("s"));
    const std::string pointer =
        OVFormat("[%p]", static_cast<void*>(center.getCanonicalString(text("s"))));
    EXPECT_TRUE(log.contains(
        "[Msg] Installing DistributedNotificationCallback for notification='x', sender='s' " +
        pointer));
    platform.arrive("x", "s");
    EXPECT_TRUE(log.contains("[Msg] Received distributed notification 'x' on 's' [0x"));
    EXPECT_TRUE(log.contains("], info=(null)"));
    EXPECT_TRUE(log.contains("[Msg] Delivering dist. notification 'x' on 's' " + pointer));
}
