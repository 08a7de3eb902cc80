// What the user manager is asked for when the agent is to be started again.

#include "Agent/UserServiceManager.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Bus.h"
#include "Support/BackgroundProcess.h"
#include "Support/EnvVar.h"
#include "Support/LogCapture.h"
#include "Support/ManualClock.h"
#include "Support/PrivateBus.h"
#include "Support/TempDir.h"
#include "Support/TurnUntil.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <cerrno>
#include <limits>
#include <memory>
#include <string>
#include <vector>

using namespace Foundation;
using namespace Orvane;
using Support::turnUntil;
using testing::HasSubstr;
using testing::Not;

namespace {

constexpr const char* kService = "org.freedesktop.systemd1";
constexpr const char* kPath = "/org/freedesktop/systemd1";
constexpr const char* kManager = "org.freedesktop.systemd1.Manager";
constexpr const char* kUnit = "/org/freedesktop/systemd1/unit/agent";

/// A stand-in for systemd's user manager, in which this process is the unit "orvane-agent.service".
/// It writes down what it is asked for.
class StartInterval : public testing::Test {
 protected:
    StartInterval() {
        start();
        addMethod("GetUnitByPID", "u", "o", std::string("ret = '") + kUnit + "'");
        addUnit();
        setStop("pass");
        setStart("pass");
    }
    ~StartInterval() noexcept override = default;

    /// What it does, in Python, when a unit is to be stopped or started.
    void setStop(const std::string& code) {
        addMethod("StopUnit", "ss", "o", noted("StopUnit") + code + "\nret = '/job/1'");
    }
    void setStart(const std::string& code) {
        addMethod("StartTransientUnit", "ssa(sv)a(sa(sv))", "o",
                  noted("StartTransientUnit") + code + "\nret = '/job/2'");
    }
    static std::string failure(const char* name) {
        return std::string("raise dbus.exceptions.DBusException('no', name='") + kService + "." +
               name + "')";
    }
    void addMethod(const char* name, const char* in, const char* out, const std::string& code) {
        const BusMessage answer =
            Bus::user().callMethod(mockMethod("AddMethod"), kManager, name, in, out, code.c_str());
        ASSERT_TRUE(answer.isValid()) << answer.getErrorText();
    }
    std::string calls() const { return directory.readFile("calls"); }

    AutoreleasePool pool;
    Support::ManualClock clock;
    Support::TempDir directory;
    Support::LogCapture log;
    Support::PrivateBus bus;
    const Support::EnvVar unit{"SYSTEMD_EXEC_PID", std::to_string(getpid()).c_str()};
    UserServiceManager manager;

 private:
    static BusMethod mockMethod(const char* member) {
        return {kService, kPath, "org.freedesktop.DBus.Mock", member, 60};
    }
    void start() {
        mMock = std::make_unique<Support::BackgroundProcess>(
            std::vector<std::string>{"/usr/bin/python3", "-m", "dbusmock", "--session", "--logfile",
                                     "/dev/null", kService, kPath, kManager});
        ASSERT_TRUE(turnUntil([] { return !Bus::user().getNameOwner(kService).empty(); }));
        const BusMessage answer = Bus::user().callMethod(
            BusMethod{kService, kPath, "org.freedesktop.DBus.Peer", "Ping", 60});
        ASSERT_TRUE(answer.isValid()) << answer.getErrorText();
        directory.writeFile("calls", "");
    }
    void addUnit() {
        BusMessage call = Bus::user().newCall(mockMethod("AddObject"));
        call.append(kUnit).append("org.freedesktop.systemd1.Unit").open('a', "{sv}");
        call.open('e', "sv").append("Id").open('v', "s").append("orvane-agent.service");
        call.close().close().close().open('a', "(ssss)").close();
        const BusMessage answer = Bus::user().call(call, 60);
        ASSERT_TRUE(answer.isValid()) << answer.getErrorText();
    }
    std::string noted(const std::string& name) const {
        return "import json\nwith open('" + (directory / "calls") +
               "', 'a') as file:\n    print('" + name + "', json.dumps(args), file=file)\n";
    }

    std::unique_ptr<Support::BackgroundProcess> mMock;
};

TEST_F(StartInterval, IsADateAndASpan) {
    EXPECT_EQ(manager.setStartInterval(90), 0);
    EXPECT_EQ(calls(),
              "StopUnit [\"orvane-agent.timer\", \"replace\"]\n"
              "StartTransientUnit [\"orvane-agent.timer\", \"replace\", "
              "[[\"Description\", \"Next work of Orvane's agent\"], "
              "[\"TimersMonotonic\", [[\"OnActiveSec\", 90000000]]], "
              "[\"TimersCalendar\", [[\"OnCalendar\", \"2026-01-01 00:01:30 UTC\"]]], "
              "[\"AccuracyUSec\", 1000000], [\"RemainAfterElapse\", 0]], []]\n");
}

TEST_F(StartInterval, HasItsDateNoLaterThanItsSpan) {
    clock.advanceBy(0.9);
    EXPECT_EQ(manager.setStartInterval(31536000), 0);
    EXPECT_THAT(calls(), HasSubstr("\"2027-01-01 00:00:00 UTC\""));
}

TEST_F(StartInterval, IsASpanAloneWhereTheManagerKnowsNoSuchDate) {
    // The years of systemd's calendar end before 2200.
    constexpr std::int64_t kYears = 173;
    EXPECT_EQ(manager.setStartInterval(kYears * 365 * 86400), 0);
    EXPECT_THAT(calls(), HasSubstr("OnCalendar"));
    for (const std::int64_t seconds :
         {(kYears + 1) * 365 * 86400, std::numeric_limits<std::int64_t>::max()}) {
        directory.writeFile("calls", "");
        EXPECT_EQ(manager.setStartInterval(seconds), 0);
        EXPECT_THAT(calls(), HasSubstr("\"OnActiveSec\""));
        EXPECT_THAT(calls(), Not(HasSubstr("OnCalendar")));
    }
}

TEST_F(StartInterval, NeedsNoOldTimer) {
    setStop(failure("NoSuchUnit"));
    EXPECT_EQ(manager.setStartInterval(60), 0);
    EXPECT_THAT(calls(), HasSubstr("StartTransientUnit"));
}

TEST_F(StartInterval, WaitsForTheEndOfTheOldTimer) {
    setStart("self.tries = getattr(self, 'tries', 0) + 1\nif self.tries < 3: " +
             failure("UnitExists"));
    EXPECT_EQ(manager.setStartInterval(60), 0);
    EXPECT_NEAR(clock.slept(), 2 * UserServiceManager::kTimerRetrySeconds, 1e-9);
}

TEST_F(StartInterval, DoesNotWaitForEver) {
    setStart(failure("UnitExists"));
    EXPECT_EQ(manager.setStartInterval(60), EEXIST);
    EXPECT_NEAR(clock.slept(),
                UserServiceManager::kTimerTries * UserServiceManager::kTimerRetrySeconds, 1e-9);
}

TEST_F(StartInterval, FailsAsTheManagerDoes) {
    setStart(failure("InvalidProperty"));
    EXPECT_EQ(manager.setStartInterval(60), EIO);
    setStop(failure("AccessDenied"));
    EXPECT_EQ(manager.setStartInterval(60), EIO);
    addMethod("GetUnitByPID", "u", "o", failure("NoUnitForPID"));
    EXPECT_EQ(manager.setStartInterval(60), ENXIO);
}

}  // namespace
