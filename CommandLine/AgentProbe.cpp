#include "AgentProbe.h"

#include <gio/gio.h>
#include <unistd.h>

#include <cstdlib>
#include <memory>
#include <string>
#include <vector>

namespace Commands {

namespace {

constexpr const char* kAgent = "com.tarnwick.orvane.ipc";
constexpr int kTimeOutMilliseconds = 5000;

template <class T>
using Held = std::unique_ptr<T, decltype(&g_object_unref)>;

std::string runtimeDirectory() {
    const char* set = std::getenv("XDG_RUNTIME_DIR");
    return set && set[0] == '/' ? set : "/tmp/orvane-" + std::to_string(geteuid());
}

std::string addressOf(const std::string& socket) {
    char* escaped = g_dbus_address_escape_value(socket.c_str());
    const std::string address = std::string("unix:path=") + escaped;
    g_free(escaped);
    return address;
}

/// Where the user's bus may be: the session's, the service manager's, and the one that the library
/// starts where there is neither.
std::vector<std::string> addresses() {
    std::vector<std::string> all;
    const char* set = std::getenv("DBUS_SESSION_BUS_ADDRESS");
    if (set && set[0]) all.emplace_back(set);
    all.push_back(addressOf(runtimeDirectory() + "/bus"));
    all.push_back(addressOf(runtimeDirectory() + "/Orvane/bus"));
    return all;
}

Held<GDBusConnection> connect(const std::string& address) {
    const auto flags =
        static_cast<GDBusConnectionFlags>(G_DBUS_CONNECTION_FLAGS_AUTHENTICATION_CLIENT |
                                          G_DBUS_CONNECTION_FLAGS_MESSAGE_BUS_CONNECTION);
    return {
        g_dbus_connection_new_for_address_sync(address.c_str(), flags, nullptr, nullptr, nullptr),
        g_object_unref};
}

bool hasAgent(GDBusConnection* bus) {
    GVariant* answer = g_dbus_connection_call_sync(
        bus, "org.freedesktop.DBus", "/org/freedesktop/DBus", "org.freedesktop.DBus",
        "NameHasOwner", g_variant_new("(s)", kAgent), G_VARIANT_TYPE("(b)"), G_DBUS_CALL_FLAGS_NONE,
        kTimeOutMilliseconds, nullptr, nullptr);
    if (!answer) return false;
    gboolean isOwned = FALSE;
    g_variant_get(answer, "(b)", &isOwned);
    g_variant_unref(answer);
    return isOwned == TRUE;
}

}  // namespace

AgentProbe::State AgentProbe::look() {
    for (const std::string& address : addresses()) {
        const Held<GDBusConnection> bus = connect(address);
        if (bus) return hasAgent(bus.get()) ? State::Runs : State::Stopped;
    }
    return State::NoBus;
}

}  // namespace Commands
