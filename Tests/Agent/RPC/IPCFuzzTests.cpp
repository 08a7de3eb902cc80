// Anything that a program on the bus may send: nothing of it ends the agent, or stays in its
// memory.

#include "Agent/RPC/AgentFixture.h"
#include "Foundation/Bus.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <fstream>
#include <random>

using namespace Foundation;
using namespace Orvane;

namespace {

class IPCFuzz : public AgentFixture {
 protected:
    int below(int limit) { return std::uniform_int_distribution<int>(0, limit - 1)(random); }

    std::int64_t number() {
        constexpr std::int64_t kSpecial[] = {0, -1, INT64_MAX, INT64_MIN, INT32_MAX, 1LL << 32};
        return below(3) == 0 ? kSpecial[below(6)] : below(25);
    }
    std::string text() {
        static const char* const kTexts[] = {
            "",      "Render", "content", "summary", "http://example.org/1", "file:///etc/passwd",
            "feed:", "%s%n%@"};
        if (below(2) == 0) return kTexts[below(8)];
        return std::string(static_cast<std::size_t>(below(400)), 'x');
    }
    std::vector<std::uint8_t> anyBytes() {
        std::vector<std::uint8_t> all(static_cast<std::size_t>(below(50)));
        for (std::uint8_t& byte : all) {
            byte = static_cast<std::uint8_t>(below(256));
        }
        return all;
    }
    void appendBytes(BusMessage& message) {
        if (below(2) == 0) {
            const std::string some = text();
            message.append(bytes(some));
        } else {
            message.append(std::span<const std::uint8_t>(anyBytes()));
        }
    }
    /// A value of one of the forms that routines have.
    void append(BusMessage& message, const std::string& form) {
        if (form == "x") {
            message.append(number());
        } else if (form == "i") {
            message.append(static_cast<std::int32_t>(number()));
        } else if (form == "t") {
            message.append(static_cast<std::uint64_t>(number()));
        } else if (form == "y") {
            message.append(static_cast<std::uint8_t>(below(3)));
        } else if (form == "b") {
            message.append(below(2) == 0);
        } else if (form == "s") {
            message.append(text());
        } else if (form == "ay") {
            appendBytes(message);
        } else {
            std::vector<std::int64_t> rows(static_cast<std::size_t>(below(30)));
            for (std::int64_t& row : rows) {
                row = number();
            }
            message.append(std::span<const std::int64_t>(rows));
        }
    }
    /// A value of any form.
    void appendAny(BusMessage& message, int depth) {
        static const char* const kForms[] = {"x", "i", "t", "y", "b", "s", "ay", "ax"};
        const int kind = depth > 8 ? 0 : below(12);
        if (kind == 8) {
            message.open('v', "s").append(text()).close();
        } else if (kind == 9) {
            message.open('a', "{sv}").close();
        } else if (kind == 10) {
            message.open('r', "sx").append(text()).append(number()).close();
        } else if (kind == 11) {
            message.append(1.5);
        } else {
            append(message, kForms[kind % 8]);
        }
    }
    void send(const RPC::Routine& routine) {
        BusMessage call = Bus::user().newCall(
            {RPC::kServiceName, RPC::kObjectPath, RPC::kInterface, routine.name});
        const bool isWellFormed = below(3) != 0;
        for (const RPC::Parameter& argument : routine.arguments) {
            if (!argument.name) break;
            if (isWellFormed || below(3) == 0) {
                append(call, argument.form);
            } else {
                appendAny(call, 0);
            }
        }
        if (!isWellFormed && below(2) == 0) appendAny(call, 0);
        if (call.isValid()) Bus::user().call(call, 60);
    }
    /// Nothing under the address sanitizer, which keeps what is freed for a while.
    static long residentKB([[maybe_unused]] pid_t process) {
#ifdef __SANITIZE_ADDRESS__
        return 0;
#else
        std::ifstream file("/proc/" + std::to_string(process) + "/statm");
        long all = 0;
        long resident = 0;
        file >> all >> resident;
        return resident * 4;
#endif
    }

    const unsigned seed = std::random_device()();
    std::mt19937 random{seed};
};

}  // namespace

TEST_F(IPCFuzz, LeavesTheAgentRunningAndItsMemoryFlat) {
    SCOPED_TRACE(seed);
    const int count = std::getenv("ORVANE_SLOW_TESTS") ? 100'000 : 5'000;
    client().startSkerrySync();
    const pid_t running = agent();
    const auto routines = RPC::allRoutines();
    long before = 0;
    for (int i = 0; i < count; ++i) {
        // What it keeps for good, such as prepared statements and rows, is there after a while.
        if (i == count / 2) before = residentKB(running);
        send(*routines[static_cast<std::size_t>(i) % routines.size()]);
    }
    ASSERT_EQ(agent(), running);
    client().startSkerrySync();
    EXPECT_LT(residentKB(running) - before, 4096);
}
