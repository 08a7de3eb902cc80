#include "Bridges/OVEntryInternal.h"

#include "Bridges/OVClientInternal.h"
#include "Bridges/OVFeedInternal.h"
#include "Bridges/PublicObject.h"
#include "Foundation/AssertionFailure.h"
#include "Foundation/Logger.h"
#include "Model/ClientCore.h"
#include "Model/FeedCore.h"
#include "Model/SubscriptionCore.h"

using namespace Foundation;
using namespace Orvane;

void OVEntryInternal::_initWithCore(EntryCore* core, OVObject* object) {
    setCore(core, object);
    noteIdentifier();
}

/// Whether a feed is not the one any more that the entry was found by, because its subscription has
/// ended.
bool OVEntryInternal::hasMoved(const OVFeed& from) const {
    return peek()->getTable() && !from._internal()._subscriptionCore();
}

void OVEntryInternal::_setFeed(const std::shared_ptr<OVFeed>& newFeed) {
    OV_ASSERT_AS(newFeed != nullptr, "newFeed");
    OV_ASSERT_MESSAGE_AS(!feed || feed->isEqual(newFeed.get()) || hasMoved(*feed),
                         "!feed || feed==newFeed",
                         "Trying to _setFeed of %@ to %@ when it's already %@", getOwner(),
                         newFeed.get(), feed.get());
    feed = newFeed;
}

std::shared_ptr<OVFeed> OVEntryInternal::findFeed() {
    if (feed) return feed;
    FeedCore* feedCore = core().getFeed();
    if (feedCore && client) {
        gLogAPI.log("Have to look up feed of %@", getOwner());
        const Ref<SubscriptionCore> subscription =
            client->_internal().core().getSubscription(feedCore);
        feed = publicObject<OVFeed>(subscription.get());
    }
    if (!feed) {
        gWarn.log("Couldn't find OVFeed of %@ (FeedCore=%@, OVClient=%@)", getOwner(), feedCore,
                  client.get());
    }
    return feed;
}

std::shared_ptr<OVClient> OVEntryInternal::findClient() const {
    if (client) return client;
    return feed ? feed->client() : nullptr;
}

void OVEntryInternal::noteIdentifier() {
    const EntryCore* row = peek();
    if (row->mIdentifier.isLoaded()) mIdentifier = row->mIdentifier.getValue();
}

Ref<Core> OVEntryInternal::findAgain() {
    noteIdentifier();
    if (!mIdentifier.get()) return nullptr;
    const Ref<EntryCore> again = EntryCore::getEntryWithIdentifier(mIdentifier.get());
    return Ref<Core>(again);
}

void OVEntryInternal::foundAgain() {
    titleForDisplay.clear();
    if (feed && !feed->_internal()._subscriptionCore()) feed = nullptr;
}
