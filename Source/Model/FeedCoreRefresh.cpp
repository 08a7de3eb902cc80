#include "Foundation/Date.h"
#include "Foundation/DictionaryOf.h"
#include "Foundation/Logger.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/Number.h"
#include "Model/AgentLink.h"
#include "Model/FeedCore.h"
#include "Model/FeederFactory.h"
#include "Model/SubscriptionCore.h"

#include <algorithm>

// When a feed is refreshed, and what its feeder tells it.

namespace Orvane {

using Foundation::Date;
using Foundation::MutableDictionary;
using Foundation::NetError;
using Foundation::NotificationCenter;
using Foundation::Number;
using Foundation::Ref;

double FeedCore::sMinimumRefreshInterval = 60.0;

double FeedCore::getRefreshInterval() const {
    if (!getTable()) return kRefreshNever;
    double shortest = kRefreshNever;
    for (auto subscription = getSubscriptions(nullptr); subscription.hasRow();
         subscription.nextRow()) {
        shortest = std::min(shortest, subscription->getCurrentRefreshInterval());
    }
    return std::max(shortest, sMinimumRefreshInterval);
}

Foundation::DateReturner FeedCore::getNextRefreshDate() const {
    const double interval = getRefreshInterval();
    if (interval == kRefreshNever) return nullptr;
    const Date* last = mRefreshLocalDate.getValue();
    return last ? last->addTime(interval) : Date::now();
}

FeedRefresher* FeedCore::getFeeder() {
    if (mFeeder.get()) return mFeeder.get();
    FeederFactory* factory = FeederFactory::current();
    if (!factory) return nullptr;
    mFeeder = factory->makeFeeder(this);
    mFeeder->mRefreshStarted.setReceiver(receiver<FeedRefresher>(this, &FeedCore::refreshStarted));
    mFeeder->mFetchStarted.setReceiver(receiver<FeedRefresher>(this, &FeedCore::fetchStarted));
    mFeeder->mRefreshFinished.setReceiver(
        receiver<FeedRefresher>(this, &FeedCore::refreshFinished));
    return mFeeder.get();
}

void FeedCore::removeFeeder() {
    if (!mFeeder.get()) return;
    const Ref<FeedRefresher> feeder = mFeeder;
    feeder->removed();
    // Others may hold it, and it has nothing to tell any more.
    feeder->mRefreshStarted.setReceiver(nullptr);
    feeder->mFetchStarted.setReceiver(nullptr);
    feeder->mRefreshFinished.setReceiver(nullptr);
    mFeeder = nullptr;
}

bool FeedCore::needsRefresh() {
    const FeedRefresher* feeder = getFeeder();
    return feeder && feeder->needsRefresh();
}

bool FeedCore::refresh(bool force, bool queued) {
    FeedRefresher* feeder = getFeeder();
    return feeder && feeder->refresh(force, queued);
}

bool FeedCore::startRefresh() {
    if (isChangeable()) return refresh(false, true);
    return AgentLink::current().refresh(this, true).code == 0;
}

void FeedCore::refreshStarted(FeedRefresher*) {
    gLogSub.log("Started refresh of %@", this);
    NotificationCenter::getLocal()->post(kWillRefreshNotification, this, nullptr);
}

void FeedCore::fetchStarted(FeedRefresher*) {
    gLogSub.log("Started actual HTTP fetch of %@", this);
    NotificationCenter::getLocal()->post(kBeganUpdateLocalNotification, this, nullptr);
}

void FeedCore::refreshFinished(FeedRefresher* feeder) {
    gLogSub.log("Ended refresh of %@", this);
    const Ref<MutableDictionary> info = MutableDictionary::dictionary();
    const NetError status = feeder->getStatus();
    if (status.code != 0) {
        info->set("ErrorDomain", Number::number(status.domain));
        info->set("ErrorCode", Number::number(status.code));
    }
    if (feeder->hasChanged()) info->set("DidChange", Number::number(true));
    NotificationCenter::getLocal()->post(kEndedUpdateLocalNotification, this, info);
}

}  // namespace Orvane
