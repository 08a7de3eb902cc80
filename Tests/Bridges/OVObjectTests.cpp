#include <Orvane/OVObject.h>

#include "Bridges/BridgeTest.h"
#include "Support/AssertionOf.h"

#include <Orvane/OVFormat.h>

using namespace Foundation;
using namespace Orvane;
using Support::assertionOf;

namespace {

class OVObjectTest : public BridgeTest {};

}  // namespace

TEST_F(OVObjectTest, IsOneForEachRow) {
    addFeed(kAddress);
    const std::shared_ptr<OVFeed> feed = feedOf();
    EXPECT_EQ(feedOf(), feed);
    EXPECT_EQ(me()->feeds(), std::vector<std::shared_ptr<OVFeed>>{feed});
}

TEST_F(OVObjectTest, IsMadeAnewOnceItIsGone) {
    addFeed(kAddress);
    std::weak_ptr<OVFeed> feed = feedOf();
    EXPECT_TRUE(feed.expired());
    const std::shared_ptr<OVFeed> another = feedOf();
    EXPECT_EQ(another->title(), "A feed");
    EXPECT_FALSE(log.contains("still around"));
}

TEST_F(OVObjectTest, OutlivesWhatIsReleasedBeforeIt) {
    addFeed(kAddress);
    const std::shared_ptr<OVFeed> feed = feedOf();
    OVClientInternal::applicationClient() = nullptr;
    EXPECT_EQ(feed->title(), "A feed");
    EXPECT_EQ(feed->client()->signature(), kMe);
}

TEST_F(OVObjectTest, StandsForNoSettingsRowAndForNoFeedItself) {
    const Ref<ClientCore> client = &me()->_internal().core();
    const Ref<SubscriptionCore> settings = client->getSubscriptionWithFeedRowID(0);
    EXPECT_EQ(assertionOf([&] { Core::getOVObject(settings.get()); }),
              "Can't create OVFeed from client-settings SubscriptionCore");
    FeedCore* feed = freeFeed();
    EXPECT_EQ(assertionOf([&] { Core::getOVObject(feed); }),
              "Can't call getOVObject on a FeedCore!");
}

TEST_F(OVObjectTest, DescribesItselfForFormats) {
    const std::shared_ptr<OVClient> client = me();
    EXPECT_EQ(client->description(), "OVClient[org.example.Me]");
    EXPECT_EQ(OVFormat("%@", client.get()), "OVClient[org.example.Me]");
    const long long feed = addFeed(kAddress);
    EXPECT_EQ(feedOf()->description(), OVFormat("OVFeed[<http://example.org/feed> %lli/2]", feed));
    const long long entry = addEntry(feed, "e1", -5, "Hello");
    EXPECT_EQ(feedOf()->entries().at(0)->description(), OVFormat("OVEntry['Hello' %lli]", entry));
}

TEST_F(OVObjectTest, IsEqualByClassAndRow) {
    const long long id = addFeed(kAddress);
    addEntry(id, "e1");
    const std::shared_ptr<OVFeed> feed = feedOf();
    const std::shared_ptr<OVEntry> entry = feed->entries().at(0);
    EXPECT_TRUE(feed->isEqual(feed.get()));
    EXPECT_FALSE(feed->isEqual(entry.get()));
    EXPECT_FALSE(feed->isEqual(nullptr));
    EXPECT_TRUE(entry->isEqual(entry.get()));
    EXPECT_FALSE(entry->isEqual(me().get()));
    EXPECT_TRUE(me()->isEqual(me().get()));
    EXPECT_EQ(feed->hash(), feed->_internal()._feedCore()->getPFHashCode());
    EXPECT_EQ(entry->hash(), entry->_internal().peek()->getPFHashCode());
}

TEST_F(OVObjectTest, TwoClientsObjectsOfOneFeedAreEqual) {
    const long long id = addFeed(kAddress);
    const std::shared_ptr<OVClient> other =
        OVClient::clientForBundleIdentifier("org.example.Other");
    agent->addSubscription(other->_internal().core().getRowID(), id);
    const std::shared_ptr<OVFeed> theirs = other->feedWithURL(kAddress);
    const std::shared_ptr<OVFeed> mine = feedOf();
    EXPECT_NE(mine, theirs);
    EXPECT_TRUE(mine->isEqual(theirs.get()));
    EXPECT_EQ(mine->hash(), theirs->hash());
}
