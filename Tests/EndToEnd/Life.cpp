#include "EndToEnd/Life.h"

#include "EndToEnd/LifeStore.h"
#include "Foundation/ApplicationIdentity.h"

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <set>
#include <stdexcept>

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
      model(
          [this](const std::string& url, double time) { return byURL.at(url)->takeServed(time); }),
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

void LifeTest::live(int days) {
    for (int i = 0; i < days && !HasFailure(); ++i)
        liveADay();
}

void LifeTest::liveADay() {
    constexpr int kSteps = 6;
    ++day;
    // Whoever is not heard of for weeks counts for nothing.
    for (auto& [name, client] : clients)
        client = OVClient::clientForBundleIdentifier(name);
    for (int step = 0; step < kSteps; ++step) {
        for (const std::unique_ptr<ScriptedFeed>& feed : web)
            feed->live();
        if (step == 1) changeIntervals();
        if (step == 2) unsubscribe();
        if (step == 3) refreshSome();
        advanceBy(kDay / kSteps - (step == kSteps - 1 ? 600 : 0));
        for (const auto& [name, client] : clients)
            readSome(name);
        if (step == 2 && day % 2 == 0) sleepFor(3 * kHour);
        if (step == 4 && day % 3 == 1) loseNetworkFor(7 * kHour);
    }
    spendTheEvening(day % 2 == 1);
    compare();
}

/// Keeps the agent alive for ten minutes, in which it does what is to be done once a day.
void LifeTest::spendTheEvening(bool withKill) {
    for (int minute = 0; minute < 10; ++minute) {
        readSome(minute % 2 == 0 ? kReader : kOther);
        wakeAgent();
        advanceBy(60);
        if (minute == 2 && withKill) killAgent();
    }
}

/// The machine sleeps, with the agent at work or not.
void LifeTest::sleepFor(double seconds) {
    const double end = world.now() + seconds;
    advanceBy(0);
    keeper.sleepTo(end, events);
    model.wake(end);
    take();
}

/// Nothing can be reached for a while. Then what has failed is tried again at once.
void LifeTest::loseNetworkFor(double seconds) {
    for (const std::unique_ptr<ScriptedFeed>& feed : web)
        feed->setReachable(false);
    advanceBy(seconds);
    for (const std::unique_ptr<ScriptedFeed>& feed : web)
        feed->setReachable(true);
    wakeAgent();
    advanceBy(5);
    ASSERT_TRUE(keeper.hasAgent());
    model.findNetwork();
    EXPECT_FALSE(model.hasTriedAgain()) << "nothing was due meanwhile";
    keeper.announceNetwork();
    advanceBy(5);
    EXPECT_TRUE(model.hasTriedAgain());
}

void LifeTest::killAgent() {
    // What is saved soon has been saved.
    advanceBy(10);
    keeper.killAgent(events);
    take();
    wakeAgent();
}

void LifeTest::compare() {
    LifeStore store(home.home.path() / "data/Orvane");
    store.compare(model);
    for (const auto& [name, client] : clients)
        compareClient(name);
}

// What clients do.

void LifeTest::subscribe(const std::string& client, ScriptedFeed& feed) {
    const std::shared_ptr<OVFeed> made = clients[client]->addFeedWithURL(feed.getURL());
    ASSERT_TRUE(made) << feed.getURL();
    model.subscribe(client, feed.getURL(), world.now());
}

LifeTest::FeedPtr LifeTest::anyFeed(const std::string& client) {
    const std::vector<FeedPtr> feeds = clients[client]->feeds();
    if (feeds.empty()) throw std::runtime_error(client + " has no feeds");
    return feeds[static_cast<std::size_t>(between(0, static_cast<int>(feeds.size()) - 1))];
}

/// A call that changes nothing.
void LifeTest::wakeAgent() {
    clients[kReader]->setPrivate(false);
}

void LifeTest::changeIntervals() {
    for (int i = 0; i < 5; ++i) {
        const std::string& client = happens(50) ? kReader : kOther;
        const FeedPtr feed = anyFeed(client);
        OVFeedSettings settings = *feed->settings();
        constexpr double kRefreshes[] = {0, 4 * kHour, 12 * kHour, -1};
        constexpr double kExpirations[] = {0, kDay, 3 * kDay, -1};
        settings.setRefreshInterval(kRefreshes[between(0, 3)]);
        settings.setExpirationInterval(kExpirations[between(0, 3)]);
        feed->setSettings(settings);
        model.setIntervals(client, feed->URL().value_or(""), settings.refreshInterval(),
                           settings.expirationInterval(), world.now());
    }
}

/// One feed goes, and one comes back that had gone before.
void LifeTest::unsubscribe() {
    ScriptedFeed* const back = left;
    const FeedPtr feed = anyFeed(kReader);
    const std::string url = feed->URL().value_or("");
    EXPECT_TRUE(clients[kReader]->removeFeed(feed));
    model.unsubscribe(kReader, url);
    left = byURL.at(url);
    if (back) subscribe(kReader, *back);
}

/// Asks for some feeds to be refreshed whatever their schedule. Nothing else may be asked before
/// that has ended, as it would depend on the machine what comes first.
void LifeTest::refreshSome() {
    for (int i = 0; i < 3; ++i) {
        const FeedPtr feed = anyFeed(kReader);
        if (!model.force(feed->URL().value_or(""))) continue;
        EXPECT_TRUE(feed->refresh());
    }
}

/// The reader looks at a feed, and has read some of it when he leaves.
void LifeTest::readSome(const std::string& client) {
    // An agent that a call starts may have to do at once what is to be done once a day, and delete
    // what has just been listed.
    wakeAgent();
    advanceBy(0);
    const FeedPtr feed = anyFeed(client);
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

/// That the client sees what the model has for it.
void LifeTest::compareClient(const std::string& client) {
    std::size_t known = 0;
    for (const FeedPtr& feed : clients[client]->feeds()) {
        const std::string url = feed->URL().value_or("");
        SCOPED_TRACE(client + " " + url);
        const auto found = model.feeds().find(url);
        ASSERT_NE(found, model.feeds().end());
        const ModelFeed& expected = *found->second;
        const ModelSubscription& subscription = expected.subscriptions.at(client);
        ++known;
        EXPECT_EQ(feed->unreadCount(), subscription.unread);
        EXPECT_EQ(feed->title().value_or(""), expected.title);
        EXPECT_EQ(feed->lastError().has_value(), expected.error.code != 0);
        std::set<std::string> seen;
        for (const std::shared_ptr<OVEntry>& entry : feed->entries())
            seen.insert(entry->identifier().value_or(""));
        std::set<std::string> visible;
        for (const auto& [identifier, entry] : expected.entries) {
            if (entry.created > subscription.expirationDate.value_or(0)) visible.insert(identifier);
        }
        EXPECT_EQ(seen, visible);
    }
    std::size_t subscribed = 0;
    for (const auto& [url, feed] : model.feeds())
        subscribed += feed->subscriptions.count(client);
    EXPECT_EQ(known, subscribed);
}
