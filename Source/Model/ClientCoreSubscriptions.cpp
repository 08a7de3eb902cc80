#include "Foundation/AssertionFailure.h"
#include "Foundation/Clock.h"
#include "Foundation/Date.h"
#include "Foundation/Logger.h"
#include "Foundation/URL.h"
#include "Model/AgentLink.h"
#include "Model/ClientCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"
#include "Model/Housekeeping.h"
#include "Model/SubscriptionCore.h"
#include "SQLite/Database.h"
#include "SQLite/QueryOf.h"
#include "SQLite/Transaction.h"

#include <vector>

// What a client has to do with its subscriptions, and with the feeds and entries behind them.

namespace Orvane {

using Foundation::AutoreleasePool;
using Foundation::Date;
using Foundation::gLog;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;
using SQLite::Cursor;
using SQLite::Query;
using SQLite::QueryOf;
using SQLite::RowID;
using SQLite::TableOf;
using SQLite::Transaction;

SQLite::RowIterator<SubscriptionCore> ClientCore::getSubscriptions(const char* condition) const {
    return SQLite::RowIterator<SubscriptionCore>(mSubscriptions, condition);
}

void ClientCore::addToSubscriptions(SubscriptionCore* subscription) {
    mSubscriptions.add(subscription);
    subscription->setClient(this);
}

void ClientCore::removeFromSubscriptions(SubscriptionCore* subscription) {
    const Ref<SubscriptionCore> kept = subscription;
    mSubscriptions.remove(subscription);
    subscription->setClient(nullptr);
}

Returner<SubscriptionCore> ClientCore::_getSubscription(RowID feedRowID) const {
    static auto* const sQuery = new QueryOf<SubscriptionCore>(
        TableOf<SubscriptionCore>::instance(),
        "select rowID from Subscriptions  where feed=? and client=?  limit 1");
    sQuery->bindRowID(1, feedRowID);
    sQuery->bind(2, this);
    return sQuery->firstRow();
}

Returner<SubscriptionCore> ClientCore::getSubscription(const FeedCore* feed) const {
    // A feed without an ID has no subscription in the file, and 0 would find the settings.
    if (!feed || feed->getRowID() == 0) return nullptr;
    return _getSubscription(feed->getRowID());
}

Returner<SubscriptionCore> ClientCore::getSubscription(URL* url) const {
    OV_ASSERT_AS(url != nullptr, "url");
    static auto* const sQuery = new QueryOf<SubscriptionCore>(
        TableOf<SubscriptionCore>::instance(),
        "select rowID from Subscriptions where feed in (select rowID from Feeds where url=?)"
        "    and client=?  limit 1");
    sQuery->bind(1, url);
    sQuery->bind(2, this);
    return sQuery->firstRow();
}

Returner<SubscriptionCore> ClientCore::getSubscriptionWithFeedRowID(RowID feed) const {
    return _getSubscription(feed);
}

Returner<SubscriptionCore> ClientCore::getSubscriptionWithFeedIdentifier(String* identifier) const {
    OV_ASSERT_AS(identifier != nullptr, "identifier");
    static auto* const sQuery = new QueryOf<SubscriptionCore>(
        TableOf<SubscriptionCore>::instance(),
        "select s.* from Subscriptions as s, Feeds as f"
        "  where f.identifier=? and s.feed=f.rowID and s.client=?  limit 1");
    sQuery->bind(1, identifier);
    sQuery->bind(2, this);
    return sQuery->firstRow();
}

SubscriptionCore* ClientCore::getDefaultSubscription() {
    // One that its table does not know any more is not the row: it was deleted, or the database
    // was replaced.
    if (mDefaultSubscription.get() && mDefaultSubscription->isCached()) return mDefaultSubscription;
    Ref<SubscriptionCore> settings = _getSubscription(0);
    if (!settings.get()) {
        requireChangeable();
        settings = _createSubscription(nullptr);
        settings->saveChanges();
    }
    mDefaultSubscription = settings;
    return mDefaultSubscription;
}

Returner<SubscriptionCore> ClientCore::_createSubscription(FeedCore* feed) {
    Ref<SubscriptionCore> made = Returner<SubscriptionCore>::adopted(new SubscriptionCore);
    made->setClient(this);
    made->setFeed(feed);
    made->setDefaultSettings();
    made->addToTable(TableOf<SubscriptionCore>::instance());
    return Returner<SubscriptionCore>(std::move(made));
}

Returner<SubscriptionCore> ClientCore::createSubscription(URL* url, Dictionary* settings) {
    if (!isChangeable()) {
        Ref<SubscriptionCore> existing = getSubscription(url);
        if (existing.get()) return Returner<SubscriptionCore>(std::move(existing));
        return Returner<SubscriptionCore>::retained(
            AgentLink::current().createSubscription(this, url, settings));
    }
    Ref<FeedCore> feed;
    Ref<SubscriptionCore> subscription;
    try {
        const Transaction transaction(true);
        feed = FeedCore::existingFeedWithURL(url);
        if (!feed.get()) feed = FeedCore::createFeed(url, true);
        // Deliberately without the settings: the agent is told of them by a call of its own.
        if (feed.get()) subscription = createSubscription(feed.get(), nullptr);
    } catch (...) {
        _giveUpNewRows();
        giveUpNewRow(feed);
        throw;
    }
    return Returner<SubscriptionCore>(std::move(subscription));
}

Returner<SubscriptionCore> ClientCore::createSubscription(FeedCore* feed, Dictionary* settings) {
    OV_ASSERT_AS(feed != nullptr, "feed");
    if (!isChangeable()) {
        Ref<SubscriptionCore> existing = getSubscription(feed);
        if (existing.get()) return Returner<SubscriptionCore>(std::move(existing));
        return Returner<SubscriptionCore>::retained(
            AgentLink::current().createSubscription(this, feed->mURL, settings));
    }
    Ref<SubscriptionCore> subscription;
    try {
        const Transaction transaction(true);
        subscription = getSubscription(feed);
        if (!subscription.get()) subscription = _subscribe(feed);
    } catch (...) {
        _giveUpNewRows();
        giveUpNewRow(feed);
        throw;
    }
    return Returner<SubscriptionCore>(std::move(subscription));
}

Returner<SubscriptionCore> ClientCore::_subscribe(FeedCore* feed) {
    if (!feed->getTable()) {
        feed->addToTable(TableOf<FeedCore>::instance());
        feed->saveChanges();
    }
    Ref<SubscriptionCore> subscription = _createSubscription(feed);
    subscription->saveChanges();
    subscription->notifyRefreshScheduleChanged();
    return Returner<SubscriptionCore>(std::move(subscription));
}

void ClientCore::prefetchFeeds() {
    TableOf<FeedCore>* feeds = TableOf<FeedCore>::instance();
    if (feeds->getCachedRowCount() > 1) return;
    QueryOf<FeedCore> query(
        feeds,
        "select f.rowID,title,URL, localDateUpdated,lastErrorDomain,lastErrorCode"
        "   from Feeds as f, Subscriptions as s  where s.feed=f.rowID and s.client=?");
    query.bind(1, this);
    for (SQLite::CursorOf<FeedCore> cursor(query); cursor.hasRow(); cursor.nextRow()) {
        const AutoreleasePool pool;
        // The table keeps it.
        const Ref<FeedCore> feed = cursor.row();
    }
}

void ClientCore::expireAllEntries() {
    if (!isChangeable()) return AgentLink::current().expireAllEntries(this);
    const Ref<Date> now = Date::now();
    for (auto subscription = getSubscriptions(nullptr); subscription.hasRow();
         subscription.nextRow()) {
        const AutoreleasePool pool;
        subscription->mExpirationDate.setValue(now);
        subscription->mUnreadCount.setValue(0);
    }
    // What is deleted is chosen by the file.
    getTable()->getDatabase()->saveRows();
    if (Housekeeping* housekeeping = Housekeeping::current()) housekeeping->expungeOldArticles();
}

void ClientCore::refreshNonBackgroundSubscriptions() {
    static auto* const sQuery = new Query(
        SQLite::gDatabase,
        "select f.rowID from Feeds as f, Subscriptions as s where s.client=$CLIENT"
        " and s.refreshesInBackground=0 and s.refreshInterval>=0 and s.feed!=0 and s.feed=f.rowID"
        " and f.refreshLocalDate < $NOW-ifnull(nullif(s.refreshInterval,0),$DFLTINTVL)");
    double interval = getDefaultSubscription()->mRefreshInterval;
    if (interval == 0) interval = SubscriptionCore::kDefaultRefreshInterval;
    sQuery->parameterNamed("$CLIENT") = this;
    sQuery->parameterNamed("$NOW") = Foundation::Clock::current().now();
    sQuery->parameterNamed("$DFLTINTVL") = interval;
    std::vector<RowID> feeds;
    for (Cursor cursor(*sQuery); cursor.hasRow(); cursor.nextRow()) {
        feeds.push_back(cursor.int64Column(0));
    }
    if (feeds.empty()) return;
    AgentLink::current().refreshMultiple(feeds.data(), static_cast<unsigned>(feeds.size()), false);
}

Returner<EntryCore> ClientCore::getEntryWithIdentifier(String* identifier,
                                                       Ref<SubscriptionCore>& outSub) {
    OV_ASSERT_AS(identifier != nullptr, "identifier");
    outSub = nullptr;
    static auto* const sQuery =
        new Query(SQLite::gDatabase,
                  "select e.rowID, s.rowID from Entries as e, Subscriptions as s"
                  "  where e.identifier=? and e.feed=s.feed and s.client=?");
    sQuery->bind(1, identifier);
    sQuery->bind(2, this);
    const Cursor cursor(*sQuery);
    if (!cursor.hasRow()) {
        gLog.log("%@ getEntryWithIdentifier(\"%@\"): not found", this, identifier);
        return nullptr;
    }
    Ref<EntryCore> entry;
    OV_ASSERT_AS(cursor.getObject(0, entry), "entry");
    OV_ASSERT_AS(cursor.getObject(1, outSub), "outSub");
    gLog.log("%@ getEntryWithIdentifier(\"%@\") => entry=#%lli, sub=#%#lld", this, identifier,
             entry->getRowID(), outSub->getRowID());
    return Returner<EntryCore>(std::move(entry));
}

}  // namespace Orvane
