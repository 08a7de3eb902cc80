#include "Model/FeedCore.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Data.h"
#include "Foundation/Logger.h"
#include "Foundation/URL.h"
#include "Model/AgentLink.h"
#include "Model/EntryCore.h"
#include "Model/MinistryOfTruth.h"
#include "Model/SubscriptionCore.h"
#include "SQLite/Transaction.h"

namespace Orvane {

using Foundation::NetError;
using Foundation::Ref;
using Foundation::String;
using SQLite::column;
using SQLite::RowIterator;
using SQLite::TableOf;
using SQLite::Transaction;

const char FeedCore::kSchema[] =
    "rowID integer not null unique primary key, identifier text unique, id text, title text, "
    "subtitle text, rights text, minUpdateInterval real default 0.0, dateUpdated real, "
    "timeZoneUpdated blob, url text unique not null, alternateUrl text, iconUrl text, "
    "logoUrl text, lastErrorDomain integer, lastErrorCode integer, redirectedUrl text, "
    "localDateUpdated real, refreshLocalDate real, refreshHttpDate text, refreshEtag text, "
    "refreshDataHash text, login text, publishingProtocol integer, rebuildXml integer, "
    "feedFormat integer, linkLocalGuid text, recoverOldEntries integer default 0, "
    "foafUrl text, localDateCreatedOfNewestEntry real";

const SQLite::Table::IndexSpec FeedCore::kSchemaIndexes[] = {
    {"Feeds_identifier", "identifier"},
    {"Feeds_url", "url"},
    {"Feeds_localDateUpdated", "localDateUpdated"},
    {nullptr, nullptr},
};

const SQLite::ColumnList& FeedCore::columnList() {
    static const SQLite::ColumnList sColumns = {
        column<&FeedCore::mIdentifier>("identifier"),
        column<&FeedCore::mID>("id"),
        column<&FeedCore::mTitle>("title"),
        column<&FeedCore::mSubtitle>("subtitle"),
        column<&FeedCore::mRights>("rights"),
        column<&FeedCore::mMinUpdateInterval>("minUpdateInterval"),
        column<&FeedCore::mDateUpdated>("dateUpdated"),
        column<&FeedCore::mTimeZoneUpdated>("timeZoneUpdated"),
        column<&FeedCore::mURL>("url"),
        column<&FeedCore::mAlternateURL>("alternateUrl"),
        column<&FeedCore::mIconURL>("iconUrl"),
        column<&FeedCore::mLogoURL>("logoUrl"),
        column<&FeedCore::mLastErrorDomain>("lastErrorDomain"),
        column<&FeedCore::mLastErrorCode>("lastErrorCode"),
        column<&FeedCore::mRedirectedURL>("redirectedUrl"),
        column<&FeedCore::mLocalDateUpdated>("localDateUpdated"),
        column<&FeedCore::mRefreshLocalDate>("refreshLocalDate"),
        column<&FeedCore::mRefreshHTTPDate>("refreshHttpDate"),
        column<&FeedCore::mRefreshETag>("refreshEtag"),
        column<&FeedCore::mRefreshDataHash>("refreshDataHash"),
        column<&FeedCore::mLogin>("login"),
        column<&FeedCore::mPublishingProtocol>("publishingProtocol"),
        column<&FeedCore::mRebuildXML>("rebuildXml"),
        column<&FeedCore::mFeedFormat>("feedFormat"),
        column<&FeedCore::mLinkLocalGUID>("linkLocalGuid"),
        column<&FeedCore::mRecoverOldEntries>("recoverOldEntries"),
        column<&FeedCore::mFOAFURL>("foafUrl"),
        column<&FeedCore::mLocalDateCreatedOfNewestEntry>("localDateCreatedOfNewestEntry"),
        SQLite::toMany<&FeedCore::mEntries>(),
        SQLite::toMany<&FeedCore::mSubscriptions>(),
    };
    return sColumns;
}

FeedCore::~FeedCore() {
    // What has an ID is pointed at by that.
    if (getRowID() != 0) return;
    // Who still holds one of the new rows must not find this behind it.
    for (const Ref<SQLite::Row>& row : mEntries.getNewRows()) {
        static_cast<EntryCore&>(*row).mFeed.setValue(nullptr);
    }
    for (const Ref<SQLite::Row>& row : mSubscriptions.getNewRows()) {
        static_cast<SubscriptionCore&>(*row).mFeed.setValue(nullptr);
    }
}

OVObject* FeedCore::createOVObject() {
    return nullptr;
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

}  // namespace Orvane
