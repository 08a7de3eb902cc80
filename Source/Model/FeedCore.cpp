#include "Model/FeedCore.h"

#include "FeedParser/Text/FeedURLUtilsCore.h"
#include "Foundation/AssertionFailure.h"
#include "Foundation/Data.h"
#include "Foundation/Guard.h"
#include "Foundation/Logger.h"
#include "Foundation/URL.h"
#include "Model/AgentLink.h"
#include "Model/CredentialStore.h"
#include "Model/DocumentParser.h"
#include "Model/EntryCore.h"
#include "Model/FeederFactory.h"
#include "Model/MinistryOfTruth.h"
#include "Model/SubscriptionCore.h"
#include "SQLite/QueryOf.h"
#include "SQLite/Transaction.h"

#include <cerrno>

namespace Orvane {

using Foundation::NetError;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;
using SQLite::RowIterator;
using SQLite::TableOf;
using SQLite::Transaction;

FeedCore::~FeedCore() {
    Foundation::callGuarded("virtual Orvane::FeedCore::~FeedCore()", [this] { letGo(); });
}

void FeedCore::letGo() {
    if (mFeeder.get()) {
        // It has nobody to tell any more.
        setReceivers(*mFeeder, nullptr);
        mFeeder->removed();
    }
    // Who still holds one of the new rows must not find this behind it.
    FeedCore* const row = getRowID() != 0 ? this : nullptr;
    for (const Ref<SQLite::Row>& entry : mEntries.getNewRows()) {
        static_cast<EntryCore&>(*entry).mFeed.setValue(row);
    }
    for (const Ref<SQLite::Row>& subscription : mSubscriptions.getNewRows()) {
        static_cast<SubscriptionCore&>(*subscription).mFeed.setValue(row);
    }
}

OVObject* FeedCore::createOVObject() {
    OV_ASSERT_MESSAGE_AS(false, "false", "Can't call getOVObject on a FeedCore!");
    return nullptr;
}

namespace {

/// Where the feed is that a URL names, in whatever form; null if it names none.
Foundation::URLReturner sourceOf(Foundation::URL* url) {
    if (!FeedURLUtilsCore::isKnownURL(url)) return Foundation::URLReturner::retained(url);
    return FeedURLUtilsCore::sourceURLForFeedURL(url);
}

}  // namespace

Returner<FeedCore> FeedCore::existingFeedWithURL(Foundation::URL* url) {
    static auto* const sQuery = TableOf<FeedCore>::instance()->rowsWhere("URL=?").release();
    const Ref<Foundation::URL> source = sourceOf(url);
    if (!source.get()) return nullptr;
    sQuery->bind(1, source.get());
    return sQuery->firstRow();
}

Returner<FeedCore> FeedCore::createFeed(Foundation::URL* url, bool persist) {
    OV_ASSERT_AS(url != nullptr, "url");
    const Ref<Foundation::URL> source = sourceOf(url);
    if (!source.get()) return nullptr;
    const FeederFactory* feeders = FeederFactory::current();
    if (!feeders || !feeders->supportsURL(source)) {
        Foundation::gLog.log("FeedCore: Unsupported URL '%@'", source);
        return nullptr;
    }
    Ref<FeedCore> feed = Returner<FeedCore>::adopted(new FeedCore);
    feed->mURL.setValue(source);
    if (persist) {
        feed->getIdentifier();
        feed->addToTable(TableOf<FeedCore>::instance());
        try {
            feed->saveChanges();
        } catch (...) {
            giveUpNewRow(feed);
            throw;
        }
    }
    return feed;
}

Returner<FeedCore> FeedCore::createFeed(Foundation::Data* data, Foundation::URL* url) {
    DocumentParser* parser = DocumentParser::current();
    Ref<FeedCore> feed = parser ? parser->parseFeed(data, url) : nullptr;
    // What is identified by its URL must have one.
    if (feed.get() && !feed->mURL.getValue()) feed->mURL.setValue(url);
    return feed;
}

String* FeedCore::getIdentifier() const {
    if (String* stored = mIdentifier.getValue()) return stored;
    const Foundation::URL* url = mURL.getValue();
    OV_ASSERT_AS(url != nullptr, "url");
    const Ref<Foundation::Data> bytes = url->getData();
    const Ref<String> identifier = bytes->SHA1HashString();
    gLogSub.log("\t%@: set ident %@ based on \"%@\"", this, identifier, url);
    // What is computed is what is stored: keeping it does not change what the row is.
    if (isChangeable()) const_cast<FeedCore*>(this)->mIdentifier.setValue(identifier);
    return Foundation::StringReturner(identifier);
}

void FeedCore::preloaded() {
    getIdentifier();
}

RowIterator<EntryCore> FeedCore::getEntries(const char* condition) const {
    // That they are read first does not change what the feed has.
    if (mRecoverOldEntries) const_cast<FeedCore*>(this)->recoverOldEntries();
    return RowIterator<EntryCore>(mEntries, condition);
}

void FeedCore::addToEntries(EntryCore* entry) {
    mEntries.add(entry);
    entry->setFeed(this);
}

void FeedCore::removeFromEntries(EntryCore* entry) {
    const Ref<EntryCore> kept = entry;
    mEntries.remove(entry);
    entry->setFeed(nullptr);
}

RowIterator<SubscriptionCore> FeedCore::getSubscriptions(const char* condition) const {
    return RowIterator<SubscriptionCore>(mSubscriptions, condition);
}

void FeedCore::addToSubscriptions(SubscriptionCore* subscription) {
    mSubscriptions.add(subscription);
    subscription->setFeed(this);
}

void FeedCore::removeFromSubscriptions(SubscriptionCore* subscription) {
    const Ref<SubscriptionCore> kept = subscription;
    mSubscriptions.remove(subscription);
    subscription->setFeed(nullptr);
}

void FeedCore::updateUnreadCounts() {
    if (!getTable() || MinistryOfTruth::instance()->isRestoring()) return;
    const Transaction transaction(true);
    TableOf<EntryCore>::instance()->saveRows();
    for (auto subscription = getSubscriptions(nullptr); subscription.hasRow();
         subscription.nextRow()) {
        if (subscription->updateUnreadCount()) subscription->saveChanges();
    }
}

NetError FeedCore::getLastError() const {
    return {mLastErrorDomain.getValue(), mLastErrorCode.getValue()};
}

void FeedCore::setLastError(NetError error) {
    mLastErrorDomain.setValue(error.domain);
    mLastErrorCode.setValue(error.code);
}

void FeedCore::public_setLogin(String* login) {
    if (isChangeable()) return mLogin.setValue(login);
    AgentLink::current().setLogin(this, login);
    mLogin.unload();
}

NetError FeedCore::setPassword(String* password, bool saveInStore) {
    mPassword = password;
    if (!saveInStore) return NetError::None;
    CredentialStore* store = CredentialStore::current();
    if (!store) return {NetError::kPOSIX, ENOTSUP};
    return store->saveInternetPassword(mURL.getValue(), mLogin.getValue(), password);
}

}  // namespace Orvane
