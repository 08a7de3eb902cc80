#include "Foundation/BusCenter.h"

#include "Foundation/BusPeer.h"
#include "Foundation/DictionaryOf.h"
#include "Foundation/DistributedNotificationCenter.h"
#include "Foundation/NotificationNames.h"
#include "Foundation/NotificationRecorder.h"
#include "Foundation/Number.h"
#include "Foundation/PropertyListVariant.h"
#include "Foundation/RunLoop.h"
#include "Support/LogCapture.h"
#include "Support/ManualClock.h"
#include "Support/TurnUntil.h"

#include <gtest/gtest.h>

#include <csignal>

using namespace Foundation;
using Support::EnvVar;
using Support::LogCapture;
using Support::LoggingOn;
using Support::turnUntil;

namespace {

using Notes = std::vector<std::string>;

constexpr const char* kFree = "com.tarnwick.orvane.test";  // anybody's
constexpr const char* kAgents = "com.tarnwick.orvane.DBChanged";

/// Another process that posts.
class Poster : public BusPeer {
 public:
    using BusPeer::BusPeer;

    BusMessage posting(const char* name, const char* object) {
        BusMessage message = signal(BusCenter::kPath, BusCenter::kInterface, BusCenter::kMember);
        message.append(name).append(object);
        PropertyListVariant::append(message, nullptr);
        return message;
    }
    void post(const char* name, const char* object) {
        send(posting(name, object));
        settle();
    }
    void postTo(const std::string& receiver, const char* name, const char* object) {
        BusMessage message = posting(name, object);
        send(message.setDestination(receiver));
        settle();
    }
};

/// The process's own centre, on a bus of the test's.
class BusCenterTest : public testing::Test {
 protected:
    BusCenterTest() {
        for (NotificationRecorder* recorder : {&a, &b, &end}) {
            recorder->objectsAreStrings = true;
        }
        center->addObserver(end, text("com.tarnwick.orvane.end"), nullptr);
        // The subscriptions of the tests before are there, and wait for the first use.
        EXPECT_TRUE(Bus::user().connect());
    }
    ~BusCenterTest() noexcept override {
        for (NotificationRecorder* recorder : {&a, &b, &end}) {
            center->removeObserver(*recorder);
        }
    }
    String* text(const char* utf8) { return String::string(utf8); }
    /// Waits until everything that was posted before has been delivered.
    void settle() {
        end.notes.clear();
        center->post(text("com.tarnwick.orvane.end"), nullptr, nullptr);
        EXPECT_TRUE(turnUntil([&] { return !end.notes.empty(); }));
    }
    std::string self() { return Bus::user().getUniqueName(); }
    static Notes noted(NotificationRecorder& recorder) { return std::exchange(recorder.notes, {}); }

    AutoreleasePool pool;
    Support::PrivateBus daemon;
    DistributedNotificationCenter* center = DistributedNotificationCenter::instance();
    NotificationRecorder a, b, end;
};

}  // namespace

TEST_F(BusCenterTest, APostComesBackThroughTheRelayWhateverItsOptions) {
    LogCapture log;
    LoggingOn on({&gLogMsg});
    center->addObserver(a, text(kFree), nullptr);
    center->post(text(kFree), text("s"), nullptr, kNotificationDeliverImmediately);
    EXPECT_EQ(a.notes, Notes());
    settle();
    EXPECT_EQ(a.notes, Notes({"com.tarnwick.orvane.test s"}));
    EXPECT_TRUE(
        log.contains("Received distributed notification 'com.tarnwick.orvane.test' on 's'"));
    EXPECT_TRUE(log.contains("Delivering dist. notification 'com.tarnwick.orvane.test' on 's'"));
}

TEST_F(BusCenterTest, TellsAnObserverOnceHoweverManySubscriptionsWantIt) {
    center->addObserver(a, text(kFree), nullptr);
    center->addObserver(b, text(kFree), text("s"));
    for (const char* object : {"s", "t"}) {
        center->post(text(kFree), text(object), nullptr);
    }
    center->post(text(kFree), nullptr, nullptr);
    settle();
    EXPECT_EQ(a.notes, Notes({"com.tarnwick.orvane.test s", "com.tarnwick.orvane.test t",
                              "com.tarnwick.orvane.test"}));
    EXPECT_EQ(b.notes, Notes({"com.tarnwick.orvane.test s"}));
}

TEST_F(BusCenterTest, CarriesTheInfo) {
    center->addObserver(a, text(kFree), nullptr);
    Ref<MutableDictionaryOf<String, PFRefCounted>> info =
        MutableDictionaryOf<String, PFRefCounted>::dictionary();
    center->post(text(kFree), nullptr, info.get());
    settle();
    ASSERT_NE(a.lastInfo.get(), nullptr);
    EXPECT_TRUE(a.lastInfo->isEmpty());
    info->set("ErrorCode", Number::number(-1001));
    center->post(text(kFree), nullptr, info.get());
    settle();
    EXPECT_TRUE(IsEqual(a.lastInfo.get(), info.get()));
    center->post(text(kFree), nullptr, nullptr);
    settle();
    EXPECT_EQ(a.lastInfo.get(), nullptr);
}

TEST_F(BusCenterTest, HearsOtherProcessesAndDropsWhatItDidNotAskFor) {
    Poster other(daemon);
    center->addObserver(a, text(kFree), text("it's"));
    other.post(kFree, "it's");
    other.post(kFree, "else");
    other.postTo(self(), kFree, "else");
    other.postTo(self(), kFree, "it's");
    settle();
    EXPECT_EQ(a.notes, Notes({"com.tarnwick.orvane.test it's", "com.tarnwick.orvane.test it's"}));
}

TEST_F(BusCenterTest, DropsForgeriesOfTheAgent) {
    Poster agent(daemon);
    Poster forger(daemon);
    agent.own(BusCenter::kAgentName);
    LogCapture log;
    LoggingOn on({&gLogMsg});
    center->addObserver(a, text(kAgents), nullptr);
    center->addObserver(a, text(kFree), nullptr);
    forger.post(kAgents, "broadcast");
    forger.postTo(self(), kAgents, "addressed");
    forger.post(kFree, "broadcast");
    agent.post(kAgents, "true");
    agent.postTo(self(), kAgents, "true, too");
    settle();
    EXPECT_EQ(a.notes,
              Notes({"com.tarnwick.orvane.test broadcast", "com.tarnwick.orvane.DBChanged true",
                     "com.tarnwick.orvane.DBChanged true, too"}));
    EXPECT_EQ(log.count("[Msg] Dropped notification 'com.tarnwick.orvane.DBChanged' from " +
                        forger.name() + ", which is not the agent"),
              2);
}

TEST_F(BusCenterTest, BelievesAnAgentThatComesLater) {
    Poster agent(daemon);
    center->addObserver(a, text(kAgents), nullptr);
    agent.post(kAgents, "before it has the name");
    agent.own(BusCenter::kAgentName);
    agent.post(kAgents, "with the name");
    settle();
    EXPECT_EQ(a.notes, Notes({"com.tarnwick.orvane.DBChanged with the name"}));
}

TEST_F(BusCenterTest, BelievesWhoOwnedTheNameWhenTheSignalWasSent) {
    Poster first(daemon);
    Poster second(daemon);
    center->addObserver(a, text(kAgents), nullptr);
    first.own(BusCenter::kAgentName);
    first.post(kAgents, "1");
    second.post(kAgents, "too early");
    first.disown(BusCenter::kAgentName);
    first.post(kAgents, "too late");
    second.own(BusCenter::kAgentName);
    second.post(kAgents, "2");
    first.postTo(self(), kAgents, "far too late");
    // All of it has come before any of it is looked at.
    settle();
    EXPECT_EQ(a.notes,
              Notes({"com.tarnwick.orvane.DBChanged 1", "com.tarnwick.orvane.DBChanged 2"}));
}

TEST_F(BusCenterTest, TheAgentHearsItself) {
    center->addObserver(a, text(kAgents), nullptr);
    center->post(text(kAgents), text("not yet the agent"), nullptr);
    ASSERT_TRUE(Bus::user().requestName(BusCenter::kAgentName));
    center->post(text(kAgents), text("the agent"), nullptr);
    settle();
    EXPECT_EQ(a.notes, Notes({"com.tarnwick.orvane.DBChanged the agent"}));
    Bus::user().releaseName(BusCenter::kAgentName);
}

TEST_F(BusCenterTest, SurvivesSignalsOfAnotherForm) {
    Poster other(daemon);
    LogCapture log;
    center->addObserver(a, text(kFree), nullptr);
    auto bare = [&] {
        return other.signal(BusCenter::kPath, BusCenter::kInterface, BusCenter::kMember);
    };
    other.send(bare().setDestination(self()));
    other.send(bare().setDestination(self()).append(std::int32_t{5}));
    other.send(bare().append(kFree));
    other.send(bare().append(kFree).append("no info"));
    other.send(bare().append(kFree).append("text").append("text"));
    other.settle();
    settle();
    EXPECT_EQ(a.notes,
              Notes({"com.tarnwick.orvane.test no info", "com.tarnwick.orvane.test text"}));
    EXPECT_EQ(a.lastInfo.get(), nullptr);
}

TEST_F(BusCenterTest, KeepsItsSubscriptionsOnANewBus) {
    Poster agent(daemon);
    agent.own(BusCenter::kAgentName);
    center->addObserver(a, text(kAgents), nullptr);
    settle();
    LogCapture log;
    daemon.die();
    daemon.start();
    ASSERT_TRUE(
        turnUntil([&] { return log.contains("Connected to the user's message bus again"); }));
    Poster newAgent(daemon);
    newAgent.own(BusCenter::kAgentName);
    newAgent.post(kAgents, "again");
    settle();
    EXPECT_EQ(a.notes, Notes({"com.tarnwick.orvane.DBChanged again"}));
}

TEST_F(BusCenterTest, WithoutABusTheProcessHearsItselfAndLogsOnce) {
    center->addObserver(a, text(kFree), nullptr);
    Bus::user().close();
    const Support::ManualClock clock;
    LogCapture log;
    const Support::TempDir home;
    const EnvVar runtime("XDG_RUNTIME_DIR", home.makeDirectory("runtime").c_str());
    const EnvVar address("DBUS_SESSION_BUS_ADDRESS", "unix:path=/nowhere");
    const EnvVar path("PATH", "/nowhere");
    for (const char* object : {"1", "2"}) {
        center->post(text(kFree), text(object), nullptr, kNotificationDeliverImmediately);
    }
    EXPECT_EQ(a.notes, Notes());
    RunLoop::current().turn();
    EXPECT_EQ(noted(a), Notes({"com.tarnwick.orvane.test 1", "com.tarnwick.orvane.test 2"}));
    center->addObserver(b, text("com.tarnwick.orvane.other"), nullptr);
    center->post(text("com.tarnwick.orvane.other"), nullptr, nullptr);
    RunLoop::current().turn();
    EXPECT_EQ(b.notes, Notes({"com.tarnwick.orvane.other"}));
    EXPECT_EQ(log.lines(), Notes({"[WARNING] Can't connect to the user's message bus: can't start "
                                  "dbus-daemon: No such file or directory"}));
}

TEST_F(BusCenterTest, TriesAgainLessAndLessOften) {
    Bus::user().close();
    Support::ManualClock clock;
    LogCapture log;
    EXPECT_FALSE([&] {
        const EnvVar address("DBUS_SESSION_BUS_ADDRESS", "unix:path=/nowhere");
        const EnvVar path("PATH", "/nowhere");
        const bool connected = Bus::user().connect();
        // 0.25, 0.5, 1, ... 16, and then 30 seconds apart.
        double delay = Bus::kFirstRetrySeconds;
        for (int i = 0; i < 10; ++i) {
            EXPECT_EQ(RunLoop::current().getNextFireDate(), clock.now() + delay);
            clock.advanceBy(delay);
            delay = std::min(delay * 2, Bus::kLongestRetrySeconds);
        }
        return connected;
    }());
    EXPECT_EQ(log.lines().size(), 1u);
    EXPECT_FALSE(Bus::user().connect()) << "its own time has not come";
    clock.advanceBy(30);
    EXPECT_TRUE(Bus::user().isConnected());
    EXPECT_TRUE(log.contains("[WARNING] Connected to the user's message bus again"));
}
