#include "Foundation/SystemNetworkStore.h"

#include "Foundation/RunLoop.h"
#include "Support/NetworkNamespace.h"
#include "Support/TempDir.h"
#include "Support/TurnUntil.h"

#include <gtest/gtest.h>

#include <algorithm>

using namespace Foundation;
using Support::NetworkNamespace;
using Support::TempDir;
using Support::turnUntil;

namespace {

/// A store on a network of its own. `told` holds every key it has told of, with the value then.
class SystemNetworkStoreTest : public testing::Test {
 protected:
    void SetUp() override {
        if (!network.problem().empty()) GTEST_SKIP() << network.problem();
        store = SystemNetworkStore::openWithResolverFile(
            folder / "resolv.conf", [this](const NetworkStore::Keys& keys) { note(keys); });
        ASSERT_NE(store, nullptr);
        source = store->createRunLoopSource();
        source->addTo(RunLoop::current(), RunLoop::kDefaultMode);
        AutoreleasePool pool;
        ASSERT_TRUE(store->setNotificationKeys(
            {NetworkStore::kGlobalIPv4, NetworkStore::kGlobalDNS, NetworkStore::kGlobalProxies},
            {NetworkStore::kAnyInterfaceIPv4}));
    }
    std::string value(const String& key) {
        const Ref<String> text = store->getValue(key);
        return text ? text->utf8() : "(null)";
    }
    void note(const NetworkStore::Keys& keys) {
        for (const Ref<String>& key : keys) {
            told.push_back(key->utf8() + " => " + value(*key));
        }
    }
    bool isTold(const std::string& line) {
        return turnUntil([&] { return std::ranges::find(told, line) != told.end(); });
    }
    /// A pair of links, the first with an address. Whatever came before is forgotten.
    void plugIn() {
        network.ip("link add v0 type veth peer name v1");
        network.ip("addr add 10.9.0.2/24 dev v0");
        network.ip("link set v0 up");
        network.ip("link set v1 up");
        ASSERT_TRUE(isTold("Interface/v0/IPv4 => 10.9.0.2/24"));
        told.clear();
    }

    NetworkNamespace network;
    TempDir folder;
    std::unique_ptr<NetworkStore> store;
    std::unique_ptr<RunLoopSource> source;
    std::vector<std::string> told;
};

using Lines = std::vector<std::string>;

}  // namespace

TEST_F(SystemNetworkStoreTest, TellsOfAnAddressOnceTheLinkIsLive) {
    network.ip("link add v0 type veth peer name v1");
    network.ip("addr add 10.9.0.2/24 dev v0");
    network.ip("link set v0 up");
    RunLoop::current().turn();
    EXPECT_EQ(told, Lines());
    network.ip("link set v1 up");
    EXPECT_TRUE(isTold("Interface/v0/IPv4 => 10.9.0.2/24"));
    EXPECT_EQ(told, Lines({"Interface/v0/IPv4 => 10.9.0.2/24"}));
}

TEST_F(SystemNetworkStoreTest, TellsOfAFurtherAddressAndOfOneThatIsOnAnotherLinkAlready) {
    plugIn();
    network.ip("addr add 10.9.1.5/32 dev v0");
    EXPECT_TRUE(isTold("Interface/v0/IPv4 => 10.9.0.2/24 10.9.1.5/32"));
    network.ip("addr add 10.9.1.5/32 dev v1");
    EXPECT_TRUE(isTold("Interface/v1/IPv4 => 10.9.1.5/32"));
    network.ip("addr del 10.9.1.5/32 dev v0");
    EXPECT_TRUE(isTold("Interface/v0/IPv4 => 10.9.0.2/24"));
}

TEST_F(SystemNetworkStoreTest, TellsOfTheDefaultRouteAndOfItsReplacement) {
    plugIn();
    network.ip("route add default via 10.9.0.1");
    EXPECT_TRUE(isTold("Global/IPv4 => 10.9.0.2 via 10.9.0.1 on v0"));
    network.ip("route replace default via 10.9.0.3");
    EXPECT_TRUE(isTold("Global/IPv4 => 10.9.0.2 via 10.9.0.3 on v0"));
    network.ip("route del default");
    EXPECT_TRUE(isTold("Global/IPv4 => (null)"));
    EXPECT_EQ(told.size(), 3u);
    network.ip("route add default dev v0");
    EXPECT_TRUE(isTold("Global/IPv4 => 10.9.0.2 on v0"));
}

TEST_F(SystemNetworkStoreTest, ALostCarrierTakesAllValuesAway) {
    plugIn();
    network.ip("route add default via 10.9.0.1");
    ASSERT_TRUE(isTold("Global/IPv4 => 10.9.0.2 via 10.9.0.1 on v0"));
    told.clear();
    network.ip("link set v1 down");
    EXPECT_TRUE(isTold("Interface/v0/IPv4 => (null)"));
    EXPECT_EQ(told, Lines({"Global/IPv4 => (null)", "Interface/v0/IPv4 => (null)"}));
}

TEST_F(SystemNetworkStoreTest, ManyMessagesThatChangeNothingInTheEndAreNoChange) {
    plugIn();
    // More than the socket holds: what overflows must not silence it.
    std::string batch;
    for (int i = 0; i < 4000; ++i) {
        batch += "addr add 10.9.2.1/32 dev v0\naddr del 10.9.2.1/32 dev v0\n";
    }
    network.ip("-batch " + folder.writeFile("batch", batch));
    RunLoop::current().turn();
    EXPECT_EQ(told, Lines());
    network.ip("addr add 10.9.2.1/32 dev v0");
    EXPECT_TRUE(isTold("Interface/v0/IPv4 => 10.9.0.2/24 10.9.2.1/32"));
}

TEST_F(SystemNetworkStoreTest, TellsOfTheNameServersOnly) {
    folder.writeFile("resolv.conf", "nameserver 192.0.2.53\n");
    EXPECT_TRUE(isTold("Global/DNS => 192.0.2.53"));
    told.clear();
    folder.writeFile("resolv.conf", "# looked at\nnameserver 192.0.2.53\n");
    folder.writeFile("resolv.conf", "# down\n");
    EXPECT_TRUE(isTold("Global/DNS => (null)"));
    EXPECT_EQ(told, Lines({"Global/DNS => (null)"}));
}

TEST_F(SystemNetworkStoreTest, TellsOfNothingThatWasNotAskedFor) {
    plugIn();
    ASSERT_TRUE(store->setNotificationKeys({NetworkStore::kGlobalDNS}, {}));
    network.ip("route add default via 10.9.0.1");
    folder.writeFile("resolv.conf", "nameserver 192.0.2.53\n");
    EXPECT_TRUE(isTold("Global/DNS => 192.0.2.53"));
    EXPECT_EQ(told, Lines({"Global/DNS => 192.0.2.53"}));
}
