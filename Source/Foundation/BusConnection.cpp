#include "Foundation/BusConnection.h"

#include "Foundation/Logger.h"

#include <poll.h>
#include <systemd/sd-bus.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <ctime>

namespace Foundation {

namespace {

/// Beyond this the library's queue gets slow, so a sender waits for the bus instead.
constexpr std::uint64_t kManyQueued = 4096;
constexpr double kCongestionSeconds = 5;
/// How many messages one round of waiting for the bus takes in.
constexpr unsigned kMessagesPerRound = 64;

double monotonicSeconds() {
    std::timespec now;
    clock_gettime(CLOCK_MONOTONIC, &now);
    return static_cast<double>(now.tv_sec) + static_cast<double>(now.tv_nsec) * 1e-9;
}

std::uint64_t microseconds(double seconds) {
    return static_cast<std::uint64_t>(std::max(seconds, 0.0) * 1e6);
}

int start(sd_bus* bus, const std::string& address) {
    int result = sd_bus_set_address(bus, address.c_str());
    if (result >= 0) result = sd_bus_set_bus_client(bus, 1);
    if (result >= 0) result = sd_bus_negotiate_fds(bus, 1);
    return result >= 0 ? sd_bus_start(bus) : result;
}

}  // namespace

std::unique_ptr<BusConnection> BusConnection::open(const std::string& address, std::string& error) {
    sd_bus* bus = nullptr;
    int result = sd_bus_new(&bus);
    std::unique_ptr<BusConnection> connection(new BusConnection(bus));
    if (result >= 0) result = start(bus, address);
    const char* name = nullptr;
    if (result >= 0) result = sd_bus_get_unique_name(bus, &name);
    if (result < 0) {
        error = std::strerror(-result);
        return nullptr;
    }
    connection->mUniqueName = name;
    return connection;
}

BusConnection::~BusConnection() {
    // Without waiting: what a bus that hangs has not taken is lost with the connection.
    sd_bus_close_unref(mBus);
}

bool BusConnection::isOpen() const {
    return sd_bus_is_open(mBus) > 0;
}

void BusConnection::getInterest(int& fd, short& events, std::int64_t& deadline) const {
    fd = sd_bus_get_fd(mBus);
    const int wanted = sd_bus_get_events(mBus);
    std::uint64_t until = UINT64_MAX;
    const int timed = sd_bus_get_timeout(mBus, &until);
    if (fd < 0 || wanted < 0 || timed < 0) {
        // It has broken, which `pump` is to find at once.
        fd = -1;
        deadline = 0;
        return;
    }
    events = static_cast<short>(wanted);
    deadline = until > INT64_MAX ? -1 : static_cast<std::int64_t>(until);
}

void BusConnection::pump(unsigned limit, Messages& into) {
    for (unsigned count = 0; count < limit;) {
        sd_bus_message* message = nullptr;
        const int result = sd_bus_process(mBus, &message);
        if (message) {
            into.emplace_back(message);
            ++count;
        }
        // Whatever the failure is, a stream that can't be read on is of no more use.
        if (result < 0) sd_bus_close(mBus);
        if (result <= 0) return;
    }
}

BusMessage BusConnection::newCall(const BusMethod& method) {
    sd_bus_message* message = nullptr;
    sd_bus_message_new_method_call(mBus, &message, method.destination, method.path,
                                   method.interface, method.member);
    return BusMessage(message);
}

BusMessage BusConnection::newSignal(const char* path, const char* interface, const char* member) {
    sd_bus_message* message = nullptr;
    sd_bus_message_new_signal(mBus, &message, path, interface, member);
    return BusMessage(message);
}

bool BusConnection::send(BusMessage& message, Messages& into) {
    std::uint64_t queued = 0;
    sd_bus_get_n_queued_write(mBus, &queued);
    if (queued >= kManyQueued) flush(kCongestionSeconds, into);
    int result = message.isValid() ? sd_bus_send(mBus, message.get(), nullptr) : -EINVAL;
    if (result == -ENOBUFS && flush(kCongestionSeconds, into)) {
        result = sd_bus_send(mBus, message.get(), nullptr);
    }
    if (result >= 0) return true;
    gWarn.log("Can't send %s to the message bus: %s", message.getMember(), std::strerror(-result));
    return false;
}

bool BusConnection::flush(double seconds, Messages& into) {
    const double deadline = monotonicSeconds() + seconds;
    while (isOpen()) {
        std::uint64_t queued = 0;
        sd_bus_get_n_queued_write(mBus, &queued);
        if (queued == 0) return true;
        pump(kMessagesPerRound, into);
        const double left = deadline - monotonicSeconds();
        if (left <= 0) return false;
        // Reading too, for a bus may wait for us to read before it reads on.
        pollfd wanted = {sd_bus_get_fd(mBus), POLLIN | POLLOUT, 0};
        poll(&wanted, 1, static_cast<int>(left * 1000) + 1);
    }
    return false;
}

BusMessage BusConnection::call(BusMessage& message, double timeoutSeconds) {
    if (!message.isValid()) {
        return BusMessage::failure(SD_BUS_ERROR_INVALID_ARGS, "The call can't be put together");
    }
    sd_bus_error error = SD_BUS_ERROR_NULL;
    sd_bus_message* reply = nullptr;
    const int result =
        sd_bus_call(mBus, message.get(), microseconds(timeoutSeconds), &error, &reply);
    BusMessage answer(reply);
    if (result < 0) {
        answer = BusMessage::failure(error.name ? error.name : SD_BUS_ERROR_FAILED,
                                     error.message ? error.message : std::strerror(-result));
    }
    sd_bus_error_free(&error);
    return answer;
}

void BusConnection::replyError(const BusMessage& call, const char* name, const char* text) {
    sd_bus_error error = SD_BUS_ERROR_NULL;
    sd_bus_error_set_const(&error, name, text);
    sd_bus_reply_method_error(call.get(), &error);
}

}  // namespace Foundation
