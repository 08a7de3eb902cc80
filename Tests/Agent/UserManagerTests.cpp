// The agent under a user manager of systemd's, which is the test's own: see in_user_manager.

#include "Agent/AgentProcess.h"
#include "Support/ChildProcess.h"

#include <gmock/gmock.h>

#include <cstdlib>
#include <vector>

using Support::ChildResult;
using testing::HasSubstr;
using testing::Not;
namespace fs = std::filesystem;

namespace {

constexpr const char* kPing =
    "busctl --user --timeout=25 call com.tarnwick.orvane.ipc / org.freedesktop.DBus.Peer Ping\n";

class UserManager : public AgentProcessTest {
 protected:
    UserManager() {
        fs::create_directories(units());
        fs::create_directories(home.path() / "data/dbus-1/services");
        for (const char* name : {"orvane-agent.service", "orvane-agent.socket"}) {
            fs::copy(fs::path(ORVANE_UNITS) / name, units() / name);
        }
        fs::copy(ORVANE_DBUS_SERVICE, home.path() / "data/dbus-1/services");
        addToUnit("[Service]\nStandardError=append:" + (home / "log") + "\n");
    }

    fs::path units() const { return home.path() / "config/systemd/user"; }
    /// Adds lines to what the agent's unit says.
    void addToUnit(const std::string& lines) {
        const std::string name =
            "config/systemd/user/orvane-agent.service.d/" + std::to_string(++mAdditions) + ".conf";
        fs::create_directories((home.path() / name).parent_path());
        home.writeFile(name, lines);
    }
    /// Lets a shell do these lines beside the manager, for five minutes at most. What it wrote.
    std::string inManager(const std::string& lines) {
        const ChildResult result = Support::runChild(
            {"/usr/bin/timeout", "--kill-after=10", "400", IN_USER_MANAGER, home.path().string(),
             "timeout", "300", "bash", "-c", "set -u\n" + lines});
        if (result.status == 77) {
            mReason = result.out;
        } else {
            EXPECT_EQ(result.status, 0)
                << result.out << result.err << contentOf(home / "manager.log") << log();
        }
        return result.out;
    }
    /// Why there is no manager here.
    const std::string& reason() const { return mReason; }

 private:
    std::string mReason;
    int mAdditions = 0;
};

#define SKIP_WITHOUT_MANAGER() \
    if (!reason().empty()) GTEST_SKIP() << reason()

TEST_F(UserManager, TakesTheUnitsAsTheyAre) {
    const std::string out = inManager(
        "systemd-analyze --user verify orvane-agent.service orvane-agent.socket 2>&1\n"
        "systemctl --user show --property=LoadState,Type,BusName orvane-agent.service\n"
        "systemctl --user show --property=LoadState,FileDescriptorName orvane-agent.socket\n");
    SKIP_WITHOUT_MANAGER();
    EXPECT_EQ(out,
              "Type=dbus\nBusName=com.tarnwick.orvane.ipc\nLoadState=loaded\n"
              "FileDescriptorName=Render\nLoadState=loaded\n");
}

TEST_F(UserManager, StartsTheAgentForACallAndEndsItInOrder) {
    const std::string out =
        inManager(std::string(kPing) +
                  "systemctl --user show --property=ActiveState orvane-agent.service\n"
                  "stat --format=%a $XDG_RUNTIME_DIR/Orvane $XDG_RUNTIME_DIR/Orvane/Render.socket\n"
                  "systemctl --user stop orvane-agent.service\n"
                  "systemctl --user show --property=Result,ExecMainStatus,ActiveState "
                  "orvane-agent.service\n"
                  "systemctl --user list-timers --all --no-legend\n");
    SKIP_WITHOUT_MANAGER();
    EXPECT_EQ(out,
              "ActiveState=active\n700\n600\n"
              "Result=success\nExecMainStatus=0\nActiveState=inactive\n");
    EXPECT_THAT(log(), HasSubstr("    ... checked in with svcd!"));
    EXPECT_THAT(log(), HasSubstr("[IPC] IPCServer: Got port 1 from svcd"));
    EXPECT_THAT(log(), Not(HasSubstr("allocated and registered Mach port")));
    EXPECT_THAT(log(), HasSubstr("EXITING with status 0"));
    EXPECT_THAT(log(), Not(HasSubstr("Scheduling restart")));
    EXPECT_TRUE(fs::exists(database()));
}

TEST_F(UserManager, StartsTheAgentForAConnection) {
    const std::string out = inManager(
        "systemctl --user start orvane-agent.socket\n"
        // There are no pages, which it says by the end of the connection: one that waited on would
        // start the next agent whenever one has quit.
        "python3 -c 'import os, socket; s = socket.socket(socket.AF_UNIX); s.settimeout(60); "
        "s.connect(os.environ[\"XDG_RUNTIME_DIR\"] + \"/Orvane/Render.socket\"); "
        "print(s.recv(1))'\n"
        "systemctl --user is-active orvane-agent.service\n"
        "systemctl --user stop orvane-agent.service\n"
        "systemctl --user show --property=SubState orvane-agent.socket\n"
        "systemctl --user stop orvane-agent.socket\n");
    SKIP_WITHOUT_MANAGER();
    EXPECT_EQ(out, "b''\nactive\nSubState=listening\n");
    EXPECT_EQ(log().find("STARTING"), log().rfind("STARTING"));
    EXPECT_THAT(log(), HasSubstr("    ... checked in with svcd!"));
}

TEST_F(UserManager, StartsAnAgentAnewThatWasKilled) {
    const std::string out = inManager(std::string(kPing) +
                                      "pid() { systemctl --user show --value --property=MainPID "
                                      "orvane-agent.service; }\n"
                                      "first=$(pid)\nkill -KILL $first\n"
                                      "while kill -0 $first 2>/dev/null; do :; done\n" +
                                      kPing +
                                      "[ $(pid) != $first ] && echo another\n"
                                      "systemctl --user stop orvane-agent.service\n");
    SKIP_WITHOUT_MANAGER();
    EXPECT_EQ(out, "another\n");
}

TEST_F(UserManager, WaitsAMinuteAfterAStartThatFailed) {
    home.makeDirectory("data/Orvane");
    home.writeFile("data/Orvane/Database", "in the way");
    const std::string out = inManager(
        "systemctl --user start orvane-agent.service\n"
        "until [ $(systemctl --user show --value --property=SubState orvane-agent.service) = "
        "auto-restart ]; do :; done\n"
        "systemctl --user show --property=RestartUSec,ExecMainStatus orvane-agent.service\n"
        // Whoever calls now waits with it.
        "busctl --user --timeout=1 call com.tarnwick.orvane.ipc / org.freedesktop.DBus.Peer Ping "
        "2>/dev/null || echo unanswered\n"
        "systemctl --user stop orvane-agent.service\n");
    SKIP_WITHOUT_MANAGER();
    EXPECT_EQ(out, "RestartUSec=1min\nExecMainStatus=1\nunanswered\n");
    const std::string said = log();
    EXPECT_THAT(said, HasSubstr("EXITING with status 1"));
    EXPECT_EQ(said.find("STARTING"), said.rfind("STARTING"));
}

TEST_F(UserManager, StartsAServiceAgainWhenItAsked) {
    addToUnit("[Service]\nType=simple\nBusName=\nExecStart=\nExecStart=" START_INTERVAL_WORKER " " +
              (home / "runs") + " 1 3600 7200\n");
    const std::string out = inManager(
        "systemctl --user start orvane-agent.service\n"
        "until [ $(wc -l < " +
        (home / "runs") +
        ") = 2 ]; do :; done\n"
        "cat " +
        (home / "runs") +
        "\n"
        "show() { systemctl --user show --property=$1 orvane-agent.timer; }\n"
        "show Unit,TimersMonotonic,WakeSystem | sed 's/ next_elapse.*//'\n"
        // The date counts the time that the machine sleeps.
        "date=$(show TimersCalendar | sed 's/.* OnCalendar=\\(.* UTC\\) ;.*/\\1/')\n"
        "left=$(($(date --date=\"$date\" +%s) - $(date +%s)))\n"
        "[ $left -le 3600 -a $left -ge 3300 ] || show TimersCalendar\n"
        "show NextElapseUSecRealtime | grep --count --fixed-strings \"$(echo $date)\"\n"
        "systemctl --user list-timers --all --no-legend | wc -l\n");
    SKIP_WITHOUT_MANAGER();
    EXPECT_EQ(out,
              "managed 0\nmanaged 0\nUnit=orvane-agent.service\n"
              "TimersMonotonic={ OnActiveUSec=1h ;\nWakeSystem=no\n1\n1\n");
}

/// In the machine's own time: 15 seconds of idling. Without feeds the rest is a year, as systemd
/// writes it.
TEST_F(UserManager, IsAskedForTheNextStartByAnIdleAgent) {
    if (!std::getenv("ORVANE_SLOW_TESTS")) return;
    const std::string out =
        inManager(std::string(kPing) +
                  "until systemctl --user is-active --quiet orvane-agent.timer; do sleep 1; done\n"
                  "systemctl --user show --value --property=ExecMainStatus orvane-agent.service\n"
                  "systemctl --user show --value --property=TimersMonotonic orvane-agent.timer | "
                  "sed 's/ next_elapse.*//'\n");
    SKIP_WITHOUT_MANAGER();
    EXPECT_EQ(out, "0\n{ OnActiveUSec=11month 4w 2d 4h 30min ;\n");
    EXPECT_THAT(log(), HasSubstr("Scheduling restart by svcd in 31536000 seconds"));
    EXPECT_THAT(log(), Not(HasSubstr("Got error updating launch interval")));
}

}  // namespace
