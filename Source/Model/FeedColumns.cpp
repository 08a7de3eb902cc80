#include "Model/FeedColumns.h"

#include "Model/EntryCore.h"
#include "Model/FeedCore.h"
#include "Model/SubscriptionCore.h"

namespace Orvane {

using SQLite::column;

const char FeedColumns::kSchema[] =
    "rowID integer not null unique primary key, identifier text unique, id text, title text, "
    "subtitle text, rights text, minUpdateInterval real default 0.0, dateUpdated real, "
    "timeZoneUpdated blob, url text unique not null, alternateUrl text, iconUrl text, "
    "logoUrl text, lastErrorDomain integer, lastErrorCode integer, redirectedUrl text, "
    "localDateUpdated real, refreshLocalDate real, refreshHttpDate text, refreshEtag text, "
    "refreshDataHash text, login text, publishingProtocol integer, rebuildXml integer, "
    "feedFormat integer, linkLocalGuid text, recoverOldEntries integer default 0, "
    "foafUrl text, localDateCreatedOfNewestEntry real";

const SQLite::Table::IndexSpec FeedColumns::kSchemaIndexes[] = {
    {"Feeds_identifier", "identifier"},
    {"Feeds_url", "url"},
    {"Feeds_localDateUpdated", "localDateUpdated"},
    {nullptr, nullptr},
};

const SQLite::ColumnList& FeedColumns::columnList() {
    static const SQLite::ColumnList sColumns = {
        column<&FeedColumns::mIdentifier>("identifier"),
        column<&FeedColumns::mID>("id"),
        column<&FeedColumns::mTitle>("title"),
        column<&FeedColumns::mSubtitle>("subtitle"),
        column<&FeedColumns::mRights>("rights"),
        column<&FeedColumns::mMinUpdateInterval>("minUpdateInterval"),
        column<&FeedColumns::mDateUpdated>("dateUpdated"),
        column<&FeedColumns::mTimeZoneUpdated>("timeZoneUpdated"),
        column<&FeedColumns::mURL>("url"),
        column<&FeedColumns::mAlternateURL>("alternateUrl"),
        column<&FeedColumns::mIconURL>("iconUrl"),
        column<&FeedColumns::mLogoURL>("logoUrl"),
        column<&FeedColumns::mLastErrorDomain>("lastErrorDomain"),
        column<&FeedColumns::mLastErrorCode>("lastErrorCode"),
        column<&FeedColumns::mRedirectedURL>("redirectedUrl"),
        column<&FeedColumns::mLocalDateUpdated>("localDateUpdated"),
        column<&FeedColumns::mRefreshLocalDate>("refreshLocalDate"),
        column<&FeedColumns::mRefreshHTTPDate>("refreshHttpDate"),
        column<&FeedColumns::mRefreshETag>("refreshEtag"),
        column<&FeedColumns::mRefreshDataHash>("refreshDataHash"),
        column<&FeedColumns::mLogin>("login"),
        column<&FeedColumns::mPublishingProtocol>("publishingProtocol"),
        column<&FeedColumns::mRebuildXML>("rebuildXml"),
        column<&FeedColumns::mFeedFormat>("feedFormat"),
        column<&FeedColumns::mLinkLocalGUID>("linkLocalGuid"),
        column<&FeedColumns::mRecoverOldEntries>("recoverOldEntries"),
        column<&FeedColumns::mFOAFURL>("foafUrl"),
        column<&FeedColumns::mLocalDateCreatedOfNewestEntry>("localDateCreatedOfNewestEntry"),
        SQLite::toMany<&FeedColumns::mEntries>(),
        SQLite::toMany<&FeedColumns::mSubscriptions>(),
    };
    return sColumns;
}

}  // namespace Orvane
