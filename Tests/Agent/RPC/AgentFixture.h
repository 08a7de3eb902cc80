#pragma once

#include "Agent/Client/IPCClient.h"
#include "Agent/RPC/AgentService.h"
#include "Agent/RPC/Routines.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/NetException.h"
#include "SQLite/Database.h"
#include "Support/EnvVar.h"
#include "Support/LogCapture.h"
#include "Support/PrivateBus.h"
#include "Support/TempDir.h"

#include <gtest/gtest.h>
#include <sys/types.h>

#include <functional>
#include <string>

/// A bus of the test's own that starts a real agent on demand, on a storage of its own with a
/// client (row 1) that has its settings (subscription 1) and the feeds 1 and 2 (subscriptions 2 and
/// 3). Feed 1 has the entries 1 to 20, of which the first has enclosure 1; there is author 1.
///
/// The test's process is the client.
class AgentFixture : public testing::Test {
 protected:
    using NetError = Foundation::NetError;

    static constexpr std::int32_t kBadRow = -0x8000000 + (1002 << 14) + 200;
    static constexpr std::int32_t kReadOnly = -0x8000000 + (1002 << 14) + 201;
    static constexpr std::int32_t kFailed = -0x8000000 + (1002 << 14) + 203;

    AgentFixture();
    ~AgentFixture() noexcept override;

    /// The program that the bus starts for the agent's name, from now on.
    void setProgram(const std::string& command) const;
    /// Begins as an application does.
    static void openSession();
    static Orvane::IPCClient& client() { return *Orvane::IPCClient::instance(); }
    /// The agent's port, looked up.
    static std::uint32_t port();

    /// The running agent; 0 if there is none.
    static pid_t agent();
    /// Kills the running agent, and waits until the bus has noticed.
    static void killAgent();
    static void awaitNoAgent();
    /// Waits without turning the loop, so that what the bus has told is not looked at. Throws if it
    /// takes a minute.
    static void await(const std::function<bool()>& condition);
    /// The error that a call throws; none if it does not.
    static NetError errorOf(const std::function<void()>& call);
    /// A number that the file has: column 0 of the first row of a query.
    int inFile(const std::string& query) const;
    std::string textInFile(const std::string& query) const;

    static std::span<const std::uint8_t> bytes(std::string_view text) {
        return {reinterpret_cast<const std::uint8_t*>(text.data()), text.size()};
    }
    static Foundation::String* string(const char* text) { return Foundation::String::string(text); }
    static Foundation::URL* url(const char* text) { return Foundation::URL::url(string(text)); }

    Foundation::AutoreleasePool pool;
    Support::TempDir base;
    Support::EnvVar storage{"XDG_DATA_HOME", base.path().c_str()};
    Support::LogCapture log;
    Support::PrivateBus bus;
    const std::string path = base / "Orvane/Database/Database.sqlite3";

 private:
    void seed() const;
};
