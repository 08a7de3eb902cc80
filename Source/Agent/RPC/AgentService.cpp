#include "Agent/RPC/AgentService.h"

#include "Foundation/Logger.h"
#include "Foundation/NetError.h"

#include <utility>

std::int32_t gOrvaneIPCTimeoutMS = 30000;

namespace Orvane::RPC {

using Foundation::Bus;
using Foundation::BusMessage;
namespace MachError = Foundation::MachError;

namespace {

constexpr const char* kErrorPrefix = "org.freedesktop.DBus.Error.";
/// Of what the service manager says where it is to start the agent.
constexpr const char* kManagerPrefix = "org.freedesktop.systemd1.";

double timeoutSeconds() {
    return gOrvaneIPCTimeoutMS / 1000.0;
}

}  // namespace

AgentService& AgentService::instance() {
    // Never destroyed: objects that end with the process make calls.
    static auto* const sService = new AgentService;
    return *sService;
}

void AgentService::watch() {
    if (mWatch) return;
    mWatch = Bus::user().watchName(
        kServiceName, [this](const std::string&, const std::string& oldOwner,
                             const std::string& newOwner) { ownerChanged(oldOwner, newOwner); });
}

bool AgentService::isWatching() const {
    return Bus::user().isWatching(kServiceName);
}

std::int32_t AgentService::lookUp(std::uint32_t& port) {
    watch();
    Bus& bus = Bus::user();
    const std::string owner = bus.getNameOwner(kServiceName);
    if (owner.empty() && !bus.canStart(kServiceName)) return MachError::kUnknownService;
    // One that is to be started is the same until it has been.
    if (mPort == 0 || owner != mOwner) {
        setOwner(owner);
        mPort = ++mLastPort;
    }
    port = mPort;
    return 0;
}

void AgentService::setOwner(const std::string& owner) {
    if (owner == mOwner) return;
    if (!mOwner.empty()) mLeft.insert(mOwner);
    mOwner = owner;
}

void AgentService::ownerChanged(const std::string& oldOwner, const std::string& newOwner) {
    const bool isOurs = !oldOwner.empty() && oldOwner == mOwner;
    if (isOurs || mLeft.erase(oldOwner) > 0) {
        const std::uint32_t port = isOurs ? std::exchange(mPort, 0) : 0;
        if (isOurs) mOwner.clear();
        if (mDeathHandler) mDeathHandler(port);
    }
    // Started for a request of ours that was not answered, or for somebody else's.
    if (mPort != 0 && mOwner.empty()) mOwner = newOwner;
}

BusMessage AgentService::newRequest(std::uint32_t port, const char* routine) {
    if (port == 0 || port != mPort) return {};
    return Bus::user().newCall({kServiceName, kObjectPath, kInterface, routine});
}

std::int32_t AgentService::send(std::uint32_t port, BusMessage& request, BusMessage& reply) {
    Bus& bus = Bus::user();
    if (port == 0 || port != mPort || !bus.isConnected()) return MachError::kInvalidDestination;
    const bool mayStart = mOwner.empty();
    if (!mayStart) request.withoutStart();
    // Nothing of it has left this process then.
    if (!request.isValid()) return MachError::kBadArguments;
    reply = bus.call(request, timeoutSeconds());
    if (!reply.isValid()) return statusOf(reply, mayStart);
    setOwner(reply.getSender());
    return 0;
}

std::int32_t AgentService::statusOf(const BusMessage& reply, bool mayStart) const {
    std::string name = reply.getErrorName();
    gLogIPC.log("AgentService: %s: %s", name, reply.getErrorText());
    if (name.starts_with(kManagerPrefix)) return MachError::kUnknownService;
    if (!name.starts_with(kErrorPrefix)) return MachError::kServerDied;
    name.erase(0, std::string_view(kErrorPrefix).size());
    if (name == "NameHasNoOwner" || name == "ServiceUnknown") {
        return mayStart ? MachError::kUnknownService : MachError::kInvalidDestination;
    }
    // The bus has not got it started, and so has not delivered anything.
    if (name.starts_with("Spawn.")) return MachError::kUnknownService;
    if (name == "Timeout" || name == "TimedOut") return MachError::kReceiveTimedOut;
    if (name == "UnknownMethod" || name == "UnknownInterface" || name == "UnknownObject") {
        return MachError::kUnknownRoutine;
    }
    if (name == "InvalidArgs") return MachError::kBadArguments;
    return MachError::kServerDied;
}

void AgentService::_forget() {
    mWatch = nullptr;
    mPort = 0;
    mOwner.clear();
    mLeft.clear();
}

}  // namespace Orvane::RPC
