#include "Bridges/OVFeedInternal.h"

#include "Bridges/Barriers.h"
#include "Bridges/FeedSettings.h"
#include "Bridges/OVClientInternal.h"
#include "Bridges/PublicObjectFactory.h"
#include "Bridges/PublicValues.h"
#include "Foundation/AssertionFailure.h"
#include "Foundation/Dictionary.h"
#include "Foundation/Guard.h"
#include "Foundation/NetException.h"
#include "Foundation/NotificationCenter.h"
#include "Model/AgentLink.h"
#include "Model/ClientCore.h"

using namespace Foundation;
using namespace Orvane;

// The life of a feed: subscribing, and being found again in a new database.

std::shared_ptr<OVFeed> OVFeedInternal::_initWithFeedCore(FeedCore* feedCore,
                                                          SubscriptionCore* subscriptionCore) {
    if (!feedCore) return nullptr;
    auto internal = std::make_unique<OVFeedInternal>();
    OVFeedInternal& state = *internal;
    std::shared_ptr<OVFeed> made(new OVFeed(std::move(internal)));
    state.setOwner(made.get());
    state.mFeedCore = feedCore;
    state.mURL = textOf(feedCore->mURL.getValue()).value_or("");
    if (subscriptionCore) state.adopt(subscriptionCore);
    return made;
}

OVFeedInternal::~OVFeedInternal() {
    callGuarded("OVFeedInternal::~OVFeedInternal()", [this] {
        stopListening();
        mFeedCore = nullptr;
    });
}

FeedCore& OVFeedInternal::core() const {
    if (isLost()) throw NetException(NetError::kOrvane, OVInvalidRowIDError);
    return *mFeedCore;
}

SubscriptionCore* OVFeedInternal::_subscriptionCore() const {
    return static_cast<SubscriptionCore*>(getCore());
}

std::shared_ptr<OVFeed> OVFeedInternal::self() const {
    return std::static_pointer_cast<OVFeed>(getOwner()->shared_from_this());
}

std::shared_ptr<OVClient> OVFeedInternal::client() const {
    const SubscriptionCore* subscription = _subscriptionCore();
    return subscription ? publicObject<OVClient>(subscription->getClient()) : nullptr;
}

bool OVFeedInternal::_addToClient(ClientCore& client) {
    requireParameter(!_subscriptionCore(), "-[OVFeed _addToClient:]",
                     "OVFeed already added to a OVClient");
    const Ref<Dictionary> settings = dictionaryOf(mTemporarySettings);
    const Ref<SubscriptionCore> made = client.createSubscription(mFeedCore.get(), settings.get());
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
    mFeedCore = subscription->getFeed();
    mUnreadCount = -1;
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
    mFeedCore->unload();
    const Ref<URL> url = urlOf(mURL);
    Ref<FeedCore> fresh = FeedCore::createFeed(url.get(), false);
    if (!fresh.get()) {
        // Without whoever fetches feeds it is a feed all the same.
        fresh = Returner<FeedCore>::adopted(new FeedCore);
        fresh->mURL.setValue(url.get());
    }
    mFeedCore = fresh;
    mUnreadCount = 0;
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
        mFeedCore = _subscriptionCore()->getFeed();
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
