#include "Bridges/ClientDelegates.h"

#include "Foundation/Logger.h"
#include "Model/ClientCore.h"

#include <exception>
#include <memory>
#include <unordered_map>

namespace Orvane {

namespace {

/// Never destroyed: clients may go after everything else.
std::unordered_map<const OVObject*, OVClientDelegate*>& delegates() {
    static auto* const sDelegates = new std::unordered_map<const OVObject*, OVClientDelegate*>;
    return *sDelegates;
}

void report(const char* text) {
    Foundation::gWarn.log("Exception notifying OVClient delegate: %s", text);
}

}  // namespace

OVClientDelegate* ClientDelegates::get(const OVObject* client) {
    const auto found = delegates().find(client);
    return found != delegates().end() ? found->second : nullptr;
}

void ClientDelegates::set(const OVObject* client, OVClientDelegate* delegate) {
    if (delegate) {
        delegates()[client] = delegate;
    } else {
        delegates().erase(client);
    }
}

void ClientDelegates::tell(const ClientCore* row,
                           const std::function<void(OVClientDelegate&)>& call) {
    // An object that is not there has no delegate. One that is must stay while it is told.
    OVObject* object = row ? row->getExistingOVObject() : nullptr;
    const std::shared_ptr<OVObject> client = object ? object->weak_from_this().lock() : nullptr;
    OVClientDelegate* delegate = client ? get(client.get()) : nullptr;
    if (!delegate) return;
    try {
        call(*delegate);
    } catch (const std::exception& exception) {
        report(exception.what());
    } catch (...) {
        report("of an unknown kind");
    }
}

}  // namespace Orvane
