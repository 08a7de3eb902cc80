#include "Foundation/NetworkState.h"

#include <gtest/gtest.h>

using namespace Foundation;

namespace {

using Keys = std::vector<std::string>;

constexpr const char* kHeading =
    "Iface\tDestination\tGateway \tFlags\tRefCnt\tUse\tMetric\tMask\t\tMTU\tWindow\tIRTT\n";

}  // namespace

TEST(NetworkState, OrdersDefaultRoutesByTheirMetric) {
    const std::string table = std::string(kHeading) +
                              "wlan0\t00000000\t0101A8C0\t0003\t0\t0\t600\t00000000\t0\t0\t0\n"
                              "eth0\t00000000\t0100090A\t0003\t0\t0\t100\t00000000\t0\t0\t0\n"
                              "tun0\t00000000\t00000000\t0001\t0\t0\t600\t00000000\t0\t0\t0\n";
    EXPECT_EQ(defaultRoutesIn(table),
              std::vector<DefaultRoute>(
                  {{"eth0", 0x0100090A, 100}, {"wlan0", 0x0101A8C0, 600}, {"tun0", 0, 600}}));
}

TEST(NetworkState, LeavesOutRoutesThatLeadNotEverywhere) {
    const std::string table = std::string(kHeading) +
                              "eth0\t0000090A\t00000000\t0001\t0\t0\t0\t00FFFFFF\t0\t0\t0\n"
                              "eth0\t00000000\t0100090A\t0003\t0\t0\t0\t00000080\t0\t0\t0\n"
                              "*\t00000000\t00000000\t0201\t0\t0\t0\t00000000\t0\t0\t0\n"
                              "eth1\t00000000\t0100090A\t0002\t0\t0\t0\t00000000\t0\t0\t0\n";
    EXPECT_EQ(defaultRoutesIn(table), std::vector<DefaultRoute>());
    EXPECT_EQ(defaultRoutesIn(""), std::vector<DefaultRoute>());
}

TEST(NetworkState, TakesTheNameServersOfAResolversFileInTheirOrder) {
    EXPECT_EQ(nameServersIn("# made by hand\n"
                            "search example.org\n"
                            "nameserver 192.0.2.53\n"
                            ";nameserver 192.0.2.1\n"
                            "#nameserver 192.0.2.2\n"
                            " nameserver 192.0.2.3\n"
                            "nameservers 192.0.2.4\n"
                            "nameserver\t2001:db8::53  # the other\n"
                            "nameserver\n"
                            "options edns0"),
              "192.0.2.53 2001:db8::53");
    EXPECT_EQ(nameServersIn("# Generated\nsearch example.org\n"), "");
    EXPECT_EQ(nameServersIn(""), "");
}

TEST(NetworkState, AKeyChangesWithItsValueOrItsPresence) {
    const NetworkState before = {{"gone", "1"}, {"other", "1"}, {"same", "1"}};
    const NetworkState after = {{"new", "1"}, {"other", "2"}, {"same", "1"}};
    EXPECT_EQ(changedKeys(before, after), Keys({"gone", "new", "other"}));
    EXPECT_EQ(changedKeys(before, before), Keys());
}

TEST(NetworkState, LeavesTheLoopbackOut) {
    const NetworkState state = readNetworkState("/nonexistent/resolv.conf");
    EXPECT_EQ(state.count("Interface/lo/IPv4"), 0u);
    EXPECT_EQ(state.count("Global/DNS"), 0u);
}
