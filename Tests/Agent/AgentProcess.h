#pragma once

#include "Support/BackgroundProcess.h"
#include "Support/EnvVar.h"
#include "Support/TempDir.h"
#include "Support/TurnUntil.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>

/// A test of the agent's program, with a home of its own.
class AgentProcessTest : public testing::Test {
 protected:
    std::filesystem::path database() const {
        return home.path() / "data/Orvane/Database/Database.sqlite3";
    }
    /// What stands in a file, empty if it is not there.
    static std::string contentOf(const std::filesystem::path& file) {
        std::ifstream stream(file);
        return {std::istreambuf_iterator<char>(stream), std::istreambuf_iterator<char>()};
    }
    std::string log() const { return contentOf(home / "log"); }
    /// Waits until the agent has logged a text.
    bool hasLogged(const std::string& text) const {
        return Support::turnUntil([&] { return log().find(text) != std::string::npos; });
    }

    Support::TempDir home;
    Support::EnvVar data{"XDG_DATA_HOME", home.makeDirectory("data").c_str()};
    Support::EnvVar config{"XDG_CONFIG_HOME", home.makeDirectory("config").c_str()};
    Support::EnvVar noSystemBus{"DBUS_SYSTEM_BUS_ADDRESS", "unix:path=/nonexistent/bus"};
    Support::EnvVar logOn{"OVLog", "1"};
    Support::EnvVar logAgent{"OVLogAgent", "1"};
    Support::EnvVar logIPC{"OVLogIPC", "1"};
};
