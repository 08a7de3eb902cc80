#include "Foundation/NetworkConfig.h"

#include "Foundation/Guard.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/RunLoop.h"
#include "Foundation/SystemNetworkStore.h"

#include <algorithm>

namespace Foundation {

namespace {

/// Of the domain `kPFURL`: not connected to the internet, look-up failed, connection lost, can't
/// connect to the host, can't find the host, timed out; and the codes of the layer below, host not
/// found, look-up failed, connection lost.
constexpr std::int32_t kCurableURLErrors[] = {-1009, -1006, -1005, -1004, -1003, -1001, 1, 2, 302};

}  // namespace

void NetworkConfig::start() {
    // Never destroyed: other objects that end with the process may still look at its notification.
    [[maybe_unused]] static const auto* const sInstance =
        new NetworkConfig(SystemNetworkStore::open);
}

NetworkConfig::NetworkConfig(const NetworkStore::Opener& open)
    : mPostTimer(this, &NetworkConfig::_sendNotification) {
    if (listen(open)) gLog.log("NetworkConfig is listening");
}

bool NetworkConfig::listen(const NetworkStore::Opener& open) {
    mStore =
        open(kClientName, [this](const NetworkStore::Keys& keys) { _networkChangeCallBack(keys); });
    if (!mStore) {
        gWarn.log("NetworkConfig: PFNetworkStoreCreate() failed");
        return false;
    }
    mRunLoopSource = mStore->createRunLoopSource();
    if (!mRunLoopSource) {
        gWarn.log("NetworkConfig: PFNetworkStoreCreateRunLoopSource() failed");
        return false;
    }
    mRunLoopSource->addTo(RunLoop::current(), RunLoop::kDefaultMode);
    if (!mStore->setNotificationKeys(
            {NetworkStore::kGlobalIPv4, NetworkStore::kGlobalDNS, NetworkStore::kGlobalProxies},
            {NetworkStore::kAnyInterfaceIPv4})) {
        gWarn.log("NetworkConfig: PFNetworkStoreSetNotificationKeys() failed");
        return false;
    }
    return true;
}

void NetworkConfig::_networkChangeCallBack(const NetworkStore::Keys& keys) noexcept {
    callGuarded("void Foundation::NetworkConfig::_networkChangeCallBack(const Keys &)",
                [&] { _networkChanged(keys); });
}

void NetworkConfig::_networkChanged(const NetworkStore::Keys& keys) {
    bool anyHasValue = false;
    for (const Ref<String>& key : keys) {
        const Ref<String> value = mStore->getValue(*key);
        gLog.log("NetworkConfig: %@ => %@", key, value);
        if (value) anyHasValue = true;
    }
    if (!anyHasValue) return;
    gLog.log("NetworkConfig: Posting notification in %.0f sec", kSettleSeconds);
    mPostTimer.start(kSettleSeconds, false);
}

void NetworkConfig::_sendNotification() {
    String* const name = kNetworkChangedNotification;
    gLog.log("NetworkConfig: Posting %@!", name);
    NotificationCenter::getLocal()->post(name, this, nullptr);
}

bool NetworkConfig::isConfigError(NetError error) {
    switch (error.domain) {
        case NetError::kNetDB:
            return true;
        case NetError::kPFURL:
            return std::ranges::find(kCurableURLErrors, error.code) !=
                   std::ranges::end(kCurableURLErrors);
        case NetError::kCustom:
            return error.code == -1;
        default:
            return false;
    }
}

}  // namespace Foundation
