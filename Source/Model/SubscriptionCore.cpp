#include "Model/SubscriptionCore.h"

#include "Foundation/ArrayOf.h"
#include "Foundation/AssertionFailure.h"
#include "Foundation/Logger.h"
#include "Foundation/NotificationCenter.h"
#include "Model/ClientCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"
#include "Model/MinistryOfTruth.h"
#include "Model/PublicObjects.h"
#include "SQLite/Database.h"
#include "SQLite/Transaction.h"

namespace Orvane {

using Foundation::ArrayOf;
using Foundation::gLog;
using Foundation::IsEqual;
using Foundation::MutableArrayOf;
using Foundation::Ref;
using Foundation::Returner;
using SQLite::column;
using SQLite::Cursor;
using SQLite::gDatabase;
using SQLite::Query;
using SQLite::TableOf;

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

void SubscriptionCore::setClient(ClientCore* client) {
    // The old client may have the last reference. An object that nobody owns yet must not get one.
    const Ref<SubscriptionCore> self = getRefCount() > 0 ? this : nullptr;
    const Ref<ClientCore> old = mClient.getValue();
    if (IsEqual(old.get(), client)) return;
    mClient.setValue(client);
    if (old.get()) old->removeFromSubscriptions(this);
    if (client) client->addToSubscriptions(this);
}

FeedCore* SubscriptionCore::getFeed() const {
    return mFeed.getValue();
}

void SubscriptionCore::setFeed(FeedCore* feed) {
    // The old feed may have the last reference. An object that nobody owns yet must not get one.
    const Ref<SubscriptionCore> self = getRefCount() > 0 ? this : nullptr;
    const Ref<FeedCore> old = mFeed.getValue();
    if (IsEqual(old.get(), feed)) return;
    mFeed.setValue(feed);
    if (old.get()) old->removeFromSubscriptions(this);
    if (feed) feed->addToSubscriptions(this);
}

int SubscriptionCore::getEntryCount(bool all) const {
    OV_ASSERT_AS(!isClientSettings(), "!this->isClientSettings()");
    OV_ASSERT_MESSAGE_AS(!TableOf<EntryCore>::instance()->isChanged(),
                         "!TableOf<EntryCore>::instance()->isChanged()",
                         "getEntryCount called with unsaved entries");
    static auto* const sAll =
        new Query(gDatabase, "select count(*) from Entries where feed=? and localDateCreated>?");
    static auto* const sUnread = new Query(
        gDatabase, "select count(*) from Entries where feed=? and localDateCreated>? and read=0");
    Query& query = all ? *sAll : *sUnread;
    query.bindRowID(1, mFeed.getRowID());
    query.bind(2, mExpirationDate.getValue());
    const int count = Cursor(query).intColumn(0);
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

void SubscriptionCore::notifyRefreshScheduleChanged() const {
    // The object of a notification is there to be known by.
    Foundation::NotificationCenter::getLocal()->post(kRefreshScheduleChangedNotification,
                                                     const_cast<SubscriptionCore*>(this), nullptr);
}

bool SubscriptionCore::startRefresh() {
    FeedCore* feed = getFeed();
    return feed && feed->startRefresh();
}

Returner<ArrayOf<FeedCore>> SubscriptionCore::getSubscribedFeeds() {
    static auto* const sQuery =
        new Query(gDatabase,
                  "select feed from Subscriptions where refreshInterval>=0 and feed>0"
                  " group by feed");
    Ref<MutableArrayOf<FeedCore>> feeds = MutableArrayOf<FeedCore>::array();
    for (Cursor cursor(*sQuery); cursor.hasRow(); cursor.nextRow()) {
        Ref<FeedCore> feed;
        if (cursor.getObject(0, feed)) feeds->add(feed);
    }
    return Returner<MutableArrayOf<FeedCore>>(std::move(feeds));
}

void SubscriptionCore::saveChanges() {
    const Ref<SubscriptionCore> self = this;
    CoreOf::saveChanges();
    // Owners that are not in memory have no new subscriptions.
    ClientCore* client = TableOf<ClientCore>::instance()->cachedRowWithID(mClient.getRowID());
    if (client) client->mSubscriptions.removeSaved(this);
    FeedCore* feed = TableOf<FeedCore>::instance()->cachedRowWithID(mFeed.getRowID());
    if (feed) feed->mSubscriptions.removeSaved(this);
}

void SubscriptionCore::deleteRow() {
    gLog.log("Deleting %@", this);
    const Ref<FeedCore> feed = getFeed();
    if (!feed.get() || getRowID() == 0) {
        forgetOwners();
        return CoreOf::deleteRow();
    }
    const SQLite::Transaction transaction(true);
    Query query(getTable()->getDatabase(), "select count(*) from Subscriptions where feed=?");
    query.bind(1, feed.get());
    const int n = Cursor(query).intColumn(0);
    OV_ASSERT_AS(n > 0, "n>0");
    CoreOf::deleteRow();
    MinistryOfTruth::instance()->saveSubscriptionsSoon();
    if (n == 1) feed->deleteRow();
}

/// One that was never saved must not be saved by what it belonged to.
void SubscriptionCore::forgetOwners() {
    const Ref<SubscriptionCore> self = getRefCount() > 0 ? this : nullptr;
    if (ClientCore* client = getClient()) client->mSubscriptions.remove(this);
    if (FeedCore* feed = getFeed()) feed->mSubscriptions.remove(this);
}

void SubscriptionCore::ipcDidChangeColumn(int) {
    MinistryOfTruth::instance()->saveSubscriptionsSoon();
}

OVObject* SubscriptionCore::createOVObject() {
    return PublicObjects::makeFor(this);
}

}  // namespace Orvane
