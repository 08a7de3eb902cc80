#include "Foundation/Bus.h"

#include "Foundation/BusPeer.h"
#include "Foundation/RunLoop.h"
#include "Support/LogCapture.h"
#include "Support/PrivateBus.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <limits>

using namespace Foundation;
using Support::LogCapture;
using Support::PrivateBus;

namespace {

constexpr const char* kPath = "/com/tarnwick/orvane/Test";
constexpr const char* kInterface = "com.tarnwick.orvane.Test";
constexpr const char* kName = "com.tarnwick.orvane.Test";
constexpr double kForever = std::numeric_limits<double>::infinity();

class Peer : public BusPeer {
 public:
    using BusPeer::BusPeer;

    BusMessage signal(const char* member) { return BusPeer::signal(kPath, kInterface, member); }
};

class BusTest : public testing::Test {
 protected:
    /// Turns the loop until as much has come.
    void await(std::size_t count) {
        while (heard.size() < count) {
            RunLoop::current().runInMode(RunLoop::kDefaultMode, kForever, true);
        }
    }
    /// Waits until everything that was sent before has been delivered.
    void settle() {
        bool isDone = false;
        BusSubscriptionPtr end = bus.subscribe({.interface = kInterface, .member = "Settled"},
                                               [&](BusMessage&) { isDone = true; });
        BusMessage signal = bus.newSignal(kPath, kInterface, "Settled");
        EXPECT_TRUE(bus.send(signal));
        while (!isDone) {
            RunLoop::current().runInMode(RunLoop::kDefaultMode, kForever, true);
        }
    }
    BusSubscriptionPtr hear(const BusMatch& match) {
        return bus.subscribe(match, [this](BusMessage& signal) {
            std::string text;
            signal.read(text);
            heard.push_back(signal.getMember() + " " + text);
        });
    }
    void sendNumbers(Peer& peer, int count) {
        for (int i = 0; i < count; ++i) {
            peer.send(peer.signal("Number").append(std::to_string(i)));
        }
    }

    PrivateBus daemon;
    Bus& bus = Bus::user();
    std::vector<std::string> heard;
};

}  // namespace

TEST_F(BusTest, DeliversTheSignalsThatMatch) {
    Peer peer(daemon);
    const auto any = hear({.interface = kInterface, .member = "Any"});
    const auto one = hear({.interface = kInterface, .member = "One", .argument0 = "it's"});
    peer.send(peer.signal("Any").append("a"));
    peer.send(peer.signal("One").append("its"));
    peer.send(peer.signal("One").append("it's"));
    peer.send(peer.signal("Other").append("b"));
    peer.settle();
    settle();
    EXPECT_EQ(heard, std::vector<std::string>({"Any a", "One it's"}));
}

TEST_F(BusTest, DropsWhatIsAddressedToItButDoesNotMatch) {
    Peer peer(daemon);
    const auto one = hear({.interface = kInterface, .argument0 = "a", .argument1 = "b"});
    for (const char* second : {"c", "b"}) {
        BusMessage signal = peer.signal("One");
        peer.send(signal.setDestination(bus.getUniqueName()).append("a").append(second));
    }
    peer.settle();
    settle();
    EXPECT_EQ(heard, std::vector<std::string>({"One a"}));
}

TEST_F(BusTest, EndsASubscriptionWithItsHandle) {
    Peer peer(daemon);
    auto any = hear({.interface = kInterface, .member = "Any"});
    any = nullptr;
    peer.send(peer.signal("Any").append("a"));
    peer.settle();
    settle();
    EXPECT_TRUE(heard.empty());
}

TEST_F(BusTest, DeliversInOrderAndInRunsInsideADelivery) {
    Peer peer(daemon);
    std::vector<std::string> order;
    const auto numbers =
        bus.subscribe({.interface = kInterface, .member = "Number"}, [&](BusMessage& signal) {
            std::string number;
            signal.read(number);
            order.push_back("begin " + number);
            if (number == "1") {
                while (order.size() < 7) {
                    RunLoop::current().runInMode("a mode of its own", kForever, true);
                }
            } else if (number == "0") {
                while (order.size() < 4) {
                    RunLoop::current().runInMode(RunLoop::kDefaultMode, kForever, true);
                }
            }
            order.push_back("end " + number);
            heard.push_back(number);
        });
    sendNumbers(peer, 5);
    await(5);
    EXPECT_EQ(order, std::vector<std::string>({"begin 0", "begin 1", "begin 2", "end 2", "begin 3",
                                               "end 3", "begin 4", "end 4", "end 1", "end 0"}));
}

TEST_F(BusTest, ReportsWhatAHandlerThrowsAndGoesOn) {
    Peer peer(daemon);
    LogCapture log;
    const auto bad = bus.subscribe({.interface = kInterface, .member = "Any"},
                                   [](BusMessage&) { throw std::runtime_error("bad handler"); });
    const auto any = hear({.interface = kInterface, .member = "Any"});
    peer.send(peer.signal("Any").append("a"));
    await(1);
    EXPECT_TRUE(log.contains("\"bad handler\" caught in void Foundation::Bus::dispatchSignal"));
}

TEST_F(BusTest, TakesNamesAndGivesThemBack) {
    Peer peer(daemon);
    EXPECT_EQ(bus.getNameOwner(kName), "");
    EXPECT_TRUE(bus.requestName(kName));
    EXPECT_EQ(bus.getNameOwner(kName), bus.getUniqueName());
    EXPECT_THAT(bus.listNames(), testing::Contains(kName));
    bus.releaseName(kName);
    EXPECT_EQ(bus.getNameOwner(kName), "");
    peer.own(kName);
    EXPECT_FALSE(bus.requestName(kName));
    EXPECT_EQ(bus.getNameOwner(kName), peer.name());
    bus.close();
    peer.disown(kName);
    EXPECT_EQ(bus.getNameOwner(kName), "") << "a name that was refused is not taken later";
}

TEST_F(BusTest, IsRefusedANameByItsVeryFirstCall) {
    Peer peer(daemon);
    peer.own(kName);
    bus.close();
    EXPECT_FALSE(bus.requestName(kName));
    EXPECT_EQ(bus.getNameOwner(kName), peer.name());
}

TEST_F(BusTest, TellsWhenTheOwnerOfANameChanges) {
    auto first = std::make_unique<Peer>(daemon);
    first->own(kName);
    const auto watch = bus.watchName(
        kName, [&](const std::string& name, const std::string& from, const std::string& to) {
            heard.push_back(name + " " + from + ">" + to);
        });
    EXPECT_EQ(bus.getWatchedOwner(kName), first->name());
    const std::string gone = first->name();
    first = nullptr;
    await(1);
    EXPECT_EQ(bus.getWatchedOwner(kName), "");
    Peer second(daemon);
    second.own(kName);
    await(2);
    EXPECT_EQ(heard, std::vector<std::string>(
                         {kName + (" " + gone) + ">", kName + (" >" + second.name())}));
}

TEST_F(BusTest, TellsOfEveryNameWhenAskedForNone) {
    int changes = 0;
    const auto watch = bus.watchName(
        "", [&](const std::string&, const std::string&, const std::string&) { ++changes; });
    {
        Peer peer(daemon);
        peer.own(kName);
    }
    // Comes and goes, each with a name of its own and with the one it takes.
    while (changes < 4) {
        RunLoop::current().runInMode(RunLoop::kDefaultMode, kForever, true);
    }
    EXPECT_EQ(changes, 4);
}

TEST_F(BusTest, KnowsWhetherTheBusTellsOfOwners) {
    LogCapture log;
    EXPECT_FALSE(bus.isWatching(kName));
    auto watch = bus.watchName(kName, nullptr);
    EXPECT_TRUE(bus.isWatching(kName));
    watch = nullptr;
    EXPECT_FALSE(bus.isWatching(kName));
    daemon.die();
    bus.close();
    daemon.start("<limit name=\"max_match_rules_per_connection\">0</limit>");
    watch = bus.watchName(kName, nullptr);
    EXPECT_TRUE(bus.isConnected());
    EXPECT_FALSE(bus.isWatching(kName));
    EXPECT_EQ(log.count("Can't ask the user's message bus for signals ("), 1);
}

TEST_F(BusTest, AnswersCallsWithAnErrorInsteadOfLettingThemWait) {
    Peer peer(daemon);
    const BusMessage reply = bus.callMethod(
        {"org.freedesktop.DBus", "/org/freedesktop/DBus", "org.freedesktop.DBus", "NoSuch"});
    EXPECT_FALSE(reply.isValid());
    EXPECT_EQ(reply.getErrorName(), "org.freedesktop.DBus.Error.UnknownMethod");
}

TEST_F(BusTest, KeepsWhatABusThatHangsCannotTake) {
    const auto numbers = hear({.interface = kInterface, .member = "Number"});
    const std::string padding(8192, ' ');
    std::size_t count = 0;
    auto sendNext = [&] {
        BusMessage signal = bus.newSignal(kPath, kInterface, "Number");
        EXPECT_TRUE(bus.send(signal.append(std::to_string(count++)).append(padding)));
    };
    daemon.pause();
    while (bus.flush(0)) {
        sendNext();
    }
    for (int i = 0; i < 100; ++i) {
        sendNext();
    }
    daemon.resume();
    await(count);
    for (std::size_t i = 0; i < count; ++i) {
        ASSERT_EQ(heard[i], "Number " + std::to_string(i));
    }
}

TEST_F(BusTest, ComesBackAfterTheBusHasDied) {
    LogCapture log;
    const auto any = hear({.interface = kInterface, .member = "Any"});
    std::vector<std::string> owners;
    const auto watch =
        bus.watchName(kName, [&](const std::string&, const std::string& from,
                                 const std::string& to) { owners.push_back(from + ">" + to); });
    EXPECT_TRUE(bus.requestName(kName));
    const std::string first = bus.getUniqueName();
    settle();
    daemon.die();
    daemon.start();
    while (bus.isConnected()) {
        RunLoop::current().runInMode(RunLoop::kDefaultMode, kForever, true);
    }
    BusMessage lost = bus.newSignal(kPath, kInterface, "Any");
    EXPECT_FALSE(bus.send(lost));
    while (owners.size() < 3) {
        RunLoop::current().runInMode(RunLoop::kDefaultMode, 1, true);
    }
    EXPECT_EQ(owners,
              std::vector<std::string>({">" + first, first + ">", ">" + bus.getUniqueName()}));
    EXPECT_EQ(log.count("Lost the connection to the user's message bus"), 1);
    EXPECT_EQ(log.count("Connected to the user's message bus again"), 1);
    Peer peer(daemon);
    peer.send(peer.signal("Any").append("back"));
    await(1);
    EXPECT_EQ(heard, std::vector<std::string>({"Any back"}));
    bus.releaseName(kName);
}

TEST_F(BusTest, RefusesASignalThatIsNotFromItsSender) {
    Peer owner(daemon);
    Peer forger(daemon);
    owner.own(kName);
    const auto any = hear({.sender = kName, .interface = kInterface, .member = "Any"});
    forger.send(forger.signal("Any").append("forged"));
    forger.settle();
    owner.send(owner.signal("Any").append("true"));
    owner.settle();
    settle();
    EXPECT_EQ(heard, std::vector<std::string>({"Any true"}));
}
