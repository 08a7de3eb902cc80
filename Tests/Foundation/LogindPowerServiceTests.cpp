#include "Foundation/LogindPowerService.h"

#include "Foundation/NotificationCenter.h"
#include "Foundation/SleepNotifier.h"
#include "Support/BackgroundProcess.h"
#include "Support/EnvVar.h"
#include "Support/LogCapture.h"
#include "Support/PrivateBus.h"
#include "Support/TurnUntil.h"

#include <gtest/gtest.h>

using namespace Foundation;
using namespace Orvane;
using Support::BackgroundProcess;
using Support::EnvVar;
using Support::LogCapture;
using Support::LoggingOn;
using Support::PrivateBus;
using Support::turnUntil;

namespace {

using Lines = std::vector<std::string>;

constexpr const char* kService = "org.freedesktop.login1";
constexpr const char* kPath = "/org/freedesktop/login1";
constexpr const char* kInterface = "org.freedesktop.login1.Manager";

constexpr BusMethod methodOf(const char* interface, const char* member) {
    return {.destination = kService, .path = kPath, .interface = interface, .member = member};
}

/// A machine with a stand-in for logind on a system bus of the test's own. The test itself talks
/// to it over another connection.
class LogindPowerServiceTest : public testing::Test {
 protected:
    ~LogindPowerServiceTest() noexcept override {
        notifier.reset();
        Bus::system().close();
    }

    /// logind as it is, or one that knows no inhibitors.
    void startLogind(bool hasInhibitors = true) {
        Lines command = {"/usr/bin/python3", "-m",        "dbusmock",
                         "--system",         "--logfile", "/dev/null"};
        if (hasInhibitors) {
            command.insert(command.end(), {"--template", "logind"});
        } else {
            command.insert(command.end(), {kService, kPath, kInterface});
        }
        logind = std::make_unique<BackgroundProcess>(command);
        ASSERT_TRUE(turnUntil([&] { return !bus().getNameOwner(kService).empty(); }));
        // It has the name before it is ready to answer.
        static constexpr BusMethod kPing = {kService, kPath, "org.freedesktop.DBus.Peer", "Ping",
                                            60};
        const BusMessage answer = bus().callMethod(kPing);
        ASSERT_TRUE(answer.isValid()) << answer.getErrorText();
    }
    void stopLogind() {
        logind.reset();
        ASSERT_TRUE(turnUntil([&] { return bus().getNameOwner(kService).empty(); }));
    }
    void startNotifier() { notifier = std::make_unique<SleepNotifier>(LogindPowerService::open()); }

    static Bus& bus() { return Bus::user(); }
    void emitPrepareForSleep(bool begins) {
        static constexpr BusMethod kEmit = methodOf("org.freedesktop.DBus.Mock", "EmitSignal");
        BusMessage message = bus().newCall(kEmit);
        message.append(kInterface).append("PrepareForSleep").append("b");
        message.open('a', "v").open('v', "b").append(begins).close().close();
        const BusMessage answer = bus().call(message, 30);
        ASSERT_TRUE(answer.isValid()) << answer.getErrorText();
    }
    /// Those that are held, as "what/who/why/mode".
    static Lines listInhibitors() {
        static constexpr BusMethod kList = methodOf(kInterface, "ListInhibitors");
        BusMessage answer = bus().callMethod(kList);
        EXPECT_TRUE(answer.isValid()) << answer.getErrorText();
        EXPECT_TRUE(answer.enter('a', "(ssssuu)"));
        Lines inhibitors;
        while (answer.enter('r', "ssssuu")) {
            std::string what, who, why, mode;
            EXPECT_TRUE(answer.read(what) && answer.read(who) && answer.read(why) &&
                        answer.read(mode) && answer.skip() && answer.skip() && answer.leave());
            inhibitors.push_back(OVFormat("%s/%s/%s/%s", what, who, why, mode));
        }
        return inhibitors;
    }
    static bool holdsInhibitors(std::size_t count) {
        return turnUntil([=] { return listInhibitors().size() == count; });
    }
    bool isLogged(const std::string& line) {
        return turnUntil([&] { return log.contains(line); });
    }

    AutoreleasePool pool;
    PrivateBus privateBus;
    EnvVar systemBus{"DBUS_SYSTEM_BUS_ADDRESS", privateBus.getAddress().c_str()};
    LogCapture log;
    LoggingOn logging{{}};
    std::unique_ptr<BackgroundProcess> logind;
    std::unique_ptr<SleepNotifier> notifier;
};

/// How many inhibitors are held at the moment of each notification.
struct Observer {
    void take(Notification*) { held.push_back(count()); }

    std::function<std::size_t()> count;
    std::vector<std::size_t> held;
};

}  // namespace

TEST_F(LogindPowerServiceTest, DelaysTheSleepWhileItListens) {
    startLogind();
    startNotifier();
    EXPECT_TRUE(log.contains("SleepNotifier now listening"));
    EXPECT_EQ(listInhibitors(), Lines({"sleep/Orvane/Feed downloads have to be paused/delay"}));
    notifier.reset();
    EXPECT_TRUE(holdsInhibitors(0));
}

TEST_F(LogindPowerServiceTest, LetsGoOnceAllIsToldAndDelaysTheNextSleepAfterTheWake) {
    startLogind();
    startNotifier();
    Observer observer{[] { return listInhibitors().size(); }, {}};
    MethodReceiver<Notification, Observer> receiver(&observer, &Observer::take);
    NotificationCenter::getLocal()->addObserver(&receiver, nullptr, nullptr);
    for (int round = 0; round < 2; ++round) {
        observer.held.clear();
        emitPrepareForSleep(true);
        EXPECT_TRUE(turnUntil([&] { return observer.held.size() == 1; }));
        EXPECT_TRUE(holdsInhibitors(0));
        emitPrepareForSleep(false);
        EXPECT_TRUE(turnUntil([&] { return observer.held.size() == 2; }));
        EXPECT_TRUE(holdsInhibitors(1));
        EXPECT_EQ(observer.held, std::vector<std::size_t>({1, 1}));
    }
    NotificationCenter::getLocal()->removeObserver(&receiver);
    EXPECT_EQ(log.count("SleepNotifier: System going to sleep!"), 2);
    EXPECT_EQ(log.count("SleepNotifier: System woke up!"), 2);
}

TEST_F(LogindPowerServiceTest, ALateAcknowledgementDoesNotGiveUpTheNextInhibitor) {
    startLogind();
    const std::unique_ptr<PowerService> service = LogindPowerService::open();
    std::vector<std::intptr_t> arguments;
    const auto source = service->addRunLoopSource(
        [&](std::uint32_t, std::intptr_t argument) { arguments.push_back(argument); });
    emitPrepareForSleep(true);
    emitPrepareForSleep(false);
    ASSERT_TRUE(turnUntil([&] { return arguments.size() == 2; }));
    service->acknowledge(arguments[0]);
    service->acknowledge(arguments[1]);
    emitPrepareForSleep(true);
    ASSERT_TRUE(turnUntil([&] { return arguments.size() == 3; }));
    EXPECT_GE(arguments[2], 0);
    EXPECT_TRUE(holdsInhibitors(1));
    service->acknowledge(arguments[2]);
    EXPECT_TRUE(holdsInhibitors(0));
}

TEST_F(LogindPowerServiceTest, TellsOfSleepAlsoWhereTheInhibitorIsRefused) {
    startLogind(false);
    startNotifier();
    EXPECT_TRUE(log.contains("SleepNotifier: Can't delay the machine's sleep: "));
    EXPECT_TRUE(log.contains("SleepNotifier now listening"));
    emitPrepareForSleep(true);
    EXPECT_TRUE(isLogged("SleepNotifier: System going to sleep!"));
    emitPrepareForSleep(false);
    EXPECT_TRUE(isLogged("SleepNotifier: System woke up!"));
}

TEST_F(LogindPowerServiceTest, FindsALogindThatComesLaterAndOneThatIsStartedAnew) {
    startNotifier();
    EXPECT_TRUE(log.contains("SleepNotifier now listening"));
    startLogind();
    EXPECT_TRUE(holdsInhibitors(1));
    stopLogind();
    startLogind();
    EXPECT_TRUE(holdsInhibitors(1));
    emitPrepareForSleep(true);
    EXPECT_TRUE(isLogged("SleepNotifier: System going to sleep!"));
    EXPECT_TRUE(holdsInhibitors(0));
}

TEST_F(LogindPowerServiceTest, WithoutASystemBusTheNotifierIsIdle) {
    const EnvVar nowhere("DBUS_SYSTEM_BUS_ADDRESS", "unix:path=/nonexistent/bus");
    Bus::system().close();
    EXPECT_EQ(LogindPowerService::open(), nullptr);
    SleepNotifier::start();
    SleepNotifier::start();
    EXPECT_EQ(log.count("SleepNotifier couldn't start: PFRegisterForSystemPower failed."), 1);
}
