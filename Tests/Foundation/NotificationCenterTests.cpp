#include "Foundation/NotificationCenter.h"

#include "Foundation/DictionaryOf.h"
#include "Foundation/MutableString.h"
#include "Foundation/Notification.h"
#include "Foundation/NotificationRecorder.h"
#include "Foundation/Number.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

#include <stdexcept>

using namespace Foundation;
using Support::LogCapture;
using Support::LoggingOn;

namespace {

using Notes = std::vector<std::string>;

class NotificationCenterTest : public testing::Test {
 protected:
    ~NotificationCenterTest() noexcept override {
        for (NotificationRecorder* recorder : {&a, &b, &c}) {
            center->removeObserver(*recorder);
        }
    }
    String* text(const char* utf8) { return String::string(utf8); }

    AutoreleasePool pool;
    NotificationCenter* center = NotificationCenter::getLocal();
    Notes order;
    NotificationRecorder a{"a", &order}, b{"b", &order}, c{"c", &order};
    int sender = 0;
    int other = 0;
};

}  // namespace

TEST_F(NotificationCenterTest, IsOneForTheProcess) {
    EXPECT_EQ(center, NotificationCenter::getLocal());
}

TEST_F(NotificationCenterTest, CallsObserversInTheOrderOfTheirRegistration) {
    center->addObserver(b, text("x"), nullptr);
    center->addObserver(a, nullptr, nullptr);
    center->addObserver(c, text("x"), &sender);
    center->post(text("x"), &sender, nullptr);
    EXPECT_EQ(order, Notes({"b", "a", "c"}));
}

TEST_F(NotificationCenterTest, TellsNamesByTextAndSendersByAddress) {
    center->addObserver(a, text("x"), nullptr);
    center->addObserver(b, text("x"), &sender);
    center->addObserver(c, nullptr, &sender);
    center->post(text("x"), &sender, nullptr);
    center->post(text("x"), &other, nullptr);
    center->post(text("x"), nullptr, nullptr);
    center->post(text("y"), &sender, nullptr);
    EXPECT_EQ(a.notes, Notes({"x", "x", "x"}));
    EXPECT_EQ(b.notes, Notes({"x"}));
    EXPECT_EQ(c.notes, Notes({"x", "y"}));
    EXPECT_EQ(a.objects, std::vector<void*>({&sender, &other, nullptr}));
}

TEST_F(NotificationCenterTest, EqualStringsAreDifferentSenders) {
    const Ref<String> one = String::string("sender");
    const Ref<String> same = String::string(std::string("sender"));
    center->addObserver(a, text("x"), one.get());
    center->post(text("x"), same.get(), nullptr);
    EXPECT_EQ(a.notes, Notes());
    center->post(text("x"), one.get(), nullptr);
    EXPECT_EQ(a.notes, Notes({"x"}));
}

TEST_F(NotificationCenterTest, HandsTheInfoOver) {
    center->addObserver(a, text("x"), nullptr);
    const Ref<MutableDictionaryOf<String, PFRefCounted>> info =
        MutableDictionaryOf<String, PFRefCounted>::dictionary();
    info->set("answer", Number::number(42));
    center->post(text("x"), nullptr, info.get());
    EXPECT_EQ(a.lastInfo.get(), info.get());
    center->post(text("x"), nullptr, nullptr);
    EXPECT_EQ(a.lastInfo.get(), nullptr);
}

TEST_F(NotificationCenterTest, OneReceiverMayObserveSeveralNames) {
    center->addObserver(a, text("x"), nullptr);
    center->addObserver(a, text("y"), nullptr);
    center->post(text("x"), nullptr, nullptr);
    center->post(text("y"), nullptr, nullptr);
    center->removeObserver(a, text("x"), nullptr);
    center->post(text("x"), nullptr, nullptr);
    center->post(text("y"), nullptr, nullptr);
    EXPECT_EQ(a.notes, Notes({"x", "y", "y"}));
    center->removeObserver(a);
    center->post(text("y"), nullptr, nullptr);
    EXPECT_EQ(a.notes.size(), 3u);
}

TEST_F(NotificationCenterTest, ARemovalForASenderLeavesTheOthers) {
    center->addObserver(a, text("x"), &sender);
    center->addObserver(a, text("x"), &other);
    center->addObserver(b, text("x"), &sender);
    center->removeObserver(a, text("x"), &sender);
    center->post(text("x"), &sender, nullptr);
    center->post(text("x"), &other, nullptr);
    EXPECT_EQ(order, Notes({"b", "a"}));
    center->removeObserver(a, text("x"), nullptr);
    center->post(text("x"), &other, nullptr);
    EXPECT_EQ(order, Notes({"b", "a"}));
}

TEST_F(NotificationCenterTest, KnowsANameAsItWasAtTheRegistration) {
    const Ref<MutableString> name = String::mutableString("x");
    center->addObserver(a, name.get(), nullptr);
    center->addObserver(b, nullptr, nullptr);
    name->append("y");
    center->post(text("x"), nullptr, nullptr);
    center->post(name.get(), nullptr, nullptr);
    EXPECT_EQ(a.notes, Notes({"x"}));
    EXPECT_EQ(b.notes, Notes({"x", "xy"}));
    center->removeObserver(a, text("xy"), nullptr);
    center->removeObserver(b, text("x"), nullptr);
    center->post(text("x"), nullptr, nullptr);
    EXPECT_EQ(order, Notes({"a", "b", "b", "a", "b"}));
    center->removeObserver(a, text("x"), nullptr);
    center->post(text("x"), nullptr, nullptr);
    EXPECT_EQ(a.notes.size(), 2u);
}

TEST_F(NotificationCenterTest, WhatIsRemovedDuringAPostIsNotCalledAnyMore) {
    a.also = [&](Notification*) {
        center->removeObserver(a);
        center->removeObserver(b);
    };
    center->addObserver(a, text("x"), nullptr);
    center->addObserver(b, text("x"), nullptr);
    center->addObserver(c, text("x"), nullptr);
    center->post(text("x"), nullptr, nullptr);
    center->post(text("x"), nullptr, nullptr);
    EXPECT_EQ(order, Notes({"a", "c", "c"}));
}

TEST_F(NotificationCenterTest, WhatIsAddedDuringAPostIsCalledFromTheNextOne) {
    a.also = [&](Notification*) {
        for (int i = 0; i < 100 && a.notes.size() == 1; ++i) {
            center->addObserver(b, text("x"), nullptr);
        }
    };
    center->addObserver(a, text("x"), nullptr);
    center->addObserver(c, text("x"), nullptr);
    center->post(text("x"), nullptr, nullptr);
    EXPECT_EQ(order, Notes({"a", "c"}));
    center->post(text("x"), nullptr, nullptr);
    EXPECT_EQ(b.notes.size(), 100u);
}

TEST_F(NotificationCenterTest, ObserversMayPost) {
    a.also = [&](Notification* notification) {
        if (notification->name->view() == "x") center->post(text("y"), nullptr, nullptr);
    };
    center->addObserver(a, nullptr, nullptr);
    center->addObserver(b, nullptr, nullptr);
    center->post(text("x"), nullptr, nullptr);
    EXPECT_EQ(order, Notes({"a", "a", "b", "b"}));
    EXPECT_EQ(b.notes, Notes({"y", "x"}));
}

TEST_F(NotificationCenterTest, ABadObserverDisturbsNobody) {
    LogCapture log;
    a.also = [](Notification*) { throw std::runtime_error("bad observer"); };
    center->addObserver(a, text("x"), nullptr);
    center->addObserver(b, text("x"), nullptr);
    center->post(text("x"), nullptr, nullptr);
    EXPECT_EQ(order, Notes({"a", "b"}));
    EXPECT_EQ(log.count("[WARNING] std::runtime_error \"bad observer\" caught in void "
                        "Foundation::OVNotificationCenterLocalNotificationCallback("),
              1);
}

TEST_F(NotificationCenterTest, EachReceiverHasAPoolOfItsOwn) {
    Ref<String> value = String::string(std::string("value"));
    a.also = [&](Notification*) { autorelease(retain(value.get())); };
    center->addObserver(a, text("x"), nullptr);
    center->post(text("x"), nullptr, nullptr);
    EXPECT_EQ(value->getRetainCount(), 1u);
}

TEST_F(NotificationCenterTest, LogsWhatHappens) {
    LogCapture log;
    LoggingOn on({&gLogMsg});
    NotificationReceiver* receiver = a;
    const void* object = &sender;
    center->addObserver(a, text("x"), &sender);
    EXPECT_TRUE(log.contains("[Msg] Installing LocalNotificationCallback on ctr 0x"));
    EXPECT_TRUE(log.contains(
        OVFormat(" for observer=%p, notification= x, %p", static_cast<void*>(receiver), object)));
    center->post(text("x"), &sender, nullptr);
    EXPECT_TRUE(log.contains(OVFormat("[Msg] Notification \"x\",%p posted to ctr 0x", object)));
    EXPECT_TRUE(
        log.contains(OVFormat("[Msg] Received notification 'x' on %p, info=(null)", object)));
    center->removeObserver(a, text("x"), &sender);
    EXPECT_TRUE(log.contains(
        OVFormat("[Msg] Removed observer %p for x, obj=%p", static_cast<void*>(receiver), object)));
    log.clear();
    center->removeObserver(a);
    EXPECT_EQ(log.lines(),
              Notes({OVFormat("[Msg] Removed observer %p", static_cast<void*>(receiver))}));
}

TEST_F(NotificationCenterTest, WarnsOfOptionsBeyondTheFirstAndPosts) {
    LogCapture log;
    center->addObserver(a, text("x"), nullptr);
    center->post(text("x"), nullptr, nullptr, kNotificationDeliverImmediately);
    EXPECT_EQ(log.lines(), Notes());
    center->post(text("x"), nullptr, nullptr, static_cast<NotificationPostingOptions>(2));
    EXPECT_EQ(log.lines(),
              Notes({"[WARNING] A posting option other than kNotificationDeliverImmediately was "
                     "chosen.  This is not available in all implementations."}));
    EXPECT_EQ(a.notes.size(), 2u);
}
