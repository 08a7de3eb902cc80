#include "Net/Feeder.h"

#include "Foundation/Guard.h"
#include "Foundation/Logger.h"
#include "Foundation/NetworkConfig.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/NotificationNames.h"
#include "Model/FeedCore.h"
#include "SQLite/Database.h"
#include "SQLite/Table.h"

namespace Orvane {

using Foundation::NetError;
using Foundation::NetworkConfig;
using Foundation::NotificationCenter;
using Foundation::Ref;

Feeder::Feeder(const Ref<FeedCore>& feed)
    : mFeed(feed.get()),
      mURL(feed->mURL.getValue()),
      mCancelReceiver(this, &Feeder::cancelBackgroundRefresh) {
    NotificationCenter::getLocal()->addObserver(
        &mCancelReceiver, Foundation::NotificationNames::kCancelBackgroundRefreshes, nullptr);
}

Feeder::~Feeder() {
    NotificationCenter::getLocal()->removeObserver(&mCancelReceiver);
}

void Feeder::removed() {
    mFeed = nullptr;
    if (!mRefreshing) return;
    mChanged = false;
    endedRefresh(NetError::None);
}

bool Feeder::refresh(bool force, bool queued) {
    if (mRefreshing) return true;
    if (!mFeed) return false;
    const Ref<Feeder> alive(this);
    mForce = force;
    mQueued = queued;
    mStatus = NetError::None;
    mLinks = nullptr;
    // Who hears that it fetches may remove the feed.
    if (!doRefresh() || !mFeed) {
        mForce = false;
        return false;
    }
    gLogFeed.log("Starting refresh of %@", mFeed);
    mChanged = false;
    mRefreshing = true;
    mRefreshStarted.invoke(this);
    return true;
}

void Feeder::endedRefresh(bool changed) {
    mChanged = changed;
    if (mRefreshing) endedRefresh(NetError::None);
}

void Feeder::endedRefresh(NetError error) {
    gLogFeed.log("Ending refresh of %@ (status=%@, changed=%i)%s", mFeed, error, mChanged ? 1 : 0,
                 mRefreshing ? " refreshing" : "");
    mStatus = error;
    // Whatever cannot be saved now is saved later; but a refresh that never ended would be the
    // feed's last.
    if (mFeed) {
        Foundation::callGuarded("void Orvane::Feeder::endedRefresh(NetError)",
                                [&] { save(storeError(error)); });
    }
    mForce = false;
    if (!mRefreshing) return;
    mRefreshing = false;
    mRefreshFinished.invoke(this);
}

/// Whether the feed has another error now.
bool Feeder::storeError(NetError error) {
    const NetError last = mFeed->getLastError();
    if (error == last) return false;
    // That the network is down must not hide what the server said.
    const bool hides = NetworkConfig::isConfigError(error) && last.code != 0 &&
                       !NetworkConfig::isConfigError(last);
    if (hides) return false;
    mFeed->setLastError(error);
    return true;
}

void Feeder::save(bool atOnce) {
    const SQLite::Table* table = mFeed->getTable();
    if (!mFeed->isChanged() || !table || !table->getDatabase()) return;
    if (atOnce) {
        table->getDatabase()->saveRows();
    } else {
        table->getDatabase()->saveRowsSoon();
    }
}

void Feeder::cancelBackgroundRefresh(Foundation::Notification*) {
    if (!mRefreshing || !mQueued) return;
    const Ref<Feeder> alive(this);
    cancelRefresh();
    endedRefresh(NetError::None);
}

}  // namespace Orvane
