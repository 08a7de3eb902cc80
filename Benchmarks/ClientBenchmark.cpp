// What does it cost to have the agent change a flag of an entry, next to a bare echo by sd-bus that
// commits the same change with sqlite3?
//
// Both sides are processes on one bus. Both change the flag and its date of one row, and count the
// unread entries of its feed.

#include "Agent/RPC/AgentService.h"
#include "Agent/RPC/Routines.h"
#include "Benchmarks/BareEcho.h"
#include "Benchmarks/Measure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Bus.h"
#include "Support/EnvVar.h"
#include "Support/PipedChild.h"
#include "Support/PrivateBus.h"
#include "Support/TempDir.h"

#include <csignal>
#include <cstdio>
#include <stdexcept>
#include <string>

using namespace Orvane;
using Foundation::Bus;

namespace {

constexpr int kCalls = 200;
constexpr int kRounds = 9;
constexpr int kEntries = 1000;
constexpr const char* kProgram = "/proc/self/exe";

void check(bool holds, const char* what) {
    if (!holds) throw std::runtime_error(what);
}

class Caller {
 public:
    Caller() { check(RPC::AgentService::instance().lookUp(mPort) == 0, "no agent"); }

    void callAgent() {
        for (int i = 0; i < kCalls; ++i) {
            check(RPC::ipc_entry_setRead(mPort, i + 1, mAgentValue) == 0, "the agent failed");
        }
        mAgentValue = !mAgentValue;
    }
    void callBare() {
        for (int i = 0; i < kCalls; ++i) {
            mBare.call(i + 1, mBareValue);
        }
        mBareValue = !mBareValue;
    }

 private:
    Benchmarks::BareEcho::Caller mBare;
    std::uint32_t mPort = 0;
    bool mAgentValue = true;
    bool mBareValue = true;
};

void run() {
    const Foundation::AutoreleasePool pool;
    const Support::TempDir home;
    const Support::EnvVar data("XDG_DATA_HOME", home.path().c_str());
    const Support::EnvVar config("XDG_CONFIG_HOME", home.path().c_str());
    home.makeDirectory("dbus-1");
    home.makeDirectory("dbus-1/services");
    home.writeFile("dbus-1/services/com.tarnwick.orvane.ipc.service",
                   "[D-BUS Service]\nName=com.tarnwick.orvane.ipc\nExec=" ORVANE_AGENT "\n");
    const Support::PrivateBus bus;
    Benchmarks::BareEcho::seed(home / "Orvane/Database/Database.sqlite3", kEntries);
    Benchmarks::BareEcho::seed(home / "bare.sqlite3", kEntries);
    Support::PipedChild bare({kProgram, "--serve", home / "bare.sqlite3"});
    check(bare.readLine() == "ready", "no bare side");
    Caller caller;
    caller.callAgent();
    caller.callBare();
    const Benchmarks::Comparison calls =
        Benchmarks::compare([&] { caller.callAgent(); }, [&] { caller.callBare(); }, kRounds);
    const auto agent = static_cast<pid_t>(Bus::user().getProcessID(RPC::kServiceName));
    if (agent > 0) kill(agent, SIGTERM);
    Benchmarks::report("a call that changes a flag", calls, kCalls, "sd-bus echo with its commit");
    std::printf("client_benchmark %.2f\n", calls.ratio());
}

}  // namespace

int main(int argc, char** argv) {
    try {
        if (argc > 2 && std::string(argv[1]) == "--serve") {
            Benchmarks::BareEcho::serve(argv[2]);
        } else {
            run();
        }
    } catch (const std::exception& exception) {
        std::fprintf(stderr, "%s\n", exception.what());
        return 1;
    }
    return 0;
}
