#pragma once

#include "Foundation/NetError.h"
#include "Foundation/NetworkStore.h"
#include "Foundation/NotificationNames.h"
#include "Foundation/Timer.h"
#include "Foundation/Uncopyable.h"

#include <memory>

namespace Foundation {

/// Tells the process by a local notification that the network's configuration has settled after a
/// change, so that what failed for want of a network is worth another try. Lives on the run loop
/// of the thread that made it.
///
/// A change starts a wait, a further one starts it anew: a burst of changes gives one
/// notification. The end of all connections gives none, for there is nothing to try again over.
class NetworkConfig : Uncopyable {
 public:
    static constexpr const NotificationName& kNetworkChangedNotification =
        NotificationNames::kNetworkChanged;
    static constexpr const char* kClientName = "com.tarnwick.orvaneAgent";
    static constexpr double kSettleSeconds = 4.0;

    /// Makes the object of the process, once; it stays until exit. If the network cannot be
    /// watched, that is warned of and nothing is ever told.
    static void start();

    /// Whether an error is one that a change of the network may heal.
    static bool isConfigError(NetError error);

    /// An object of the caller's own, over a store of another kind.
    explicit NetworkConfig(const NetworkStore::Opener& open);

 private:
    bool listen(const NetworkStore::Opener& open);
    void _networkChangeCallBack(const NetworkStore::Keys& keys) noexcept;
    void _networkChanged(const NetworkStore::Keys& keys);
    void _sendNotification();

    std::unique_ptr<NetworkStore> mStore;           ///< null if it could not be opened
    std::unique_ptr<RunLoopSource> mRunLoopSource;  ///< of the store
    Timer<NetworkConfig> mPostTimer;                ///< armed while the network settles
};

}  // namespace Foundation
