#include "Model/FeedCore.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Logger.h"
#include "Foundation/URL.h"
#include "Model/EntryCore.h"
#include "Model/SubscriptionCore.h"

namespace Orvane {

using SQLite::column;

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

OVObject* FeedCore::createOVObject() {
    return nullptr;
}

Foundation::String* FeedCore::getIdentifier() const {
    if (Foundation::String* stored = mIdentifier) return stored;
    const Foundation::URL* url = mURL;
    OV_ASSERT_AS(url != nullptr, "url");
    const Foundation::Ref<Foundation::Data> text = url->getData();
    Foundation::String* identifier = text->SHA1HashString();
    gLogSub.log("\t%@: set ident %@ based on \"%@\"", this, identifier, url);
    // Keeping what follows from the URL does not change what the feed is.
    if (isChangeable()) const_cast<FeedCore*>(this)->mIdentifier.setValue(identifier);
    return identifier;
}

void FeedCore::addToEntries(EntryCore* entry) {
    mEntries.add(entry);
    entry->setFeed(this);
}

void FeedCore::removeFromEntries(EntryCore* entry) {
    const Foundation::Ref<EntryCore> kept = entry;
    mEntries.remove(entry);
    entry->setFeed(nullptr);
}

}  // namespace Orvane
