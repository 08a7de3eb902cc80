#pragma once

#include "Model/AuthorCore.h"
#include "Model/ClientCore.h"
#include "Model/ContentCore.h"
#include "Model/EnclosureCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"
#include "Model/SubscriptionCore.h"

#include <vector>

/// What the tables are to be, and the walks over the columns of the row classes by it.

struct DeclaredColumn {
    const char* name;
    const char* declaration;
};

/// For each row class: `kDeclared`, and `visit`, which calls `f(position, member)` for each column.
template <class T>
struct Declared;

template <>
struct Declared<Orvane::ClientCore> {
    static std::vector<DeclaredColumn> columns() {
        return {
            {"signature", "text unique not null"},
            {"private", "integer"},
            {"dateUsed", "real"},
        };
    }
    template <class F>
    static void visit(Orvane::ClientCore& row, F f) {
        using C = Orvane::ClientCore;
        f(C::ColumnID::Signature, row.mSignature);
        f(C::ColumnID::Private, row.mPrivate);
        f(C::ColumnID::DateUsed, row.mDateUsed);
    }
};

template <>
struct Declared<Orvane::SubscriptionCore> {
    static std::vector<DeclaredColumn> columns() {
        return {
            {"client", "integer references Clients(rowID) not null"},
            {"feed", "integer references Feeds(rowID)"},
            {"refreshInterval", "real"},
            {"expirationInterval", "real"},
            {"expirationDate", "real"},
            {"refreshesInBackground", "integer"},
            {"downloadsEnclosures", "integer"},
            {"maxEnclosureSize", "real"},
            {"enclosureTypesString", "text"},
            {"unreadCount", "integer"},
        };
    }
    template <class F>
    static void visit(Orvane::SubscriptionCore& row, F f) {
        using C = Orvane::SubscriptionCore;
        f(C::ColumnID::Client, row.mClient);
        f(C::ColumnID::Feed, row.mFeed);
        f(C::ColumnID::RefreshInterval, row.mRefreshInterval);
        f(C::ColumnID::ExpirationInterval, row.mExpirationInterval);
        f(C::ColumnID::ExpirationDate, row.mExpirationDate);
        f(C::ColumnID::RefreshesInBackground, row.mRefreshesInBackground);
        f(C::ColumnID::DownloadsEnclosures, row.mDownloadsEnclosures);
        f(C::ColumnID::MaxEnclosureSize, row.mMaxEnclosureSize);
        f(C::ColumnID::EnclosureTypesString, row.mEnclosureTypesString);
        f(C::ColumnID::UnreadCount, row.mUnreadCount);
    }
};

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

template <>
struct Declared<Orvane::EntryCore> {
    static std::vector<DeclaredColumn> columns() {
        return {
            {"identifier", "text unique"},
            {"id", "text"},
            {"title", "text"},
            {"rights", "text"},
            {"content", "integer references Contents(rowID)"},
            {"contentHash", "text"},
            {"summary", "integer references Contents(rowID)"},
            {"summaryHash", "text"},
            {"xmlRepresentation", "integer references Contents(rowID)"},
            {"xmlRepresentationHash", "text"},
            {"dateUpdated", "real"},
            {"timeZoneUpdated", "blob"},
            {"datePublished", "real"},
            {"timeZonePublished", "blob"},
            {"dateCreated", "real"},
            {"timeZoneCreated", "blob"},
            {"baseUrl", "text"},
            {"alternateUrl", "text"},
            {"author", "integer references Authors(rowID)"},
            {"feed", "integer references Feeds(rowID)"},
            {"current", "integer"},
            {"tombstone", "integer"},
            {"read", "integer"},
            {"flagged", "integer"},
            {"localDateCreated", "real"},
            {"localDateUpdated", "real"},
            {"localDateXmlChanged", "real"},
            {"localDateFlagsUpdated", "real"},
        };
    }
    template <class F>
    static void visit(Orvane::EntryCore& row, F f) {
        using C = Orvane::EntryCore;
        f(C::ColumnID::Identifier, row.mIdentifier);
        f(C::ColumnID::ID, row.mID);
        f(C::ColumnID::Title, row.mTitle);
        f(C::ColumnID::Rights, row.mRights);
        f(C::ColumnID::Content, row.mContent);
        f(C::ColumnID::ContentHash, row.mContentHash);
        f(C::ColumnID::Summary, row.mSummary);
        f(C::ColumnID::SummaryHash, row.mSummaryHash);
        f(C::ColumnID::XMLRepresentation, row.mXMLRepresentation);
        f(C::ColumnID::XMLRepresentationHash, row.mXMLRepresentationHash);
        f(C::ColumnID::DateUpdated, row.mDateUpdated);
        f(C::ColumnID::TimeZoneUpdated, row.mTimeZoneUpdated);
        f(C::ColumnID::DatePublished, row.mDatePublished);
        f(C::ColumnID::TimeZonePublished, row.mTimeZonePublished);
        f(C::ColumnID::DateCreated, row.mDateCreated);
        f(C::ColumnID::TimeZoneCreated, row.mTimeZoneCreated);
        f(C::ColumnID::BaseURL, row.mBaseURL);
        f(C::ColumnID::AlternateURL, row.mAlternateURL);
        f(C::ColumnID::Author, row.mAuthor);
        f(C::ColumnID::Feed, row.mFeed);
        f(C::ColumnID::Current, row.mCurrent);
        f(C::ColumnID::Tombstone, row.mTombstone);
        f(C::ColumnID::Read, row.mRead);
        f(C::ColumnID::Flagged, row.mFlagged);
        f(C::ColumnID::LocalDateCreated, row.mLocalDateCreated);
        f(C::ColumnID::LocalDateUpdated, row.mLocalDateUpdated);
        f(C::ColumnID::LocalDateXMLChanged, row.mLocalDateXMLChanged);
        f(C::ColumnID::LocalDateFlagsUpdated, row.mLocalDateFlagsUpdated);
    }
};

template <>
struct Declared<Orvane::EnclosureCore> {
    static std::vector<DeclaredColumn> columns() {
        return {
            {"entry", "integer references Entries(rowID)"},
            {"url", "text not null"},
            {"mimeType", "text"},
            {"length", "integer"},
            {"title", "text"},
            {"downloadAuditStatus", "integer"},
            {"downloadState", "integer"},
            {"downloadedPath", "text"},
            {"downloadErrorDomain", "integer"},
            {"downloadErrorCode", "integer"},
        };
    }
    template <class F>
    static void visit(Orvane::EnclosureCore& row, F f) {
        using C = Orvane::EnclosureCore;
        f(C::ColumnID::Entry, row.mEntry);
        f(C::ColumnID::URL, row.mURL);
        f(C::ColumnID::MIMEType, row.mMIMEType);
        f(C::ColumnID::Length, row.mLength);
        f(C::ColumnID::Title, row.mTitle);
        f(C::ColumnID::DownloadAuditStatus, row.mDownloadAuditStatus);
        f(C::ColumnID::DownloadState, row.mDownloadState);
        f(C::ColumnID::DownloadedPath, row.mDownloadedPath);
        f(C::ColumnID::DownloadErrorDomain, row.mDownloadErrorDomain);
        f(C::ColumnID::DownloadErrorCode, row.mDownloadErrorCode);
    }
};

template <>
struct Declared<Orvane::AuthorCore> {
    static std::vector<DeclaredColumn> columns() {
        return {
            {"name", "text"},
            {"email", "text"},
            {"url", "text"},
            {"contactBookUid", "text"},
        };
    }
    template <class F>
    static void visit(Orvane::AuthorCore& row, F f) {
        using C = Orvane::AuthorCore;
        f(C::ColumnID::Name, row.mName);
        f(C::ColumnID::Email, row.mEmail);
        f(C::ColumnID::URL, row.mURL);
        f(C::ColumnID::ContactBookUID, row.mContactBookUID);
    }
};

template <>
struct Declared<Orvane::ContentCore> {
    static std::vector<DeclaredColumn> columns() {
        return {
            {"data", "blob"},
            {"mimeType", "text"},
        };
    }
    template <class F>
    static void visit(Orvane::ContentCore& row, F f) {
        using C = Orvane::ContentCore;
        f(C::ColumnID::Data, row.mData);
        f(C::ColumnID::MIMEType, row.mMIMEType);
    }
};
