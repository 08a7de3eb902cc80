#pragma once

#include <cstdint>
#include <map>
#include <string>
#include <string_view>
#include <vector>

namespace Foundation {

/// What `NetworkStore` says of a moment: the keys that have values, with these.
using NetworkState = std::map<std::string, std::string>;

/// A way out of every network that the machine is on.
struct DefaultRoute {
    std::string interface;
    std::uint32_t gateway = 0;  ///< in network order, 0 where there is none
    std::uint64_t metric = 0;

    bool operator==(const DefaultRoute&) const = default;
};

/// The default routes of a table in the form of /proc/net/route (proc(5)), best first. Routes that
/// are down or refuse are left out.
std::vector<DefaultRoute> defaultRoutesIn(std::string_view routeTable);

/// The addresses of the name servers in a resolver's file (resolv.conf(5)), with spaces between;
/// empty if it names none. The rest of the file is left out: the program that writes it keeps
/// comments and search lists there also while the network is down.
std::string nameServersIn(std::string_view resolverFile);

/// The state now, without proxies. An interface counts while it is up and has a carrier. Throws
/// `std::system_error` if the addresses cannot be read; a missing file is an empty one.
NetworkState readNetworkState(const std::string& resolverFilePath);

/// The keys that differ, those that are only in one state included, in order.
std::vector<std::string> changedKeys(const NetworkState& before, const NetworkState& after);

}  // namespace Foundation
