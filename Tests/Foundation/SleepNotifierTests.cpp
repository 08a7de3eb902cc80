#include "Foundation/SleepNotifier.h"

#include "Foundation/NotificationCenter.h"
#include "Foundation/String.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

#include <stdexcept>

using namespace Foundation;
using namespace Orvane;
using Support::LogCapture;
using Support::LoggingOn;

namespace {

using Notes = std::vector<std::string>;

/// A machine whose sleep the test begins and ends; notes what is acknowledged.
class FakePower : public PowerService {
 public:
    FakePower(Handler& handler, Notes& notes) : mHandler(handler), mNotes(notes) {}

    std::unique_ptr<Source> addRunLoopSource(Handler handler) override {
        mHandler = std::move(handler);
        return std::make_unique<Source>();
    }
    void acknowledge(std::intptr_t argument) override {
        mNotes.push_back("acknowledged " + std::to_string(argument));
    }

 private:
    Handler& mHandler;
    Notes& mNotes;
};

class SleepNotifierTest : public testing::Test {
 protected:
    ~SleepNotifierTest() noexcept override {
        NotificationCenter::getLocal()->removeObserver(&observer);
        NotificationCenter::getLocal()->removeObserver(&badObserver);
    }

    std::unique_ptr<PowerService> power() { return std::make_unique<FakePower>(machine, notes); }
    void observe(NotificationReceiver& receiver) {
        NotificationCenter* const center = NotificationCenter::getLocal();
        center->addObserver(&receiver, SleepNotifier::kWillSleepNotification, nullptr);
        center->addObserver(&receiver, SleepNotifier::kDidWakeNotification, nullptr);
    }
    void take(Notification* notification) {
        EXPECT_EQ(notification->object, &notifier);
        EXPECT_EQ(notification->info, nullptr);
        notes.push_back(notification->name->utf8());
    }
    void fail(Notification*) { throw std::runtime_error("no good"); }

    AutoreleasePool pool;
    LogCapture log;
    LoggingOn logging{{}};
    Notes notes;
    PowerService::Handler machine;
    SleepNotifier notifier{power()};
    MethodReceiver<Notification, SleepNotifierTest> observer{this, &SleepNotifierTest::take};
    MethodReceiver<Notification, SleepNotifierTest> badObserver{this, &SleepNotifierTest::fail};
};

/// A notifier that cannot do what it should.
class FailingNotifier : public SleepNotifier {
 public:
    using SleepNotifier::SleepNotifier;
    void willSleep() override { throw std::runtime_error("can't sleep"); }
};

}  // namespace

TEST_F(SleepNotifierTest, SaysThatItListens) {
    EXPECT_EQ(log.lines(), Notes({"SleepNotifier now listening"}));
}

TEST_F(SleepNotifierTest, TellsOfSleepAndWakeBeforeItAcknowledgesThem) {
    observe(observer);
    log.clear();
    machine(0xE0000280, 7);
    EXPECT_EQ(notes, Notes({"Foundation::SleepNotifier::WillSleep", "acknowledged 7"}));
    EXPECT_EQ(log.lines(), Notes({"SleepNotifier: System going to sleep!"}));
    notes.clear();
    log.clear();
    machine(0xE0000300, 8);
    EXPECT_EQ(notes, Notes({"Foundation::SleepNotifier::DidWake", "acknowledged 8"}));
    EXPECT_EQ(log.lines(), Notes({"SleepNotifier: System woke up!"}));
}

TEST_F(SleepNotifierTest, AcknowledgesASleepThatNobodyObserves) {
    machine(0xE0000280, 7);
    EXPECT_EQ(notes, Notes({"acknowledged 7"}));
}

TEST_F(SleepNotifierTest, AcknowledgesASleepOfWhichAnObserverFails) {
    observe(badObserver);
    observe(observer);
    machine(0xE0000280, 7);
    EXPECT_EQ(notes, Notes({"Foundation::SleepNotifier::WillSleep", "acknowledged 7"}));
    EXPECT_TRUE(log.contains("\"no good\" caught in"));
}

TEST_F(SleepNotifierTest, AcknowledgesASleepThatItFailsToTellOf) {
    FailingNotifier failing(power());
    machine(0xE0000280, 7);
    EXPECT_EQ(notes, Notes({"acknowledged 7"}));
    EXPECT_TRUE(
        log.contains("\"can't sleep\" caught in void "
                     "Orvane::SleepNotifier::_handleNotification(std::uint32_t, std::intptr_t)"));
}

TEST_F(SleepNotifierTest, OnlyAcknowledgesOtherEvents) {
    observe(observer);
    log.clear();
    for (const std::uint32_t message : {0xE0000270u, 0xE0000290u, 0xE0000320u, 0u}) {
        machine(message, 7);
    }
    EXPECT_EQ(notes, Notes(4, "acknowledged 7"));
    EXPECT_EQ(log.lines(), Notes());
}

TEST_F(SleepNotifierTest, WithoutAPowerServiceItWarnsAndIsIdle) {
    log.clear();
    SleepNotifier idle(nullptr);
    EXPECT_EQ(log.lines(), Notes({"[WARNING] SleepNotifier couldn't start: "
                                  "PFRegisterForSystemPower failed."}));
    idle._handleNotification(0xE0000280, 7);
    EXPECT_EQ(notes, Notes());
}
