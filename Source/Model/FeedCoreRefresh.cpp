#include "Foundation/AssertionFailure.h"
#include "Foundation/ClockTrust.h"
#include "Foundation/Date.h"
#include "Foundation/DictionaryOf.h"
#include "Foundation/Logger.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/Number.h"
#include "Foundation/URL.h"
#include "Model/AgentLink.h"
#include "Model/FeedCore.h"
#include "Model/FeederFactory.h"
#include "Model/SubscriptionCore.h"

#include <algorithm>
#include <stdexcept>

// When a feed is refreshed, and what its feeder tells it.

namespace Orvane {

using Foundation::Date;
using Foundation::IsEqual;
using Foundation::MutableDictionary;
using Foundation::NetError;
using Foundation::NotificationCenter;
using Foundation::Number;
using Foundation::Ref;

namespace {

void requireIdentity(const FeedCore& feed, const FeedCore& newFeed) {
    const Foundation::String* mine = feed.getIdentifier();
    const Foundation::String* theirs = newFeed.getIdentifier();
    if (IsEqual(mine, theirs)) return;
    Foundation::gWarn.log(
        "FeedCore::updateFrom: newFeed's hash '%@' (for URL <%@>) doesn't match mine '%@' "
        "(URL <%@>)",
        theirs, newFeed.mURL.getValue(), mine, feed.mURL.getValue());
    throw std::runtime_error("New feed's ID is different from old feed's");
}

}  // namespace

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
    // One that a wrong clock has left would keep the feed waiting until then.
    if (!last || Foundation::ClockTrust::isFromWrongClock(last)) return Date::now();
    return last->addTime(interval);
}

void FeedCore::setReceivers(FeedRefresher& feeder, FeedCore* feed) {
    const auto set = [&](ActionOf<FeedRefresher>& action,
                         void (FeedCore::*method)(FeedRefresher*)) {
        action.setReceiver(feed ? receiver<FeedRefresher>(feed, method) : nullptr);
    };
    set(feeder.mRefreshStarted, &FeedCore::refreshStarted);
    set(feeder.mFetchStarted, &FeedCore::fetchStarted);
    set(feeder.mRefreshFinished, &FeedCore::refreshFinished);
}

FeedRefresher* FeedCore::getFeeder() {
    if (mFeeder.get()) return mFeeder.get();
    FeederFactory* factory = FeederFactory::current();
    if (!factory) return nullptr;
    mFeeder = factory->makeFeeder(this);
    setReceivers(*mFeeder, this);
    return mFeeder.get();
}

void FeedCore::removeFeeder() {
    if (!mFeeder.get()) return;
    const Ref<FeedRefresher> feeder = mFeeder;
    feeder->removed();
    // Others may hold it, and it has nothing to tell any more.
    setReceivers(*feeder, nullptr);
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

bool FeedCore::updateFrom(FeedCore* newFeed, bool force) {
    Foundation::URL* url = mURL.getValue();
    gLogSub.log("Updating feed <%@>", url);
    OV_ASSERT_AS(IsEqual(url, newFeed->mURL.getValue()), "url->isEqual(newFeed->getURL())");
    if (mLocalDateUpdated.getValue() && getRowID() != 0) requireIdentity(*this, *newFeed);
    Date* date = newFeed->mDateUpdated.getValue();
    if (date && !force && IsEqual(date, mDateUpdated.getValue())) {
        gLogSub.log("...No-op: Feed date remained %@", date);
        return false;
    }
    mID.setValue(newFeed->mID);
    Foundation::URL* redirected = newFeed->mRedirectedURL.getValue();
    if (IsEqual(redirected, url)) redirected = nullptr;
    if (redirected) gLogSub.log("    ...was redirected to <%@>", redirected);
    mRedirectedURL.setValue(redirected);
    mFeedFormat.setValue(newFeed->mFeedFormat);
    mTitle.setValue(newFeed->mTitle);
    mSubtitle.setValue(newFeed->mSubtitle);
    mAlternateURL.setValue(newFeed->mAlternateURL);
    mRights.setValue(newFeed->mRights);
    mIconURL.setValue(newFeed->mIconURL);
    mLogoURL.setValue(newFeed->mLogoURL);
    mDateUpdated.setValue(date);
    mLocalDateUpdated.setValue(Date::now());
    return true;
}

FeedCore::ReadState FeedCore::getReadState() const {
    return {mDateUpdated.getValue(), mLocalDateUpdated.getValue(), mRefreshHTTPDate.getValue(),
            mRefreshETag.getValue(), mRefreshDataHash.getValue()};
}

void FeedCore::setReadState(const ReadState& state) {
    mDateUpdated.setValue(state.dateUpdated);
    mLocalDateUpdated.setValue(state.localDateUpdated);
    mRefreshHTTPDate.setValue(state.httpDate);
    mRefreshETag.setValue(state.etag);
    mRefreshDataHash.setValue(state.dataHash);
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
