#pragma once

#include "Foundation/BusCenter.h"
#include "Support/PipedChild.h"

#include <systemd/sd-bus.h>

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <stdexcept>
#include <string>

/// A signal of sd-bus with the arguments of a change of rows, from one process to another: what the
/// news of a commit cannot be faster than. The receiver reads the arguments, and does nothing.
namespace Benchmarks {

/// The machine's own time, which is the same in all processes.
inline double machineSeconds() {
    timespec time = {};
    clock_gettime(CLOCK_MONOTONIC, &time);
    return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_nsec) / 1e9;
}

/// Tells the parent that the time runs.
inline void tellStart() {
    std::printf("%.9f\n", machineSeconds());
    std::fflush(stdout);
}

/// The seconds from the time that a child told.
inline double secondsSinceStart(Support::PipedChild& child, double end) {
    const std::string start = child.readLine();
    if (start.empty()) throw std::runtime_error("a child failed");
    return end - std::strtod(start.c_str(), nullptr);
}

/// In a child: whether it is to do once more what it is for.
inline bool isAskedAgain() {
    for (int c = 0; (c = std::getchar()) != '\n';) {
        if (c == EOF) return false;
    }
    return true;
}

class BareSignal {
 public:
    /// In a child: sends the signal to all on the bus at `address`, for so many rows of a table,
    /// whenever it is asked.
    static void serve(const char* address, const char* table, int rows) {
        sd_bus* bus = openBus(address);
        while (isAskedAgain()) {
            tellStart();
            sd_bus_message* message = nullptr;
            check(sd_bus_message_new_signal(bus, &message, Foundation::BusCenter::kPath, kInterface,
                                            kMember));
            append(message, table, rows);
            check(sd_bus_send(bus, message, nullptr));
            sd_bus_message_unref(message);
            check(sd_bus_flush(bus));
        }
        sd_bus_flush_close_unref(bus);
    }

    /// A receiver.
    explicit BareSignal(const std::string& address) : mBus(openBus(address.c_str())) {
        check(sd_bus_match_signal(mBus, nullptr, nullptr, nullptr, kInterface, kMember, receive,
                                  this));
    }
    ~BareSignal() { sd_bus_flush_close_unref(mBus); }
    BareSignal(const BareSignal&) = delete;
    BareSignal& operator=(const BareSignal&) = delete;

    /// The seconds until the signal has come that a child is asked to send.
    double measure(Support::PipedChild& sender, int rows) {
        mEnd = 0;
        sender.writeLine("");
        while (mEnd == 0) {
            if (sd_bus_process(mBus, nullptr) > 0) continue;
            if (sd_bus_wait(mBus, kLongestWait) <= 0) throw std::runtime_error("no signal");
        }
        if (mRows != rows) throw std::runtime_error("rows are missing");
        return secondsSinceStart(sender, mEnd);
    }

 private:
    static constexpr const char* kInterface = "bare.Interface";
    static constexpr const char* kMember = "Posted";
    static constexpr std::uint64_t kLongestWait = 60'000'000;  ///< microseconds

    static void check(int result) {
        if (result < 0) throw std::runtime_error("sd-bus failed");
    }
    static sd_bus* openBus(const char* address) {
        sd_bus* bus = nullptr;
        check(sd_bus_new(&bus));
        check(sd_bus_set_address(bus, address));
        check(sd_bus_set_bus_client(bus, 1));
        check(sd_bus_start(bus));
        // Until the bus has greeted, so that what follows goes out at once.
        const char* name = nullptr;
        check(sd_bus_get_unique_name(bus, &name));
        return bus;
    }
    static void append(sd_bus_message* signal, const char* table, int rows) {
        check(sd_bus_message_append(signal, "ss", "name", "object"));
        check(sd_bus_message_open_container(signal, 'a', "{sv}"));
        check(sd_bus_message_open_container(signal, 'e', "sv"));
        check(sd_bus_message_append_basic(signal, 's', table));
        check(sd_bus_message_open_container(signal, 'v', "a{sv}"));
        check(sd_bus_message_open_container(signal, 'a', "{sv}"));
        for (int row = 1; row <= rows; ++row) {
            check(sd_bus_message_append(signal, "{sv}", std::to_string(row).c_str(), "x",
                                        static_cast<std::int64_t>(23)));
        }
        for (int i = 0; i < 4; ++i) {
            check(sd_bus_message_close_container(signal));
        }
    }
    static int receive(sd_bus_message* message, void* self, sd_bus_error*) {
        auto& that = *static_cast<BareSignal*>(self);
        that.mRows = countRows(message);
        that.mEnd = machineSeconds();
        return 0;
    }
    static int countRows(sd_bus_message* message) {
        int count = 0;
        const char* key = nullptr;
        sd_bus_message_skip(message, "ss");
        sd_bus_message_enter_container(message, 'a', "{sv}");
        sd_bus_message_enter_container(message, 'e', "sv");
        sd_bus_message_read_basic(message, 's', &key);
        sd_bus_message_enter_container(message, 'v', "a{sv}");
        sd_bus_message_enter_container(message, 'a', "{sv}");
        std::int64_t action = 0;
        while (sd_bus_message_read(message, "{sv}", &key, "x", &action) > 0) {
            count += std::atoll(key) > 0 && action == 23 ? 1 : 0;
        }
        return count;
    }

    sd_bus* mBus;
    int mRows = 0;
    double mEnd = 0;
};

}  // namespace Benchmarks
