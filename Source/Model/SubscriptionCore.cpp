#include "Model/SubscriptionCore.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Logger.h"
#include "Foundation/NotificationCenter.h"
#include "Model/ClientCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"
#include "Model/PublicObjects.h"

namespace Orvane {

using SQLite::column;

const char SubscriptionCore::kSchema[] =
    "rowID integer not null unique primary key, "
    "client integer references Clients(rowID) not null, feed integer references Feeds(rowID), "
    "refreshInterval real, expirationInterval real, expirationDate real, "
    "refreshesInBackground integer, downloadsEnclosures integer, maxEnclosureSize real, "
    "enclosureTypesString text, unreadCount integer";

const SQLite::Table::IndexSpec SubscriptionCore::kSchemaIndexes[] = {
    {"Subscriptions_feedandclient", "feed, client"},
    {"Subscriptions_nonbackground", "client, refreshesInBackground, refreshInterval"},
    {nullptr, nullptr},
};

const SQLite::ColumnList& SubscriptionCore::columnList() {
    static const SQLite::ColumnList sColumns = {
        column<&SubscriptionCore::mClient>("client"),
        column<&SubscriptionCore::mFeed>("feed"),
        column<&SubscriptionCore::mRefreshInterval>("refreshInterval"),
        column<&SubscriptionCore::mExpirationInterval>("expirationInterval"),
        column<&SubscriptionCore::mExpirationDate>("expirationDate"),
        column<&SubscriptionCore::mRefreshesInBackground>("refreshesInBackground"),
        column<&SubscriptionCore::mDownloadsEnclosures>("downloadsEnclosures"),
        column<&SubscriptionCore::mMaxEnclosureSize>("maxEnclosureSize"),
        column<&SubscriptionCore::mEnclosureTypesString>("enclosureTypesString"),
        column<&SubscriptionCore::mUnreadCount>("unreadCount"),
    };
    return sColumns;
}

ClientCore* SubscriptionCore::getClient() const {
    return mClient.getValue();
}

FeedCore* SubscriptionCore::getFeed() const {
    return mFeed.getValue();
}

void SubscriptionCore::setFeed(FeedCore* feed) {
    const Foundation::Ref<FeedCore> old = mFeed.getValue();
    if (Foundation::IsEqual(old.get(), feed)) return;
    mFeed.setValue(feed);
    if (old.get()) old->removeFromSubscriptions(this);
    if (feed) feed->addToSubscriptions(this);
}

double SubscriptionCore::getCurrentRefreshInterval() const {
    const ClientCore* client = getTable() ? getClient() : nullptr;
    if (!client) return FeedCore::kRefreshNever;
    if (!mRefreshesInBackground && !client->isProcessRunning()) return FeedCore::kRefreshNever;
    if (client->isDormant()) return FeedCore::kRefreshNever;
    double interval = mRefreshInterval;
    if (interval == 0) {
        const Foundation::Ref<SubscriptionCore> settings = client->_getSubscription(0);
        interval = settings.get() ? settings->mRefreshInterval.getValue() : 0;
    }
    if (interval == 0) return kDefaultRefreshInterval;
    return interval > 0 ? interval : FeedCore::kRefreshNever;
}

int SubscriptionCore::getEntryCount(bool all) const {
    static auto* const sAll =
        new SQLite::Query(getTable()->getDatabase(),
                          "select count(*) from Entries where feed=? and localDateCreated>?");
    static auto* const sUnread = new SQLite::Query(
        getTable()->getDatabase(),
        "select count(*) from Entries where feed=? and localDateCreated>? and read=0");
    OV_ASSERT_AS(!isClientSettings(), "!this->isClientSettings()");
    OV_ASSERT_MESSAGE_AS(!SQLite::TableOf<EntryCore>::instance()->isChanged(),
                         "!TableOf<EntryCore>::instance()->isChanged()",
                         "getEntryCount called with unsaved entries");
    SQLite::Query& query = all ? *sAll : *sUnread;
    query.bindRowID(1, mFeed.getRowID());
    query.bind(2, mExpirationDate.getValue());
    const int count = SQLite::Cursor(query).intColumn(0);
    gLogFeed.log("%@ computed %s count = %u", this, all ? "entry" : "unread", count);
    return count;
}

bool SubscriptionCore::updateUnreadCount() {
    if (isClientSettings()) return false;
    const int old = mUnreadCount;
    const int count = getEntryCount(false);
    mUnreadCount.setValue(count);
    if (count == old) return false;
    gLogSub.log("Unread count of %@ is now %u", this, count);
    Foundation::NotificationCenter::getLocal()->post(kUnreadCountChangedNotification, this,
                                                     nullptr);
    return true;
}

OVObject* SubscriptionCore::createOVObject() {
    return PublicObjects::makeFor(this);
}

}  // namespace Orvane
