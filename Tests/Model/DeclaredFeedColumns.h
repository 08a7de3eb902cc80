#pragma once

#include "Model/Declared.h"
#include "Model/FeedCore.h"

#include <vector>

template <>
struct Declared<Orvane::FeedCore> {
    static std::vector<DeclaredColumn> columns() {
        return {
            {"identifier", "text unique"},
            {"id", "text"},
            {"title", "text"},
            {"subtitle", "text"},
            {"rights", "text"},
            {"minUpdateInterval", "real default 0.0"},
            {"dateUpdated", "real"},
            {"timeZoneUpdated", "blob"},
            {"url", "text unique not null"},
            {"alternateUrl", "text"},
            {"iconUrl", "text"},
            {"logoUrl", "text"},
            {"lastErrorDomain", "integer"},
            {"lastErrorCode", "integer"},
            {"redirectedUrl", "text"},
            {"localDateUpdated", "real"},
            {"refreshLocalDate", "real"},
            {"refreshHttpDate", "text"},
            {"refreshEtag", "text"},
            {"refreshDataHash", "text"},
            {"login", "text"},
            {"publishingProtocol", "integer"},
            {"rebuildXml", "integer"},
            {"feedFormat", "integer"},
            {"linkLocalGuid", "text"},
            {"recoverOldEntries", "integer default 0"},
            {"foafUrl", "text"},
            {"localDateCreatedOfNewestEntry", "real"},
        };
    }
    template <class F>
    static void visit(Orvane::FeedCore& row, F f) {
        using C = Orvane::FeedCore;
        f(C::ColumnID::Identifier, row.mIdentifier);
        f(C::ColumnID::ID, row.mID);
        f(C::ColumnID::Title, row.mTitle);
        f(C::ColumnID::Subtitle, row.mSubtitle);
        f(C::ColumnID::Rights, row.mRights);
        f(C::ColumnID::MinUpdateInterval, row.mMinUpdateInterval);
        f(C::ColumnID::DateUpdated, row.mDateUpdated);
        f(C::ColumnID::TimeZoneUpdated, row.mTimeZoneUpdated);
        f(C::ColumnID::URL, row.mURL);
        f(C::ColumnID::AlternateURL, row.mAlternateURL);
        f(C::ColumnID::IconURL, row.mIconURL);
        f(C::ColumnID::LogoURL, row.mLogoURL);
        f(C::ColumnID::LastErrorDomain, row.mLastErrorDomain);
        f(C::ColumnID::LastErrorCode, row.mLastErrorCode);
        f(C::ColumnID::RedirectedURL, row.mRedirectedURL);
        f(C::ColumnID::LocalDateUpdated, row.mLocalDateUpdated);
        f(C::ColumnID::RefreshLocalDate, row.mRefreshLocalDate);
        f(C::ColumnID::RefreshHTTPDate, row.mRefreshHTTPDate);
        f(C::ColumnID::RefreshETag, row.mRefreshETag);
        f(C::ColumnID::RefreshDataHash, row.mRefreshDataHash);
        f(C::ColumnID::Login, row.mLogin);
        f(C::ColumnID::PublishingProtocol, row.mPublishingProtocol);
        f(C::ColumnID::RebuildXML, row.mRebuildXML);
        f(C::ColumnID::FeedFormat, row.mFeedFormat);
        f(C::ColumnID::LinkLocalGUID, row.mLinkLocalGUID);
        f(C::ColumnID::RecoverOldEntries, row.mRecoverOldEntries);
        f(C::ColumnID::FOAFURL, row.mFOAFURL);
        f(C::ColumnID::LocalDateCreatedOfNewestEntry, row.mLocalDateCreatedOfNewestEntry);
    }
};
