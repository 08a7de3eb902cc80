#include "EndToEnd/Life.h"

#include "EndToEnd/LifeStore.h"
#include "Foundation/ApplicationIdentity.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>

namespace {

constexpr const char* kReader = "org.example.Reader";
constexpr const char* kOther = "org.example.Other";

unsigned seedOfEnvironment() {
    const char* seed = std::getenv("ORVANE_TEST_SEED");
    return seed ? static_cast<unsigned>(std::strtoul(seed, nullptr, 10)) : 20400102;
}

}  // namespace

LifeHome::LifeHome() {
    if (std::getenv("ORVANE_LIFE_LOG")) {
        for (const char* name : {"OVLog", "OVLogAgent", "OVLogFeed", "OVLogHTTP"})
            setenv(name, "1", 1);
    }
    std::filesystem::create_directories(home.path() / "data/dbus-1/services");
    home.writeFile("data/dbus-1/services/com.tarnwick.orvane.ipc.service",
                   "[D-BUS Service]\nName=com.tarnwick.orvane.ipc\nExec=/bin/sh -c \"exec '" +
                       std::string(LIFE_AGENT) + "' 2>> '" + (home / "log") + "'\"\n");
}

std::string LifeHome::log() const {
    std::ifstream stream(home / "log");
    return {std::istreambuf_iterator<char>(stream), std::istreambuf_iterator<char>()};
}

LifeTest::LifeTest()
    : seed(seedOfEnvironment()),
      random(seed),
      model([this](const std::string& url, double until) {
          return byURL.at(url)->takeServed(until);
      }),
      keeper(world, home.home / "log") {
    std::printf("seed %u\n", seed);
    Foundation::ApplicationIdentity::_forget();
    OVClient::setApplicationIdentifier(kReader);
}

LifeTest::~LifeTest() noexcept {
    clients.clear();
    Foundation::ApplicationIdentity::_forget();
    if (HasFailure()) std::fputs(home.log().c_str(), stderr);
}

void LifeTest::begin(int feeds) {
    for (int i = 0; i < feeds; ++i) {
        const std::string host = "h" + std::to_string(i) + ".localhost";
        web.push_back(std::make_unique<ScriptedFeed>(i, server.url("", host), seed, world));
        byURL[web.back()->getURL()] = web.back().get();
    }
    server.answerOthersBy([this](const Support::ServerRequest& request) {
        const std::size_t number = std::strtoul(request.target.c_str() + 1, nullptr, 10);
        return number < web.size() ? web[number]->answer(request) : Support::ServerAnswer(404);
    });
    for (const char* name : {kReader, kOther}) {
        clients[name] = OVClient::clientForBundleIdentifier(name);
        ASSERT_TRUE(clients[name]);
        OVFeedSettings settings = clients[name]->settings();
        settings.setRefreshInterval(6 * kHour);
        settings.setExpirationInterval(2 * kDay);
        clients[name]->setSettings(settings);
        model.addClient(name, {6 * kHour, 2 * kDay});
    }
    for (const std::unique_ptr<ScriptedFeed>& feed : web) {
        subscribe(kReader, *feed);
        if (happens(30)) subscribe(kOther, *feed);
    }
}

// Time.

void LifeTest::advanceBy(double seconds) {
    keeper.advanceTo(world.now() + seconds, events);
    take();
}

void LifeTest::take() {
    for (const AgentEvent& event : events)
        model.take(event);
    events.clear();
    model.passTo(world.now());
}

void LifeTest::liveADay() {
    constexpr int kSteps = 6;
    for (int step = 0; step < kSteps; ++step) {
        for (const std::unique_ptr<ScriptedFeed>& feed : web)
            feed->live();
        advanceBy(kDay / kSteps - (step == kSteps - 1 ? 600 : 0));
        for (const auto& [name, client] : clients)
            readSome(name);
    }
    spendTheEvening();
    compare();
}

/// Keeps the agent alive for ten minutes, in which it does what is to be done once a day.
void LifeTest::spendTheEvening() {
    for (int minute = 0; minute < 10; ++minute) {
        readSome(minute % 2 == 0 ? kReader : kOther);
        advanceBy(60);
    }
}

void LifeTest::compare() const {
    LifeStore store(home.home.path() / "data/Orvane");
    store.compare(model);
}

// What clients do.

void LifeTest::subscribe(const std::string& client, ScriptedFeed& feed) {
    const std::shared_ptr<OVFeed> made = clients[client]->addFeedWithURL(feed.getURL());
    ASSERT_TRUE(made) << feed.getURL();
    model.subscribe(client, feed.getURL(), world.now());
}

/// The reader looks at a feed, and has read some of it when he leaves.
void LifeTest::readSome(const std::string& client) {
    const std::vector<std::shared_ptr<OVFeed>> feeds = clients[client]->feeds();
    ASSERT_FALSE(feeds.empty());
    const std::shared_ptr<OVFeed>& feed =
        feeds[static_cast<std::size_t>(between(0, static_cast<int>(feeds.size()) - 1))];
    const std::string url = feed->URL().value_or("");
    OVEntry::List entries = feed->entries();
    // In an order that depends on neither how things came nor the port of the server.
    std::sort(entries.begin(), entries.end(),
              [](const auto& a, const auto& b) { return a->alternateURL() < b->alternateURL(); });
    for (const std::shared_ptr<OVEntry>& entry : entries) {
        if (!happens(40)) continue;
        const bool reads = happens(70);
        const bool flags = happens(20);
        OVEntry::setFlags({entry}, reads, flags);
        model.setFlags(url, entry->identifier().value_or(""), reads, flags);
    }
}
