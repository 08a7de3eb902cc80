#include "Foundation/ArrayOf.h"
#include "Foundation/AssertionFailure.h"
#include "Foundation/Date.h"
#include "Foundation/GregorianDate.h"
#include "Foundation/Logger.h"
#include "Model/AgentLink.h"
#include "Model/ClientCore.h"
#include "Model/FeedCore.h"
#include "Model/MinistryOfTruth.h"
#include "Model/SubscriptionCore.h"

// What a subscription, or a client for all of its own, is set to, and what follows from that.

namespace Orvane {

using Foundation::ArrayOf;
using Foundation::Date;
using Foundation::GregorianDate;
using Foundation::Ref;
using Foundation::String;

double SubscriptionCore::orDefault(double value, double constant) const {
    return value == 0 && isClientSettings() ? constant : value;
}

void SubscriptionCore::setRefreshInterval(double seconds) {
    seconds = orDefault(seconds, kDefaultRefreshInterval);
    if (seconds == mRefreshInterval) return;
    mRefreshInterval.setValue(seconds);
    notifyRefreshScheduleChanged();
}

void SubscriptionCore::setExpirationInterval(double seconds) {
    seconds = orDefault(seconds, kDefaultExpirationInterval);
    if (seconds == mExpirationInterval) return;
    mExpirationInterval.setValue(seconds);
    if (!bumpExpirationDate(nullptr)) return;
    if (isClientSettings()) {
        bumpThoseOfDefaultInterval();
    } else {
        updateUnreadCount();
    }
}

void SubscriptionCore::bumpThoseOfDefaultInterval() {
    const ClientCore* client = getClient();
    if (!client) return;
    for (auto subscription = client->getSubscriptions(nullptr); subscription.hasRow();
         subscription.nextRow()) {
        const Foundation::AutoreleasePool pool;
        if (subscription->mExpirationInterval != 0) continue;
        if (subscription->bumpExpirationDate(nullptr)) subscription->updateUnreadCount();
    }
}

void SubscriptionCore::setMaxEnclosureSize(double bytes) {
    bytes = orDefault(bytes, kDefaultMaxEnclosureSize);
    if (bytes == mMaxEnclosureSize) return;
    mMaxEnclosureSize.setValue(bytes);
}

void SubscriptionCore::setSettings(double refreshInterval, double expirationInterval,
                                   bool refreshesInBackground, bool downloadsEnclosures,
                                   double maxEnclosureSize, ArrayOf<String>* enclosureTypes) {
    const Ref<String> types = serializeEnclosureTypes(enclosureTypes);
    if (refreshInterval == mRefreshInterval && expirationInterval == mExpirationInterval &&
        refreshesInBackground == mRefreshesInBackground &&
        downloadsEnclosures == mDownloadsEnclosures && maxEnclosureSize == mMaxEnclosureSize &&
        types->view() == String::view(mEnclosureTypesString)) {
        return;
    }
    if (isChangeable()) {
        return setSettingsActual(refreshInterval, expirationInterval, refreshesInBackground,
                                 downloadsEnclosures, maxEnclosureSize, types);
    }
    AgentLink::current().updateSubscription(this, refreshInterval, expirationInterval,
                                            refreshesInBackground, downloadsEnclosures,
                                            maxEnclosureSize, enclosureTypes);
    unload();
}

void SubscriptionCore::setSettingsActual(double refreshInterval, double expirationInterval,
                                         bool refreshesInBackground, bool downloadsEnclosures,
                                         double maxEnclosureSize, String* enclosureTypes) {
    setRefreshInterval(refreshInterval);
    setExpirationInterval(expirationInterval);
    mRefreshesInBackground.setValue(refreshesInBackground);
    mDownloadsEnclosures.setValue(downloadsEnclosures);
    setMaxEnclosureSize(maxEnclosureSize);
    mEnclosureTypesString.setValue(String::isEmpty(enclosureTypes) ? nullptr : enclosureTypes);
    MinistryOfTruth::instance()->saveSubscriptionsSoon();
}

void SubscriptionCore::setDefaultSettings() {
    if (isClientSettings()) {
        mExpirationInterval.setValue(kDefaultExpirationInterval);
        mRefreshInterval.setValue(kDefaultRefreshInterval);
        mMaxEnclosureSize.setValue(kDefaultMaxEnclosureSize);
        mRefreshesInBackground.setValue(kDefaultBackground);
        mDownloadsEnclosures.setValue(kDefaultAutoDownload);
    } else {
        ClientCore* client = getClient();
        OV_ASSERT_AS(client != nullptr, "client");
        const SubscriptionCore* settings = client->getDefaultSubscription();
        mExpirationInterval.setValue(0);
        mRefreshInterval.setValue(0);
        mMaxEnclosureSize.setValue(0);
        mRefreshesInBackground.setValue(settings->mRefreshesInBackground);
        mDownloadsEnclosures.setValue(settings->mDownloadsEnclosures);
    }
    if (mExpirationInterval >= 0 && bumpExpirationDate(nullptr)) updateUnreadCount();
    MinistryOfTruth::instance()->saveSubscriptionsSoon();
}

double SubscriptionCore::getCurrentRefreshInterval() const {
    ClientCore* client = getTable() ? getClient() : nullptr;
    if (!client) return FeedCore::kRefreshNever;
    if (!mRefreshesInBackground && !client->isProcessRunning()) return FeedCore::kRefreshNever;
    if (client->isDormant()) return FeedCore::kRefreshNever;
    double interval = mRefreshInterval;
    if (interval == 0) interval = client->getDefaultSubscription()->mRefreshInterval;
    if (interval == 0) return kDefaultRefreshInterval;
    if (interval < 0) return FeedCore::kRefreshNever;
    return interval;
}

bool SubscriptionCore::bumpExpirationDate(Date* date) {
    double interval = mExpirationInterval;
    ClientCore* client = interval == 0 ? getClient() : nullptr;
    if (client) interval = client->getDefaultSubscription()->mExpirationInterval;
    if (!(interval > 0)) return false;
    const Ref<Date> start = date ? Ref<Date>(date) : today();
    const Ref<Date> expiration = start->addTime(-interval);
    // The start of the count stands for no date.
    if (!expiration.get()) return false;
    const Date* present = mExpirationDate;
    if (present && present->compare(*expiration) >= 0) return false;
    mExpirationDate.setValue(expiration);
    gLogAgent.log("Bumped exp date to %@ for %@", expiration, this);
    return true;
}

Ref<Date> SubscriptionCore::today() {
    GregorianDate midnight(Date::now());
    midnight.hour = 0;
    midnight.minute = 0;
    midnight.second = 0;
    return midnight.getDate();
}

}  // namespace Orvane
