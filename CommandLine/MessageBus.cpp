#include "MessageBus.h"

#include <gio/gio.h>
#include <unistd.h>

#include <cstdlib>
#include <vector>

namespace Commands {

namespace {

constexpr int kTimeOutMilliseconds = 5000;

std::string runtimeDirectory() {
    const char* set = std::getenv("XDG_RUNTIME_DIR");
    return set && set[0] == '/' ? set : "/tmp/orvane-" + std::to_string(geteuid());
}

std::string addressOf(const std::string& socket) {
    const std::unique_ptr<char, decltype(&g_free)> escaped(
        g_dbus_address_escape_value(socket.c_str()), g_free);
    return std::string("unix:path=") + escaped.get();
}

std::vector<std::string> addresses() {
    std::vector<std::string> all;
    const char* set = std::getenv("DBUS_SESSION_BUS_ADDRESS");
    if (set && set[0]) all.emplace_back(set);
    all.push_back(addressOf(runtimeDirectory() + "/bus"));
    all.push_back(addressOf(runtimeDirectory() + "/Orvane/bus"));
    return all;
}

GDBusConnection* connect() {
    const auto flags =
        static_cast<GDBusConnectionFlags>(G_DBUS_CONNECTION_FLAGS_AUTHENTICATION_CLIENT |
                                          G_DBUS_CONNECTION_FLAGS_MESSAGE_BUS_CONNECTION);
    for (const std::string& address : addresses()) {
        GDBusConnection* bus = g_dbus_connection_new_for_address_sync(address.c_str(), flags,
                                                                      nullptr, nullptr, nullptr);
        if (bus) return bus;
    }
    return nullptr;
}

using Answer = std::unique_ptr<GVariant, decltype(&g_variant_unref)>;

}  // namespace

struct MessageBus::Connection {
    explicit Connection(GDBusConnection* opened) : bus(opened) {}
    ~Connection() {
        if (bus) g_object_unref(bus);
    }
    Connection(const Connection&) = delete;
    Connection& operator=(const Connection&) = delete;

    /// Takes the parameters. Null if there is no answer.
    Answer call(const char* service, const char* path, const char* interface, const char* method,
                GVariant* parameters, const char* type) const {
        return {g_dbus_connection_call_sync(bus, service, path, interface, method, parameters,
                                            G_VARIANT_TYPE(type), G_DBUS_CALL_FLAGS_NO_AUTO_START,
                                            kTimeOutMilliseconds, nullptr, nullptr),
                g_variant_unref};
    }
    Answer callBus(const char* method, GVariant* parameters, const char* type) const {
        return call("org.freedesktop.DBus", "/org/freedesktop/DBus", "org.freedesktop.DBus", method,
                    parameters, type);
    }

    GDBusConnection* bus;
};

MessageBus::MessageBus() : mConnection(std::make_unique<Connection>(connect())) {}

MessageBus::~MessageBus() = default;

bool MessageBus::isThere() const {
    return mConnection->bus != nullptr;
}

bool MessageBus::hasOwner(const std::string& name) const {
    if (!isThere()) return false;
    const Answer answer =
        mConnection->callBus("NameHasOwner", g_variant_new("(s)", name.c_str()), "(b)");
    gboolean isOwned = FALSE;
    if (answer) g_variant_get(answer.get(), "(b)", &isOwned);
    return isOwned == TRUE;
}

bool MessageBus::canStart(const std::string& name) const {
    if (!isThere()) return false;
    const Answer answer = mConnection->callBus("ListActivatableNames", nullptr, "(as)");
    if (!answer) return false;
    GVariantIter* names = nullptr;
    g_variant_get(answer.get(), "(as)", &names);
    const char* each = nullptr;
    bool isFound = false;
    while (g_variant_iter_next(names, "&s", &each)) {
        isFound = isFound || name == each;
    }
    g_variant_iter_free(names);
    return isFound;
}

std::optional<bool> MessageBus::flag(const std::string& service, const std::string& path,
                                     const std::string& interface,
                                     const std::string& property) const {
    if (!isThere()) return std::nullopt;
    const Answer answer =
        mConnection->call(service.c_str(), path.c_str(), "org.freedesktop.DBus.Properties", "Get",
                          g_variant_new("(ss)", interface.c_str(), property.c_str()), "(v)");
    if (!answer) return std::nullopt;
    GVariant* boxed = nullptr;
    g_variant_get(answer.get(), "(v)", &boxed);
    const Answer value(boxed, g_variant_unref);
    if (!g_variant_is_of_type(boxed, G_VARIANT_TYPE_BOOLEAN)) return std::nullopt;
    return g_variant_get_boolean(boxed) == TRUE;
}

}  // namespace Commands
