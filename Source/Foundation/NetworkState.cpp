#include "Foundation/NetworkState.h"

#include "Foundation/NetworkStore.h"

#include <Orvane/OVFormat.h>
#include <arpa/inet.h>
#include <ifaddrs.h>
#include <net/if.h>
#include <net/route.h>

#include <algorithm>
#include <bit>
#include <cerrno>
#include <fstream>
#include <iterator>
#include <memory>
#include <sstream>
#include <system_error>

namespace Foundation {

namespace {

/// By interface, in the kernel's order: an interface's primary address comes first.
using Addresses = std::map<std::string, std::vector<std::string>>;

std::string contentOf(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), {}};
}

std::string addressText(std::uint32_t networkOrder) {
    char text[INET_ADDRSTRLEN] = {};
    inet_ntop(AF_INET, &networkOrder, text, sizeof text);
    return text;
}

std::uint32_t addressIn(const sockaddr* address) {
    return reinterpret_cast<const sockaddr_in*>(address)->sin_addr.s_addr;
}

/// Whether the entry is an address that the outside could be reached from.
bool counts(const ifaddrs& entry) {
    constexpr unsigned kLive = IFF_UP | IFF_RUNNING;
    return entry.ifa_addr && entry.ifa_addr->sa_family == AF_INET &&
           (entry.ifa_flags & kLive) == kLive && !(entry.ifa_flags & IFF_LOOPBACK);
}

Addresses readAddresses() {
    ifaddrs* list = nullptr;
    if (getifaddrs(&list) != 0)
        throw std::system_error(errno, std::system_category(), "getifaddrs");
    const std::unique_ptr<ifaddrs, decltype(&freeifaddrs)> owner(list, freeifaddrs);
    Addresses addresses;
    for (const ifaddrs* entry = list; entry; entry = entry->ifa_next) {
        if (!counts(*entry)) continue;
        const int bits = entry->ifa_netmask ? std::popcount(addressIn(entry->ifa_netmask)) : 32;
        addresses[entry->ifa_name].push_back(
            OVFormat("%s/%d", addressText(addressIn(entry->ifa_addr)), bits));
    }
    return addresses;
}

std::string describe(const DefaultRoute& route, const std::string& address) {
    const std::string from = address.substr(0, address.find('/'));
    if (route.gateway == 0) return OVFormat("%s on %s", from, route.interface);
    return OVFormat("%s via %s on %s", from, addressText(route.gateway), route.interface);
}

std::string joined(const std::vector<std::string>& texts) {
    std::string all;
    for (const std::string& text : texts) {
        if (!all.empty()) all += ' ';
        all += text;
    }
    return all;
}

}  // namespace

std::vector<DefaultRoute> defaultRoutesIn(std::string_view routeTable) {
    std::vector<DefaultRoute> routes;
    std::istringstream lines{std::string(routeTable)};
    for (std::string line; std::getline(lines, line);) {
        std::istringstream fields(line);
        DefaultRoute route;
        std::uint32_t destination, flags, mask;
        unsigned references, uses;
        fields >> route.interface >> std::hex >> destination >> route.gateway >> flags >>
            std::dec >> references >> uses >> route.metric >> std::hex >> mask;
        if (!fields) continue;  // the heading
        const bool isUsable = (flags & RTF_UP) && !(flags & RTF_REJECT);
        if (destination == 0 && mask == 0 && isUsable) routes.push_back(std::move(route));
    }
    std::ranges::stable_sort(routes, {}, &DefaultRoute::metric);
    return routes;
}

std::string nameServersIn(std::string_view resolverFile) {
    std::vector<std::string> servers;
    std::istringstream lines{std::string(resolverFile)};
    for (std::string line; std::getline(lines, line);) {
        if (line.starts_with(' ') || line.starts_with('\t')) continue;
        std::istringstream words(line);
        std::string keyword, address;
        if (words >> keyword >> address && keyword == "nameserver") servers.push_back(address);
    }
    return joined(servers);
}

NetworkState readNetworkState(const std::string& resolverFilePath) {
    NetworkState state;
    const Addresses addresses = readAddresses();
    for (const auto& [interface, list] : addresses) {
        state[OVFormat("Interface/%s/IPv4", interface)] = joined(list);
    }
    // A route through an interface without a carrier stays in the table.
    for (const DefaultRoute& route : defaultRoutesIn(contentOf("/proc/net/route"))) {
        const auto found = addresses.find(route.interface);
        if (found == addresses.end()) continue;
        state[NetworkStore::kGlobalIPv4] = describe(route, found->second.front());
        break;
    }
    const std::string servers = nameServersIn(contentOf(resolverFilePath));
    if (!servers.empty()) state[NetworkStore::kGlobalDNS] = servers;
    return state;
}

std::vector<std::string> changedKeys(const NetworkState& before, const NetworkState& after) {
    NetworkState differing;
    std::ranges::set_symmetric_difference(before, after, std::inserter(differing, differing.end()));
    std::vector<std::string> keys;
    for (const auto& [key, value] : differing) {
        keys.push_back(key);
    }
    return keys;
}

}  // namespace Foundation
