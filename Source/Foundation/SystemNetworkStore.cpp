#include "Foundation/SystemNetworkStore.h"

#include "Foundation/Logger.h"

#include <fnmatch.h>
#include <linux/netlink.h>
#include <linux/rtnetlink.h>
#include <poll.h>
#include <sys/socket.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <system_error>
#include <utility>

namespace Foundation {

namespace {

/// A socket on which the kernel tells of links, IPv4 addresses and IPv4 routes; none, and
/// `errno`, if it cannot be had.
UniqueFD openNetlink() {
    UniqueFD fd(socket(AF_NETLINK, SOCK_RAW | SOCK_CLOEXEC | SOCK_NONBLOCK, NETLINK_ROUTE));
    if (!fd) return fd;
    sockaddr_nl address = {};
    address.nl_family = AF_NETLINK;
    address.nl_groups = RTMGRP_LINK | RTMGRP_IPV4_IFADDR | RTMGRP_IPV4_ROUTE;
    const auto* plain = reinterpret_cast<const sockaddr*>(&address);
    return bind(fd.get(), plain, sizeof address) == 0 ? std::move(fd) : UniqueFD();
}

}  // namespace

class SystemNetworkStore::Source : public RunLoopSource {
 public:
    explicit Source(SystemNetworkStore& store) : mStore(store) {}

 private:
    Interest interest() noexcept override {
        return {
            .fd = mStore.mNetlinkFD.get(), .events = POLLIN, .readyNow = mStore.mMayHaveChanged};
    }
    void ready(short) override { mStore.look(); }

    SystemNetworkStore& mStore;
};

std::unique_ptr<NetworkStore> SystemNetworkStore::open(const char*, ChangeHandler handler) {
    return openWithResolverFile(kResolverFile, std::move(handler));
}

std::unique_ptr<NetworkStore> SystemNetworkStore::openWithResolverFile(const std::string& path,
                                                                       ChangeHandler handler) {
    UniqueFD fd = openNetlink();
    if (!fd) {
        gWarn.log("Can't listen to the network's changes: %s", std::strerror(errno));
        return nullptr;
    }
    return std::unique_ptr<NetworkStore>(
        new SystemNetworkStore(std::move(fd), path, std::move(handler)));
}

SystemNetworkStore::SystemNetworkStore(UniqueFD netlinkFD, const std::string& resolverFile,
                                       ChangeHandler handler)
    : mNetlinkFD(std::move(netlinkFD)),
      mResolverFile(resolverFile),
      mHandler(std::move(handler)),
      mResolverWatch(resolverFile, [this] { mMayHaveChanged = true; }),
      mProxies([this] { mMayHaveChanged = true; }) {}

SystemNetworkStore::~SystemNetworkStore() = default;

std::unique_ptr<RunLoopSource> SystemNetworkStore::createRunLoopSource() {
    return std::make_unique<Source>(*this);
}

bool SystemNetworkStore::setNotificationKeys(const std::vector<std::string>& keys,
                                             const std::vector<std::string>& patterns) {
    try {
        mState = read();
    } catch (const std::system_error& error) {
        gWarn.log("Can't read the network's state: %s", error.what());
        return false;
    }
    mKeys = keys;
    mPatterns = patterns;
    return true;
}

StringReturner SystemNetworkStore::getValue(const String& key) {
    const auto found = mState.find(key.utf8());
    return found == mState.end() ? nullptr : String::string(found->second);
}

NetworkState SystemNetworkStore::read() const {
    NetworkState state = readNetworkState(mResolverFile);
    if (const std::optional<std::string> proxies = mProxies.describe()) {
        state[kGlobalProxies] = *proxies;
    }
    return state;
}

bool SystemNetworkStore::isWatched(const std::string& key) const {
    const auto fits = [&](const std::string& pattern) {
        return fnmatch(pattern.c_str(), key.c_str(), FNM_PATHNAME) == 0;
    };
    return std::ranges::find(mKeys, key) != mKeys.end() || std::ranges::any_of(mPatterns, fits);
}

void SystemNetworkStore::drainNetlink() const {
    char message[8192];
    // Cut and lost messages do no harm, as none is looked at. The word that some were lost ends
    // this early; what is left then brings another turn.
    while (recv(mNetlinkFD.get(), message, sizeof message, 0) >= 0) {
    }
}

void SystemNetworkStore::look() {
    // First, so that a change after the reading brings another turn.
    drainNetlink();
    mMayHaveChanged = false;
    const NetworkState before = std::exchange(mState, read());
    Keys changed;
    for (const std::string& key : changedKeys(before, mState)) {
        if (isWatched(key)) changed.push_back(String::string(key));
    }
    if (!changed.empty()) mHandler(changed);
}

}  // namespace Foundation
