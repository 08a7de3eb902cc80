#pragma once

#include "Model/AuthorCore.h"
#include "Model/ClientCore.h"
#include "Model/ContentCore.h"
#include "Model/Declared.h"
#include "Model/DeclaredEntryColumns.h"
#include "Model/DeclaredFeedColumns.h"
#include "Model/EnclosureCore.h"
#include "Model/SubscriptionCore.h"

#include <vector>

/// What the tables are to be, and the walks over the columns of the row classes by it.

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
