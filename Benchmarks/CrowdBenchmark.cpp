// Fifty clients call the agent at once, 200 times each: what do the slowest of their calls take,
// one in a hundred, next to those of fifty callers of a bare echo by sd-bus that commits?
//
// The clients are processes with sessions of their own, which hear of what the others change. They
// set flags of one entry and of two, and contents.

#include "Agent/RPC/CrowdMember.h"
#include "Benchmarks/BareEcho.h"
#include "Benchmarks/Measure.h"
#include "Foundation/Bus.h"
#include "Foundation/BusCenter.h"
#include "Foundation/UniqueFD.h"
#include "Support/EnvVar.h"
#include "Support/PipedChild.h"
#include "Support/PrivateBus.h"
#include "Support/TempDir.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <functional>
#include <list>
#include <sstream>
#include <stdexcept>
#include <string>
#include <vector>

using Benchmarks::BareEcho::Caller;

namespace {

constexpr int kClients = 50;
constexpr int kCalls = 200;
constexpr int kRounds = 3;
constexpr const char* kProgram = "/proc/self/exe";

void check(bool holds, const char* what) {
    if (!holds) throw std::runtime_error(what);
}

/// Makes the calls once the gate opens, and writes what each took. Between them it does what there
/// is to do.
void callAll(const char* gate, const std::function<void(int)>& call) {
    const Foundation::UniqueFD fd(open(gate, O_RDONLY | O_CLOEXEC));
    std::printf("ready\n");
    std::fflush(stdout);
    char byte;
    while (read(fd.get(), &byte, 1) > 0) {
    }
    for (int i = 0; i < kCalls; ++i) {
        std::printf("%.9f ", Benchmarks::secondsOf([&] { call(i); }));
        std::fflush(stdout);
        CrowdMember::listen();
    }
    std::printf("\n");
}

void beClient(const char* gate, int number, const char* base) {
    CrowdMember::openSession(base);
    const CrowdMember member(number);
    callAll(gate, [&](int i) { member.change(i); });
}

void beBareCaller(const char* gate, int number) {
    const Caller caller;
    const int first = (number - 1) * CrowdMember::kOwnEntries + 1;
    callAll(gate, [&](int i) {
        caller.call(first + i % CrowdMember::kOwnEntries, i / CrowdMember::kOwnEntries % 2 == 0);
    });
}

/// What the slowest calls of a crowd take, one in a hundred.
double slowCallOf(const char* kind, const std::string& base) {
    const std::string gate = base + "/gate";
    unlink(gate.c_str());
    check(mkfifo(gate.c_str(), 0600) == 0, "mkfifo");
    Foundation::UniqueFD closed(open(gate.c_str(), O_RDWR | O_CLOEXEC));
    std::list<Support::PipedChild> children;
    for (int i = 1; i <= kClients; ++i) {
        children.emplace_back(
            std::vector<std::string>{kProgram, kind, gate, std::to_string(i), base});
        check(children.back().readLine() == "ready", "no client");
    }
    closed.close();
    std::vector<double> times;
    for (Support::PipedChild& child : children) {
        std::istringstream line(child.readLine());
        for (double seconds = 0; line >> seconds;) {
            times.push_back(seconds);
        }
        check(child.wait() == 0, "a client failed");
    }
    check(times.size() == kClients * kCalls, "a call is lost");
    std::sort(times.begin(), times.end());
    return times[times.size() * 99 / 100];
}

void run() {
    const Support::TempDir home;
    const Support::EnvVar data("XDG_DATA_HOME", home.path().c_str());
    const Support::EnvVar config("XDG_CONFIG_HOME", home.path().c_str());
    home.makeDirectory("dbus-1");
    home.makeDirectory("dbus-1/services");
    home.writeFile("dbus-1/services/com.tarnwick.orvane.ipc.service",
                   "[D-BUS Service]\nName=com.tarnwick.orvane.ipc\nExec=" ORVANE_AGENT "\n");
    const Support::PrivateBus bus;
    constexpr int kEntries = kClients * CrowdMember::kOwnEntries;
    Benchmarks::BareEcho::seed(home / "Orvane/Database/Database.sqlite3", kEntries);
    Benchmarks::BareEcho::seed(home / "bare.sqlite3", kEntries);
    Support::PipedChild bare({kProgram, "--serve", home / "bare.sqlite3"});
    check(bare.readLine() == "ready", "no bare side");
    std::vector<double> measured;
    std::vector<double> floor;
    for (int i = 0; i < kRounds; ++i) {
        measured.push_back(slowCallOf("--client", home.path().string()));
        floor.push_back(slowCallOf("--bare", home.path().string()));
    }
    // It may have ended for having nothing to do.
    Foundation::Bus& user = Foundation::Bus::user();
    const auto agent = static_cast<pid_t>(user.getProcessID(Foundation::BusCenter::kAgentName));
    if (agent > 0) kill(agent, SIGTERM);
    const Benchmarks::Comparison slowest{Benchmarks::median(measured), Benchmarks::median(floor)};
    Benchmarks::report("the slowest of 100 calls, of 50 clients", slowest, 1,
                       "the same, sd-bus echo with its commit");
    std::printf("crowd_benchmark %.2f\n", slowest.ratio());
}

}  // namespace

int main(int argc, char** argv) {
    try {
        const std::string mode = argc > 1 ? argv[1] : "";
        if (mode == "--serve") {
            Benchmarks::BareEcho::serve(argv[2]);
        } else if (mode == "--client") {
            beClient(argv[2], std::atoi(argv[3]), argv[4]);
        } else if (mode == "--bare") {
            beBareCaller(argv[2], std::atoi(argv[3]));
        } else {
            run();
        }
    } catch (const std::exception& exception) {
        std::fprintf(stderr, "%s\n", exception.what());
        return 1;
    }
    return 0;
}
