#include "Bridges/OVFeedInternal.h"

#include "Bridges/Barriers.h"
#include "Bridges/FeedSettings.h"
#include "Bridges/PublicValues.h"
#include "Foundation/Dictionary.h"
#include "Model/AgentLink.h"
#include "Model/ClientCore.h"

using namespace Foundation;
using namespace Orvane;

// The life of a feed: subscribing, and being found again in a new database.

void OVFeedInternal::_initWithFeedCore(FeedCore* feedCore, SubscriptionCore* subscriptionCore,
                                       OVObject* owner) {
    setOwner(owner);
    setFeedCore(feedCore);
    mURL = textOf(feedCore->mURL.getValue()).value_or("");
    if (subscriptionCore) adopt(subscriptionCore);
}

bool OVFeedInternal::_addToClient(ClientCore& client) {
    requireParameter(!_subscriptionCore(), "-[OVFeed _addToClient:]",
                     "OVFeed already added to a OVClient");
    const Ref<Dictionary> settings = dictionaryOf(mTemporarySettings);
    const Ref<SubscriptionCore> made = client.createSubscription(_feedCore(), settings.get());
    if (!made.get()) return false;
    if (made->getExistingOVObject()) {
        gLog.log("OVClient %@ can't add %@: already has a feed with that URL", &client, getOwner());
        return false;
    }
    mTemporarySettings.reset();
    stopListening();
    adopt(made.get());
    return true;
}

void OVFeedInternal::adopt(SubscriptionCore* subscription) {
    setCore(subscription, getOwner());
    setFeedCore(subscription->getFeed());
    resetUnreadCount();
    const ClientCore* client = subscription->getClient();
    mClientSignature = client ? textOf(client->mSignature.getValue()).value_or("") : "";
}

bool OVFeedInternal::_remove() {
    SubscriptionCore* subscription = _subscriptionCore();
    if (!subscription) return true;
    const bool isDeleted = reporting("-[OVFeed _remove]", [&] {
        AgentLink::current().deleteSubscription(subscription);
        return true;
    });
    if (!isDeleted) return false;
    stopListening();
    becomeUnsubscribed();
    return true;
}

/// Goes on as a feed in memory of the same URL.
void OVFeedInternal::becomeUnsubscribed() {
    _endRefresh();
    setCore(nullptr, getOwner());
    _feedCore()->unload();
    const Ref<URL> url = urlOf(mURL);
    Ref<FeedCore> fresh = FeedCore::createFeed(url.get(), false);
    if (!fresh.get()) {
        // Without whoever fetches feeds it is a feed all the same.
        fresh = Returner<FeedCore>::adopted(new FeedCore);
        fresh->mURL.setValue(url.get());
    }
    setFeedCore(fresh.get());
    resetUnreadCount();
}

Ref<Core> OVFeedInternal::findAgain() {
    const Ref<String> signature = stringOf(mClientSignature);
    const Ref<ClientCore> client = ClientCore::existingClientWithSignature(signature.get());
    if (!client.get()) return nullptr;
    const Ref<URL> url = urlOf(mURL);
    const Ref<SubscriptionCore> again = client->getSubscription(url.get());
    return Ref<Core>(again);
}

void OVFeedInternal::foundAgain() {
    if (isLost()) {
        becomeUnsubscribed();
    } else {
        setFeedCore(_subscriptionCore()->getFeed());
    }
}

std::optional<OVFeedSettings> OVFeedInternal::getSettings() const {
    if (!_subscriptionCore()) return mTemporarySettings;
    return settingsOf(_subscriptionCore());
}

void OVFeedInternal::setSettings(const std::optional<OVFeedSettings>& settings) {
    if (!_subscriptionCore()) {
        mTemporarySettings = settings;
        gLogAPI.log("Storing in-memory settings for unsubscribed feed %@", getOwner());
        return;
    }
    applySettings(settings.value_or(OVFeedSettings::defaultFeedSettings()), *_subscriptionCore());
}
