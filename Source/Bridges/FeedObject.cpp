#include "Bridges/FeedObject.h"

#include "Bridges/ClientDelegates.h"
#include "Bridges/PublicObject.h"
#include "Foundation/Guard.h"
#include "Foundation/NetException.h"
#include "Model/ClientCore.h"

#include <Orvane/OVClient.h>

namespace Orvane {

FeedObject::~FeedObject() {
    Foundation::callGuarded("FeedObject::~FeedObject()", [this] { mFeedCore = nullptr; });
}

FeedCore& FeedObject::core() const {
    if (isLost()) {
        throw Foundation::NetException(Foundation::NetError::kOrvane, OVInvalidRowIDError);
    }
    return *mFeedCore;
}

SubscriptionCore* FeedObject::_subscriptionCore() const {
    return static_cast<SubscriptionCore*>(getCore());
}

std::shared_ptr<OVFeed> FeedObject::self() const {
    return std::static_pointer_cast<OVFeed>(getOwner()->shared_from_this());
}

std::shared_ptr<OVClient> FeedObject::client() const {
    const SubscriptionCore* subscription = _subscriptionCore();
    return subscription ? publicObject<OVClient>(subscription->getClient()) : nullptr;
}

void FeedObject::post(const char* name, std::map<std::string, OVNotification::List> info) const {
    OVNotificationCenter::defaultCenter().post({name, self(), std::move(info)});
}

void FeedObject::tellDelegate(const Told& call) const {
    const SubscriptionCore* subscription = _subscriptionCore();
    if (!subscription) return;
    ClientDelegates::tell(subscription->getClient(),
                          [&](OVClientDelegate& delegate) { call(delegate, self()); });
}

}  // namespace Orvane
