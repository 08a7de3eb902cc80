#pragma once

#include "Foundation/RunLoopSource.h"
#include "Foundation/String.h"

#include <functional>
#include <memory>
#include <string>
#include <vector>

namespace Foundation {

/// The state of the machine's network as texts under keys, and word of the keys that have changed.
/// Used on one thread.
class NetworkStore {
 public:
    /// The default route that is in use, with the address that packets leave from.
    static constexpr const char* kGlobalIPv4 = "Global/IPv4";
    /// The name servers, in the order in which they are asked.
    static constexpr const char* kGlobalDNS = "Global/DNS";
    /// The user's proxies.
    static constexpr const char* kGlobalProxies = "Global/Proxies";
    /// A pattern: the addresses of one interface, loopback left out.
    static constexpr const char* kAnyInterfaceIPv4 = "Interface/*/IPv4";

    using Keys = std::vector<Ref<String>>;
    /// Told of keys whose values are not what they were: other values, new ones or none any more.
    using ChangeHandler = std::function<void(const Keys& changed)>;
    /// Opens a store for the client of the given name; null if that fails.
    using Opener =
        std::function<std::unique_ptr<NetworkStore>(const char* clientName, ChangeHandler)>;

    virtual ~NetworkStore() = default;

    /// What must be in a run loop for changes to be told. It refers to the store and must end
    /// before it. Null if it cannot be made.
    virtual std::unique_ptr<RunLoopSource> createRunLoopSource() = 0;
    /// From now on tells of changes of these keys and of those that fit a pattern, in which "*"
    /// stands for anything but a "/". False if the state cannot be watched.
    virtual bool setNotificationKeys(const std::vector<std::string>& keys,
                                     const std::vector<std::string>& patterns) = 0;
    /// The key's value, null if it has none.
    virtual StringReturner getValue(const String& key) = 0;
};

}  // namespace Foundation
