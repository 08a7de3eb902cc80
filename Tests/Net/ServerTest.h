#pragma once

#include "Model/FeedTest.h"
#include "Net/PollingFeeder.h"
#include "Net/PollingFeederFactory.h"
#include "Support/LoopWatch.h"
#include "Support/TurnUntil.h"

#include <gtest/gtest.h>

#include <string>

/// A document of RSS with one entry.
inline std::string rss(const std::string& title, const std::string& entry = "One",
                       const std::string& text = "") {
    return "<?xml version=\"1.0\"?><rss version=\"2.0\"><channel><title>" + title +
           "</title><link>http://example.org/</link><item><title>" + entry +
           "</title><guid isPermaLink=\"false\">" + entry + "</guid><description>" + text +
           "</description></item></channel></rss>";
}

/// Feeds that are fetched from real servers, on a clock driven by hand. That the loop always turned
/// is looked at in each test.
class ServerTest : public FeedTest {
 protected:
    ServerTest() { Orvane::FeederFactory::setCurrent(&mFactory); }
    ~ServerTest() noexcept override {
        EXPECT_LT(mWatch.getLongestSeconds(), 0.5) << "the loop was blocked";
        Orvane::FeederFactory::setCurrent(nullptr);
    }

    static Orvane::PollingFeeder* feederOf(Orvane::FeedCore& feed) {
        return static_cast<Orvane::PollingFeeder*>(feed.getFeeder());
    }
    /// Begins a refresh in the foreground.
    static void begin(Orvane::FeedCore& feed) { feed.refresh(false, false); }
    [[nodiscard]] static bool waitForEnd(Orvane::FeedCore& feed) { return turnUntilEnded(feed); }
    /// Refreshes, and waits for the end: "changed", "same" or the error's domain and code.
    static std::string refresh(Orvane::FeedCore& feed) {
        begin(feed);
        return turnUntilEnded(feed) ? resultOf(feed) : "no end";
    }
    static std::string resultOf(Orvane::FeedCore& feed) {
        const Foundation::NetError status = feederOf(feed)->getStatus();
        if (status.code != 0) return OVFormat("%lld %d", status.domain, status.code);
        return feederOf(feed)->hasChanged() ? "changed" : "same";
    }
    static std::string refresh(const std::string& address) {
        return refresh(*storedFeed(address.c_str()));
    }

 private:
    /// With one turn more, which the watch needs to see the last one that the network had. A merge
    /// may take longer than that may.
    static bool turnUntilEnded(Orvane::FeedCore& feed) {
        const auto hasEnded = [&] { return !feederOf(feed)->isRefreshing(); };
        if (!Support::turnUntil(hasEnded)) return false;
        int turns = feederOf(feed)->hasChanged() ? 2 : 0;
        return Support::turnUntil([&] { return ++turns > 2; });
    }

    Orvane::PollingFeederFactory mFactory;
    Support::LoopWatch mWatch;
};
