#include "Foundation/BusSubscriptions.h"
#include "Foundation/Guard.h"

#include <set>
#include <utility>

// Calls of methods that others make here.

namespace Foundation {

namespace {

constexpr const char* kUnknownObject = "org.freedesktop.DBus.Error.UnknownObject";
constexpr const char* kFailed = "org.freedesktop.DBus.Error.Failed";
constexpr const char* kIntrospectable = "org.freedesktop.DBus.Introspectable";

bool isIntrospection(const BusMessage& call) {
    return call.getInterface() == kIntrospectable && call.getMember() == "Introspect" &&
           call.getSignature().empty();
}

}  // namespace

BusSubscriptionPtr Bus::handleCalls(const std::string& path, CallHandler handler) {
    auto subscription = std::make_shared<Subscription>();
    subscription->path = path;
    subscription->callHandler = std::move(handler);
    return add(std::move(subscription));
}

void Bus::dispatchCall(BusMessage& call) {
    const std::string path = call.getPath();
    for (const auto& [id, subscription] : mSubscriptions) {
        if (!subscription->callHandler || subscription->path != path) continue;
        // Kept, for the handler may end it.
        const std::shared_ptr<Subscription> taker = subscription;
        callGuarded("void Foundation::Bus::dispatchCall(BusMessage &)", [&] {
            try {
                taker->callHandler(call);
            } catch (...) {
                replyError(call, kFailed, "The call failed");
                throw;
            }
        });
        return;
    }
    const std::string below = isIntrospection(call) ? describeBelow(path) : std::string();
    if (below.empty()) return replyError(call, kUnknownObject, "There is no such object");
    BusMessage reply = call.newReply();
    send(reply.append(below));
}

void Bus::replyError(const BusMessage& call, const char* name, const std::string& text) {
    if (call.expectsReply()) BusConnection::replyError(call, name, text.c_str());
}

std::string Bus::describeBelow(const std::string& path) const {
    const std::string prefix = path == "/" ? path : path + "/";
    std::set<std::string> children;
    for (const auto& [id, subscription] : mSubscriptions) {
        if (!subscription->path.starts_with(prefix)) continue;
        const std::string rest = subscription->path.substr(prefix.size());
        children.insert(rest.substr(0, rest.find('/')));
    }
    if (children.empty()) return {};
    std::string text = "<node>\n";
    for (const std::string& child : children) {
        text += " <node name=\"" + child + "\"/>\n";
    }
    return text + "</node>\n";
}

}  // namespace Foundation
