#include "Foundation/NetworkConfig.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/SystemNetworkStore.h"
#include "Support/LogCapture.h"
#include "Support/ManualClock.h"
#include "Support/NetworkNamespace.h"
#include "Support/TempDir.h"
#include "Support/TurnUntil.h"

#include <gtest/gtest.h>

using namespace Foundation;
using Support::LogCapture;
using Support::LoggingOn;
using Support::ManualClock;
using Support::NetworkNamespace;
using Support::TempDir;
using Support::turnUntil;

namespace {

using Times = std::vector<double>;

/// The watcher on a real network of its own, with the time in the test's hand.
class NetworkConfigSystemTest : public testing::Test {
 protected:
    void SetUp() override {
        if (!network.problem().empty()) GTEST_SKIP() << network.problem();
        NotificationCenter::getLocal()->addObserver(
            &observer, NetworkConfig::kNetworkChangedNotification, nullptr);
        config = std::make_unique<NetworkConfig>(
            [this](const char*, NetworkStore::ChangeHandler handler) {
                return SystemNetworkStore::openWithResolverFile(folder / "resolv.conf",
                                                                std::move(handler));
            });
        ASSERT_TRUE(log.contains("NetworkConfig is listening"));
    }
    ~NetworkConfigSystemTest() noexcept override {
        NotificationCenter::getLocal()->removeObserver(&observer);
    }
    bool isLogged(const std::string& line) {
        return turnUntil([&] { return log.contains(line); });
    }
    void take(Notification*) { posted.push_back(clock.now() - ManualClock::kStart); }

    AutoreleasePool pool;
    ManualClock clock;
    LogCapture log;
    LoggingOn logging{{}};
    NetworkNamespace network;
    TempDir folder;
    std::unique_ptr<NetworkConfig> config;
    Orvane::MethodReceiver<Notification, NetworkConfigSystemTest> observer{
        this, &NetworkConfigSystemTest::take};
    Times posted;  ///< when, in seconds from the start
};

}  // namespace

TEST_F(NetworkConfigSystemTest, PostsOnce4SecondsAfterTheLastChangeAndNothingWhenAllIsGone) {
    network.ip("link add v0 type veth peer name v1");
    network.ip("link set v1 up");
    network.ip("link set v0 up");
    network.ip("addr add 10.9.0.2/24 dev v0");
    ASSERT_TRUE(isLogged("NetworkConfig: Interface/v0/IPv4 => 10.9.0.2/24"));
    clock.advanceBy(3);
    network.ip("route add default via 10.9.0.1");
    ASSERT_TRUE(isLogged("NetworkConfig: Global/IPv4 => 10.9.0.2 via 10.9.0.1 on v0"));
    clock.advanceBy(3);
    folder.writeFile("resolv.conf", "nameserver 192.0.2.53\n");
    ASSERT_TRUE(isLogged("NetworkConfig: Global/DNS => 192.0.2.53"));
    clock.advanceBy(20);
    EXPECT_EQ(posted, Times({10}));

    network.ip("link del v0");
    ASSERT_TRUE(isLogged("NetworkConfig: Global/IPv4 => (null)"));
    EXPECT_TRUE(log.contains("NetworkConfig: Interface/v0/IPv4 => (null)"));
    clock.advanceBy(20);
    EXPECT_EQ(posted, Times({10}));
}

TEST(NetworkConfigStart, MakesOneObjectOfTheProcess) {
    LogCapture log;
    const LoggingOn logging({});
    NetworkConfig::start();
    NetworkConfig::start();
    EXPECT_EQ(log.lines(), std::vector<std::string>({"NetworkConfig is listening"}));
}
