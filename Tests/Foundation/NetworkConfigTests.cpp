#include "Foundation/NetworkConfig.h"

#include "Foundation/NotificationCenter.h"
#include "Foundation/RunLoop.h"
#include "Support/LogCapture.h"
#include "Support/ManualClock.h"

#include <gtest/gtest.h>

#include <map>
#include <stdexcept>

using namespace Foundation;
using Support::LogCapture;
using Support::LoggingOn;
using Support::ManualClock;

namespace {

using Lines = std::vector<std::string>;

/// What the test says to the store, and what the store was asked for.
struct FakeNetwork {
    bool canOpen = true;
    bool canMakeSource = true;
    bool canWatch = true;

    std::string clientName;
    std::vector<std::string> keys;
    std::vector<std::string> patterns;
    std::map<std::string, std::string> values;
    bool readingFails = false;
    bool changeIsPending = false;
    std::vector<std::string> changedKeys;
    NetworkStore::ChangeHandler handler;

    NetworkStore::Opener opener();
};

class FakeStore : public NetworkStore {
 public:
    explicit FakeStore(FakeNetwork& network) : mNetwork(network) {}

    std::unique_ptr<RunLoopSource> createRunLoopSource() override {
        if (!mNetwork.canMakeSource) return nullptr;
        return std::make_unique<Source>(mNetwork);
    }
    bool setNotificationKeys(const std::vector<std::string>& keys,
                             const std::vector<std::string>& patterns) override {
        mNetwork.keys = keys;
        mNetwork.patterns = patterns;
        return mNetwork.canWatch;
    }
    StringReturner getValue(const String& key) override {
        if (mNetwork.readingFails) throw std::runtime_error("no good");
        const auto found = mNetwork.values.find(key.utf8());
        return found == mNetwork.values.end() ? nullptr : String::string(found->second);
    }

 private:
    class Source : public RunLoopSource {
     public:
        explicit Source(FakeNetwork& network) : mNetwork(network) {}

     private:
        Interest interest() noexcept override { return {.readyNow = mNetwork.changeIsPending}; }
        void ready(short) override {
            mNetwork.changeIsPending = false;
            Keys keys;
            for (const std::string& key : mNetwork.changedKeys) {
                keys.push_back(String::string(key));
            }
            mNetwork.handler(keys);
        }

        FakeNetwork& mNetwork;
    };

    FakeNetwork& mNetwork;
};

NetworkStore::Opener FakeNetwork::opener() {
    return [this](const char* name, NetworkStore::ChangeHandler changeHandler) {
        clientName = name;
        handler = std::move(changeHandler);
        return canOpen ? std::make_unique<FakeStore>(*this) : nullptr;
    };
}

class NetworkConfigTest : public testing::Test {
 protected:
    NetworkConfigTest() {
        NotificationCenter::getLocal()->addObserver(
            &observer, NetworkConfig::kNetworkChangedNotification, nullptr);
    }
    ~NetworkConfigTest() noexcept override {
        NotificationCenter::getLocal()->removeObserver(&observer);
    }

    void start() {
        config = std::make_unique<NetworkConfig>(network.opener());
        loop.turn();
    }
    void change(const std::vector<std::string>& keys) {
        network.changedKeys = keys;
        network.changeIsPending = true;
        loop.turn();
    }
    void take(Notification* notification) {
        EXPECT_EQ(notification->object, config.get());
        EXPECT_EQ(notification->info, nullptr);
        posted.push_back(clock.now() - ManualClock::kStart);
    }

    AutoreleasePool pool;
    ManualClock clock;
    RunLoop& loop = RunLoop::current();
    LogCapture log;
    LoggingOn logging{{}};
    FakeNetwork network;
    std::unique_ptr<NetworkConfig> config;
    Orvane::MethodReceiver<Notification, NetworkConfigTest> observer{this,
                                                                     &NetworkConfigTest::take};
    std::vector<double> posted;  ///< when, in seconds from the start
};

using Times = std::vector<double>;

}  // namespace

TEST_F(NetworkConfigTest, AsksForTheGlobalKeysAndForTheAddressesOfAnyInterface) {
    start();
    EXPECT_EQ(network.clientName, "com.tarnwick.orvaneAgent");
    EXPECT_EQ(network.keys, Lines({"Global/IPv4", "Global/DNS", "Global/Proxies"}));
    EXPECT_EQ(network.patterns, Lines({"Interface/*/IPv4"}));
    EXPECT_EQ(log.lines(), Lines({"NetworkConfig is listening"}));
}

TEST_F(NetworkConfigTest, LogsEachKeyAndPostsWhenTheNetworkHasSettled) {
    start();
    log.clear();
    network.values = {{"Global/IPv4", "10.9.0.2"}};
    change({"Global/DNS", "Global/IPv4"});
    clock.advanceBy(3.9);
    EXPECT_EQ(posted, Times());
    EXPECT_EQ(log.lines(), Lines({"NetworkConfig: Global/DNS => (null)",
                                  "NetworkConfig: Global/IPv4 => 10.9.0.2",
                                  "NetworkConfig: Posting notification in 4 sec"}));
    log.clear();
    clock.advanceBy(10);
    EXPECT_EQ(posted, Times({4}));
    EXPECT_EQ(log.lines(),
              Lines({"NetworkConfig: Posting Foundation::NetworkConfig::NetworkChanged!"}));
}

TEST_F(NetworkConfigTest, TwoChanges3SecondsApartGiveOneNotification4SecondsAfterTheSecond) {
    start();
    network.values = {{"Global/IPv4", "10.9.0.2"}};
    change({"Global/IPv4"});
    clock.advanceBy(3);
    change({"Global/IPv4"});
    clock.advanceBy(20);
    EXPECT_EQ(posted, Times({7}));
}

TEST_F(NetworkConfigTest, PostsAgainForAChangeAfterTheNotification) {
    start();
    network.values = {{"Global/DNS", "192.0.2.53"}};
    change({"Global/DNS"});
    clock.advanceBy(5);
    change({"Global/DNS"});
    clock.advanceBy(20);
    EXPECT_EQ(posted, Times({4, 9}));
}

TEST_F(NetworkConfigTest, PostsNothingWhenAllValuesAreGone) {
    start();
    log.clear();
    network.values = {{"Global/Proxies", "none"}};  // which has not changed
    change({"Global/IPv4", "Interface/eth0/IPv4"});
    clock.advanceBy(20);
    EXPECT_EQ(posted, Times());
    EXPECT_EQ(log.lines(), Lines({"NetworkConfig: Global/IPv4 => (null)",
                                  "NetworkConfig: Interface/eth0/IPv4 => (null)"}));
}

TEST_F(NetworkConfigTest, ValuesThatGoWhileItSettlesLeaveTheTimerAsItIs) {
    start();
    network.values = {{"Global/IPv4", "10.9.0.2"}};
    change({"Global/IPv4"});
    clock.advanceBy(3);
    network.values.clear();
    change({"Global/IPv4"});
    clock.advanceBy(20);
    EXPECT_EQ(posted, Times({4}));
}

TEST_F(NetworkConfigTest, ListensInTheDefaultModeOnly) {
    start();
    network.values = {{"Global/IPv4", "10.9.0.2"}};
    network.changedKeys = {"Global/IPv4"};
    network.changeIsPending = true;
    loop.runInMode("private", 0, false);
    EXPECT_TRUE(network.changeIsPending);
    loop.turn();
    EXPECT_FALSE(network.changeIsPending);
}

TEST_F(NetworkConfigTest, ReportsWhatAChangeThrows) {
    start();
    log.clear();
    network.readingFails = true;
    change({"Global/IPv4"});
    EXPECT_EQ(log.lines(),
              Lines({"[WARNING] std::runtime_error \"no good\" caught in void "
                     "Foundation::NetworkConfig::_networkChangeCallBack(const Keys &)"}));
}

TEST_F(NetworkConfigTest, EachFailureOfTheStoreIsWarnedOfAndLeavesItIdle) {
    network.canOpen = false;
    start();
    network.canOpen = true;
    network.canMakeSource = false;
    start();
    network.canMakeSource = true;
    network.canWatch = false;
    start();
    EXPECT_EQ(log.lines(),
              Lines({"[WARNING] NetworkConfig: PFNetworkStoreCreate() failed",
                     "[WARNING] NetworkConfig: PFNetworkStoreCreateRunLoopSource() failed",
                     "[WARNING] NetworkConfig: PFNetworkStoreSetNotificationKeys() failed"}));
}

namespace {

struct ConfigErrorCase {
    std::int64_t domain;
    std::int32_t code;
    bool isConfigError;
};

class IsConfigError : public testing::TestWithParam<ConfigErrorCase> {};

}  // namespace

TEST_P(IsConfigError, TellsErrorsThatAChangeOfTheNetworkMayHeal) {
    const auto [domain, code, expected] = GetParam();
    EXPECT_EQ(NetworkConfig::isConfigError(NetError(domain, code)), expected)
        << domain << ", " << code;
}

INSTANTIATE_TEST_SUITE_P(NameService, IsConfigError,
                         testing::Values(ConfigErrorCase{12, -2, true},
                                         ConfigErrorCase{12, 0, true},
                                         ConfigErrorCase{12, 8, true}));
INSTANTIATE_TEST_SUITE_P(
    URLLoading, IsConfigError,
    testing::Values(ConfigErrorCase{15, -1009, true}, ConfigErrorCase{15, -1008, false},
                    ConfigErrorCase{15, -1007, false}, ConfigErrorCase{15, -1006, true},
                    ConfigErrorCase{15, -1005, true}, ConfigErrorCase{15, -1004, true},
                    ConfigErrorCase{15, -1003, true}, ConfigErrorCase{15, -1002, false},
                    ConfigErrorCase{15, -1001, true}, ConfigErrorCase{15, -1000, false},
                    ConfigErrorCase{15, -1010, false}, ConfigErrorCase{15, 1, true},
                    ConfigErrorCase{15, 2, true}, ConfigErrorCase{15, 3, false},
                    ConfigErrorCase{15, 0, false}, ConfigErrorCase{15, -1, false},
                    ConfigErrorCase{15, 301, false}, ConfigErrorCase{15, 302, true},
                    ConfigErrorCase{15, 303, false}));
INSTANTIATE_TEST_SUITE_P(Custom, IsConfigError,
                         testing::Values(ConfigErrorCase{-1, -1, true},
                                         ConfigErrorCase{-1, 1, false},
                                         ConfigErrorCase{-1, 0, false},
                                         ConfigErrorCase{-1, -1009, false}));
INSTANTIATE_TEST_SUITE_P(Others, IsConfigError,
                         testing::Values(ConfigErrorCase{0, 0, false},
                                         ConfigErrorCase{1, 101, false},
                                         ConfigErrorCase{2, -1009, false},
                                         ConfigErrorCase{NetError::kHTTP, 302, false},
                                         ConfigErrorCase{1002, -1, false}));
