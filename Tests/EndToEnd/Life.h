#pragma once

#include "EndToEnd/AgentKeeper.h"
#include "EndToEnd/LifeModel.h"
#include "EndToEnd/ScriptedFeed.h"
#include "Support/EnvVar.h"
#include "Support/PrivateBus.h"
#include "Support/ScriptedServer.h"
#include "Support/TempDir.h"

#include <Orvane/OVClient.h>

#include <gtest/gtest.h>

#include <map>
#include <memory>
#include <random>
#include <string>
#include <vector>

/// A folder with all that programs have of their own, and a service file for the bus by which the
/// agent of the life is started. With `$ORVANE_LIFE_LOG` set the agent writes all of its log.
class LifeHome {
 public:
    LifeHome();

    std::string log() const;

    Support::TempDir home;
    Support::EnvVar data{"XDG_DATA_HOME", home.makeDirectory("data").c_str()};
    Support::EnvVar config{"XDG_CONFIG_HOME", home.makeDirectory("config").c_str()};
    Support::EnvVar cache{"XDG_CACHE_HOME", home.makeDirectory("cache").c_str()};
    Support::EnvVar noSystemBus{"DBUS_SYSTEM_BUS_ADDRESS", "unix:path=/nonexistent/bus"};
    Support::EnvVar life{"ORVANE_LIFE", home.makeDirectory("life").c_str()};
};

/// Days in the life of a web, an agent and two clients, which live in this process.
class LifeTest : public testing::Test {
 protected:
    using ClientPtr = std::shared_ptr<OVClient>;

    /// 2040-01-02 08:00 GMT, later than any day on which this is built.
    static constexpr double kStart = 1230768000.0 + 8 * 3600;
    static constexpr double kDay = 86400;
    static constexpr double kHour = 3600;

    LifeTest();
    ~LifeTest() noexcept override;

    /// Makes so many feeds, and has the clients subscribe to them.
    void begin(int feeds);
    /// A day in steps of some hours, in which much happens, and an evening on which the clients
    /// look at what there is. Then all is compared with the model.
    void liveADay();

    void live(int days);
    void compare();
    void advanceBy(double seconds);
    void sleepFor(double seconds);
    void loseNetworkFor(double seconds);
    void killAgent();
    void take();
    bool happens(int percent) { return between(0, 99) < percent; }
    int between(int least, int most) {
        return std::uniform_int_distribution<int>(least, most)(random);
    }

    // What clients do.

    void subscribe(const std::string& client, ScriptedFeed& feed);
    using FeedPtr = std::shared_ptr<OVFeed>;
    FeedPtr anyFeed(const std::string& client);
    void wakeAgent();
    void changeIntervals();
    void unsubscribe();
    void refreshSome();
    void readSome(const std::string& client);
    void spendTheEvening(bool withKill);
    void compareClient(const std::string& client);

    const unsigned seed;
    std::mt19937 random;
    LifeHome home;
    World world{home.home / "life", kStart};
    WorldClock clock{world};
    Support::PrivateBus bus;
    std::vector<std::unique_ptr<ScriptedFeed>> web;
    Support::ScriptedServer server;  ///< ends before the web that it asks
    std::map<std::string, ScriptedFeed*> byURL;
    LifeModel model;
    AgentKeeper keeper;
    std::vector<AgentEvent> events;
    std::map<std::string, ClientPtr> clients;
    ScriptedFeed* left = nullptr;  ///< a feed that was unsubscribed from
    int day = 0;
};
