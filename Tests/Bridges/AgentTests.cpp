// An application and the agent: two processes on a message bus of their own.

#include "Agent/AgentProcess.h"
#include "Foundation/ApplicationIdentity.h"
#include "Foundation/Bus.h"
#include "Foundation/BusCenter.h"
#include "Support/PrivateBus.h"
#include "Support/ScriptedServer.h"

#include <Orvane/OVClient.h>
#include <Orvane/OVException.h>

#include <csignal>
#include <optional>

using Support::turnUntil;

namespace {

constexpr const char* kFeed =
    "<rss version='2.0'><channel><title>The feed</title>"
    "<item><guid>1</guid><title>One</title><description>first</description></item>"
    "<item><guid>2</guid><title>Two</title><description>second</description></item>"
    "</channel></rss>";

/// Counts what it is told.
struct Told : OVClientDelegate {
    using Feed = std::shared_ptr<OVFeed>;
    void feedDidEndRefresh(const Feed&) override { ++ended; }
    void feedDidAddEntries(const Feed&, const OVEntry::List& entries) override {
        brought += entries.size();
    }
    // Later entries of a document count as first seen a little earlier than it, which may be before
    // the client was made.
    void feedDidUpdateEntries(const Feed&, const OVEntry::List& entries) override {
        brought += entries.size();
    }
    void feedDidChangeFlagsInEntries(const Feed&, const OVEntry::List& entries) override {
        changed += entries.size();
    }

    int ended = 0;
    std::size_t brought = 0;
    std::size_t changed = 0;
};

class ApplicationAndAgent : public AgentProcessTest {
 protected:
    ApplicationAndAgent() {
        Foundation::ApplicationIdentity::_forget();
        OVClient::setApplicationIdentifier("org.example.Application");
        server.answer("/feed", Support::ServerAnswer().body(kFeed));
        start();
    }

    void start() {
        const std::string command = "exec " ORVANE_AGENT " 2>> '" + (home / "log") + "'";
        agent.emplace(std::vector<std::string>{"sh", "-c", command});
        EXPECT_TRUE(turnUntil([] {
            return !Foundation::Bus::user().getNameOwner(Foundation::BusCenter::kAgentName).empty();
        })) << log();
    }

    Support::PrivateBus bus;
    Support::ScriptedServer server;
    std::optional<Support::BackgroundProcess> agent;
};

}  // namespace

TEST_F(ApplicationAndAgent, SubscribesRefreshesAndReads) {
    std::optional<OVError> error;
    const std::shared_ptr<OVClient> client = OVClient::applicationClient(&error);
    ASSERT_TRUE(client) << (error ? error->toString() : "") << log();
    EXPECT_EQ(client->signature(), "org.example.Application");
    Told told;
    client->setDelegate(&told);

    const std::shared_ptr<OVFeed> feed = client->addFeedWithURL(server.url("/feed"), &error);
    ASSERT_TRUE(feed) << log();
    EXPECT_EQ(client->feeds(), std::vector<std::shared_ptr<OVFeed>>{feed});
    ASSERT_TRUE(feed->refresh(&error));
    ASSERT_TRUE(turnUntil([&] { return told.brought == 2 && !feed->isRefreshing(); })) << log();
    EXPECT_FALSE(feed->lastError());
    EXPECT_EQ(feed->title(), "The feed");
    EXPECT_TRUE(feed->lastRefreshDate());
    EXPECT_EQ(feed->unreadCount(), 2);

    OVEntryQuery unread;
    unread.read = false;
    unread.order = OVEntryQuery::Order::ByTitle;
    unread.ascending = true;
    const OVEntry::List entries = client->entries(unread);
    ASSERT_EQ(entries.size(), 2u);
    EXPECT_EQ(entries[0]->title(), "One");
    EXPECT_EQ(entries[1]->content() ? entries[1]->content()->plainTextString()
                                    : entries[1]->summary()->plainTextString(),
              "second");
    entries[0]->setRead(true);
    EXPECT_TRUE(entries[0]->isRead());
    EXPECT_EQ(client->entryCount(unread), 1u);
    ASSERT_TRUE(turnUntil([&] { return told.changed == 1; }));
    OVEntry::setFlags(entries, true, true);
    EXPECT_EQ(client->entryCount(unread), 0u);
    EXPECT_TRUE(entries[1]->isFlagged());

    OVFeedSettings settings = *feed->settings();
    settings.setRefreshInterval(7200);
    feed->setSettings(settings);
    EXPECT_EQ(feed->settings()->refreshInterval(), 7200);
    EXPECT_TRUE(feed->nextRefreshDate());

    EXPECT_TRUE(client->removeFeed(feed));
    EXPECT_TRUE(client->feeds().empty());
    EXPECT_EQ(client->entryCount({}), 0u);
    client->setDelegate(nullptr);
}
