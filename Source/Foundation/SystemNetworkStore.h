#pragma once

#include "Foundation/FileWatch.h"
#include "Foundation/NetworkState.h"
#include "Foundation/NetworkStore.h"
#include "Foundation/ProxySettings.h"
#include "Foundation/Uncopyable.h"
#include "Foundation/UniqueFD.h"

namespace Foundation {

/// The machine's network: the kernel's word (rtnetlink(7)) that a link, an address or a route has
/// changed, a watch on the resolver's file, and the desktop's proxies.
///
/// Each of them only gives the occasion to look: the state is then read as a whole and compared
/// with the last, so that what is reported twice or changes back at once is one change or none.
///
/// GLib's own network monitor is not used: it is one for the process, tells the context of
/// whoever asked for it first, and says nothing of an address that appears on a second link.
class SystemNetworkStore : public NetworkStore, Uncopyable {
 public:
    static constexpr const char* kResolverFile = "/etc/resolv.conf";

    /// A `NetworkStore::Opener`. The kernel has no use for the client's name. Null, with a warning
    /// of the reason, if the kernel's messages cannot be had.
    static std::unique_ptr<NetworkStore> open(const char* clientName, ChangeHandler handler);
    /// The same with another resolver's file.
    static std::unique_ptr<NetworkStore> openWithResolverFile(const std::string& path,
                                                              ChangeHandler handler);
    ~SystemNetworkStore() override;

    std::unique_ptr<RunLoopSource> createRunLoopSource() override;
    bool setNotificationKeys(const std::vector<std::string>& keys,
                             const std::vector<std::string>& patterns) override;
    StringReturner getValue(const String& key) override;

 private:
    class Source;

    SystemNetworkStore(UniqueFD netlinkFD, const std::string& resolverFile, ChangeHandler handler);

    NetworkState read() const;
    bool isWatched(const std::string& key) const;
    void drainNetlink() const;
    /// Looks at the state again and tells of what has changed.
    void look();

    const UniqueFD mNetlinkFD;
    const std::string mResolverFile;
    const ChangeHandler mHandler;
    bool mMayHaveChanged = false;  ///< what is not seen on the descriptor
    FileWatch mResolverWatch;
    ProxySettings mProxies;
    NetworkState mState;             ///< as last told
    std::vector<std::string> mKeys;  ///< those told of
    std::vector<std::string> mPatterns;
};

}  // namespace Foundation
