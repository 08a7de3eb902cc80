#include "Agent/UserServiceManager.h"

#include "Foundation/ArrayOf.h"
#include "Foundation/Bus.h"
#include "Foundation/BusCenter.h"
#include "Foundation/Clock.h"
#include "Foundation/DictionaryOf.h"
#include "Foundation/Logger.h"
#include "Foundation/Number.h"
#include "Foundation/String.h"

#include <systemd/sd-daemon.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <ctime>
#include <fstream>
#include <limits>
#include <string_view>

namespace Orvane {

using namespace Foundation;

namespace {

constexpr const char* kService = "org.freedesktop.systemd1";
constexpr const char* kErrorPrefix = "org.freedesktop.systemd1.";
constexpr std::uint64_t kMicroseconds = 1000000;
/// The timer need not be more exact, so that the machine can wake up for several things at once.
constexpr std::uint64_t kAccuracyMicroseconds = kMicroseconds;

BusMethod managerMethod(const char* member) {
    return {.destination = kService,
            .path = "/org/freedesktop/systemd1",
            .interface = "org.freedesktop.systemd1.Manager",
            .member = member,
            .timeoutSeconds = UserServiceManager::kTimeoutSeconds};
}

bool isError(const BusMessage& reply, std::string_view name) {
    return reply.getErrorName() == std::string(kErrorPrefix).append(name);
}

/// Whether the environment names this process in a variable that its children inherit.
bool namesThisProcess(const char* variable) {
    const char* value = std::getenv(variable);
    return value && std::to_string(getpid()) == value;
}

/// Empty for an answer without.
std::string getObjectPath(BusMessage reply) {
    const char* path = nullptr;
    return reply.isValid() && reply.readBasic('o', &path) ? path : std::string();
}

std::string getParentName() {
    std::ifstream file("/proc/" + std::to_string(getppid()) + "/comm");
    std::string name;
    std::getline(file, name);
    return name;
}

/// Opens a property "name, value" of a unit; the value is a variant of `type`.
BusMessage& openProperty(BusMessage& message, const char* name, const char* type) {
    return message.open('r', "sv").append(name).open('v', type);
}

BusMessage& closeProperty(BusMessage& message) {
    return message.close().close();
}

/// As the manager reads dates; empty for one that it does not, as those beyond 2199.
std::string getCalendarText(std::uint64_t seconds) {
    constexpr std::uint64_t kMost = 7226582400;  // 2199-01-01
    const double now = Clock::current().now() + kUnixEpochOffset;
    if (now < 0 || seconds > kMost || now + static_cast<double>(seconds) > double{kMost}) return {};
    const auto date = static_cast<std::time_t>(now + static_cast<double>(seconds));
    std::tm fields = {};
    gmtime_r(&date, &fields);
    char text[sizeof "2199-01-01 00:00:00 UTC"];
    const std::size_t length = std::strftime(text, sizeof text, "%Y-%m-%d %H:%M:%S UTC", &fields);
    return std::string(text, length);
}

/// The call that makes a timer, with the service of the same stem, that is due `seconds` from now.
///
/// The date counts the time that the machine sleeps; the span is there for a clock that is set
/// back. Whichever comes first starts the service, and the other, if it comes at all, finds it
/// running: the date is never the later one, for it is cut to a whole second.
BusMessage newTimerCall(const std::string& timer, std::uint64_t seconds) {
    BusMessage call = Bus::user().newCall(managerMethod("StartTransientUnit"));
    call.append(timer).append("replace").open('a', "(sv)");
    closeProperty(openProperty(call, "Description", "s").append("Next work of Orvane's agent"));
    openProperty(call, "TimersMonotonic", "a(st)").open('a', "(st)").open('r', "st");
    call.append("OnActiveSec").append(seconds * kMicroseconds).close().close();
    closeProperty(call);
    if (const std::string date = getCalendarText(seconds); !date.empty()) {
        openProperty(call, "TimersCalendar", "a(ss)").open('a', "(ss)").open('r', "ss");
        call.append("OnCalendar").append(date).close().close();
        closeProperty(call);
    }
    closeProperty(openProperty(call, "AccuracyUSec", "t").append(kAccuracyMicroseconds));
    closeProperty(openProperty(call, "RemainAfterElapse", "b").append(false));
    call.close().open('a', "(sa(sv))").close();
    return call;
}

/// The timer that waits, if there is one, ends in the manager's own time behind the answer; until
/// then another of its name cannot be made.
int replaceTimer(const std::string& timer, std::uint64_t seconds) {
    Bus& bus = Bus::user();
    const BusMessage stopped = bus.callMethod(managerMethod("StopUnit"), timer, "replace");
    if (!stopped.isValid() && !isError(stopped, "NoSuchUnit")) return EIO;
    for (int i = 0; i < UserServiceManager::kTimerTries; ++i) {
        BusMessage call = newTimerCall(timer, seconds);
        const BusMessage started = bus.call(call, UserServiceManager::kTimeoutSeconds);
        if (started.isValid()) return 0;
        if (!isError(started, "UnitExists")) {
            gLogIPC.log("%s: %s", timer, started.getErrorText());
            return EIO;
        }
        Clock::current().sleep(UserServiceManager::kTimerRetrySeconds);
    }
    return EEXIST;
}

/// From each name to its descriptors, in the order in which they came.
Ref<Dictionary> makeSockets(const std::vector<std::pair<std::string, int>>& descriptors) {
    Ref<MutableDictionaryOf<String, PFRefCounted>> sockets{
        MutableDictionaryOf<String, PFRefCounted>::dictionary()};
    for (const auto& [name, descriptor] : descriptors) {
        const Ref<Number> number = Number::number(descriptor);
        if (auto* known = sockets->getAs<MutableArrayOf<Number>>(name)) {
            known->add(number);
            continue;
        }
        const Ref<String> key = String::string(name);
        const Ref<MutableArrayOf<Number>> array = MutableArrayOf<Number>::array();
        array->add(number);
        sockets->set(key, array);
    }
    return sockets;
}

/// The sockets that this process was given; below 0 for an `errno`. They are closed in programs
/// that it starts, which do not hear of them either.
int takeSockets(std::vector<std::pair<std::string, int>>& descriptors) {
    char** names = nullptr;
    const int count = sd_listen_fds_with_names(1, &names);
    for (int i = 0; i < count; ++i) {
        descriptors.emplace_back(names[i], SD_LISTEN_FDS_START + i);
        std::free(names[i]);
    }
    std::free(names);
    return count;
}

}  // namespace

bool UserServiceManager::isUnit() {
    return namesThisProcess("SYSTEMD_EXEC_PID");
}

bool UserServiceManager::hasInheritedSockets() {
    return namesThisProcess("LISTEN_PID");
}

/// The variable is inherited by all that a service starts, such as a terminal and what runs in it.
bool UserServiceManager::wasStartedByBus() {
    return std::getenv("DBUS_STARTER_ADDRESS") && getParentName() == "dbus-daemon";
}

bool UserServiceManager::isManaged() {
    return isUnit() || hasInheritedSockets() || wasStartedByBus();
}

ServiceManager::Reply UserServiceManager::checkIn() {
    const bool hasService = isUnit() || wasStartedByBus();
    std::vector<std::pair<std::string, int>> descriptors;
    const int count = takeSockets(descriptors);
    if (count < 0) return {.type = Reply::kError, .error = -count};
    const Ref<MutableDictionaryOf<String, PFRefCounted>> reply =
        MutableDictionaryOf<String, PFRefCounted>::dictionary();
    if (!descriptors.empty()) {
        const Ref<String> key = String::string(kSockets);
        const Ref<Dictionary> sockets = makeSockets(descriptors);
        reply->set(key, sockets);
    }
    if (hasService) {
        const Ref<String> name = String::string(BusCenter::kAgentName);
        const Ref<Number> port = Number::number(1);
        const Ref<Dictionary> services = DictionaryOf<String, Number>::dictionary({{name, port}});
        const Ref<String> key = String::string(kServices);
        reply->set(key, services);
    }
    return {.type = Reply::kDictionary, .dictionary = reply};
}

/// As the manager itself says, since what a cgroup's path tells depends on where the manager's own
/// begins.
std::string UserServiceManager::getUnitStem() {
    constexpr std::string_view kSuffix = ".service";
    Bus& bus = Bus::user();
    const auto ourselves = static_cast<std::uint32_t>(getpid());
    const BusMessage found = bus.callMethod(managerMethod("GetUnitByPID"), ourselves);
    const std::string path = getObjectPath(found);
    if (path.empty()) return {};
    BusMessage answer = bus.callMethod({.destination = kService,
                                        .path = path.c_str(),
                                        .interface = "org.freedesktop.DBus.Properties",
                                        .member = "Get",
                                        .timeoutSeconds = kTimeoutSeconds},
                                       "org.freedesktop.systemd1.Unit", "Id");
    std::string unit;
    if (!answer.isValid() || !answer.enter('v', "s") || !answer.read(unit)) return {};
    if (!unit.ends_with(kSuffix)) return {};
    unit.resize(unit.size() - kSuffix.size());
    return unit;
}

int UserServiceManager::setStartInterval(std::int64_t seconds) {
    if (!isUnit()) return EOPNOTSUPP;
    const std::string stem = getUnitStem();
    if (stem.empty()) return ENXIO;
    constexpr std::uint64_t kMost = std::numeric_limits<std::int64_t>::max() / kMicroseconds;
    const std::uint64_t bounded =
        std::min(kMost, static_cast<std::uint64_t>(std::max<std::int64_t>(0, seconds)));
    return replaceTimer(stem + ".timer", bounded);
}

}  // namespace Orvane
