#include "Support/TempDir.h"

#include <gtest/gtest.h>

#include <csignal>
#include <cstdlib>
#include <fstream>
#include <string>

namespace {

namespace fs = std::filesystem;

/// What CTest is told to take for "skipped". A suite in which one case was skipped counts as
/// skipped, so that none goes unseen; one with a failure never does.
constexpr int kSkipped = 77;

/// The words of a process's command, with a 0 behind each; empty for one that has ended.
std::string commandOf(const fs::path& process) {
    std::ifstream file(process / "cmdline");
    std::string command;
    std::getline(file, command);
    return command;
}

/// Ends the message bus that a program starts for the user where it finds none: it goes on when the
/// program ends, as it must, and would serve a folder that is gone.
void endBusOf(const fs::path& home) {
    const fs::path bus = home / "XDG_RUNTIME_DIR/Orvane/bus";
    if (!fs::exists(bus)) return;
    const std::string place = "unix:path=" + bus.string();
    for (const fs::directory_entry& process : fs::directory_iterator("/proc")) {
        const int pid = std::atoi(process.path().filename().c_str());
        if (pid <= 1) continue;
        const std::string command = commandOf(process.path());
        if (command.starts_with("dbus-daemon") && command.find(place) != std::string::npos) {
            kill(pid, SIGTERM);
        }
    }
}

}  // namespace

/// Every test program runs in folders and with settings of its own, never the user's.
int main(int argc, char** argv) {
    testing::InitGoogleTest(&argc, argv);
    const Support::TempDir home;
    for (const char* name :
         {"HOME", "XDG_DATA_HOME", "XDG_CONFIG_HOME", "XDG_CACHE_HOME", "XDG_RUNTIME_DIR"}) {
        setenv(name, home.makeDirectory(name).c_str(), 1);
    }
    setenv("ORVANE_PROGRAMS", ORVANE_BUILT_PROGRAMS, 1);
    setenv("ORVANE_RESOURCES", ORVANE_BUILT_RESOURCES, 1);
    setenv("TZ", "UTC", 1);
    setenv("OVUseSystemLog", "0", 1);
    for (const char* name : {"DBUS_SESSION_BUS_ADDRESS", "LANGUAGE", "OVLog"}) {
        unsetenv(name);
    }
    setenv("LC_ALL", "C", 1);
    setenv("GSETTINGS_BACKEND", "memory", 1);
    const int result = RUN_ALL_TESTS();
    endBusOf(home.path());
    const bool skippedAny = testing::UnitTest::GetInstance()->skipped_test_count() > 0;
    return result == 0 && skippedAny ? kSkipped : result;
}
