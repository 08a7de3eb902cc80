#include "Agent/RPC/IPCConnection.h"

#include "Agent/RPC/AgentService.h"
#include "Foundation/Logger.h"
#include "Foundation/NetError.h"
#include "Foundation/NotificationCenter.h"

#include <utility>

namespace Orvane {

using Foundation::gWarn;
using Foundation::NetError;
using Foundation::NotificationCenter;
namespace MachError = Foundation::MachError;

namespace {

/// Statuses of the transport below it have names that nobody outside knows.
constexpr std::int32_t kSmallStatuses = 0x4000000;

}  // namespace

IPCConnection::IPCConnection() {
    try {
        lookupServerPort();
    } catch (...) {
        Foundation::warnAboutCurrentException("Orvane::IPCClient::IPCClient()");
    }
}

bool IPCConnection::listenForAgentDeath() {
    if (mServerPort != 0) return true;
    try {
        lookupServerPort();
    } catch (...) {
        Foundation::warnAboutCurrentException("bool Orvane::IPCClient::listenForAgentDeath()");
        return false;
    }
    return true;
}

void IPCConnection::lookupServerPort() {
    gLogIPC.log("Looking up the agent's Mach port");
    const std::uint32_t old = std::exchange(mServerPort, 0);
    RPC::AgentService& service = RPC::AgentService::instance();
    check(service.lookUp(mServerPort));
    gLogIPC.log("Got agent Mach port: %u", mServerPort);
    if (mServerPort == old) return;
    if (!std::exchange(mHasDeathSource, true)) {
        service.setDeathHandler([this](std::uint32_t port) { _serverPortDied(port); });
    }
    if (!service.isWatching()) {
        gWarn.log("IPCClient: mach_port_request_notification returned %@",
                  NetError(NetError::kMach, MachError::kServerDied));
    }
}

void IPCConnection::_serverPortDied(std::uint32_t port) {
    gLogIPC.log("Agent's Mach port died -- presumably Agent died too");
    NotificationCenter::getLocal()->post(kAgentDiedNotification, nullptr, nullptr);
    // Who heard of it may have called the next agent by now.
    if (mServerPort == port) mServerPort = 0;
}

bool IPCConnection::retry(std::int32_t status) {
    if (status == MachError::kInvalidDestination) {
        gWarn.log("IPCClient: Server port %u is invalid; looking it up again...", mServerPort);
        lookupServerPort();
        return true;
    }
    if (status == 0) {
        mBusy = false;
    } else {
        check(status);
    }
    return false;
}

void IPCConnection::check(std::int32_t status) {
    if (status == 0) return;
    NetError error = NetError::unwrapMachError(status);
    gWarn.log("IPC call returned %@ (Mach error %x)", error, static_cast<std::uint32_t>(status));
    if (error.domain == NetError::kMach && error.code < kSmallStatuses) {
        const bool isUnknown = error.code == MachError::kUnknownService;
        error = {NetError::kOrvane, isUnknown ? OVAgentLaunchError : OVIPCError};
    }
    error.throwException();
}

}  // namespace Orvane
