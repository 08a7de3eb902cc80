#pragma once

#include "Model/CoreOf.h"
#include "SQLite/ScalarColumn.h"
#include "SQLite/ToManyColumn.h"

namespace Orvane {

class EntryCore;
class FeedCore;
class SubscriptionCore;

/// The table "Feeds", and what a feed keeps.
class FeedColumns : public CoreOf<FeedCore> {
 public:
    static constexpr const char* kTableName = "Feeds";
    static constexpr bool kRetainRows = true;
    static const char kSchema[];
    static const SQLite::Table::IndexSpec kSchemaIndexes[];

    /// The positions of the columns, behind "rowID".
    enum ColumnID : int {
        Identifier = 0,
        ID,
        Title,
        Subtitle,
        Rights,
        MinUpdateInterval,
        DateUpdated,
        TimeZoneUpdated,
        URL,
        AlternateURL,
        IconURL,
        LogoURL,
        LastErrorDomain,
        LastErrorCode,
        RedirectedURL,
        LocalDateUpdated,
        RefreshLocalDate,
        RefreshHTTPDate,
        RefreshETag,
        RefreshDataHash,
        Login,
        PublishingProtocol,
        RebuildXML,
        FeedFormat,
        LinkLocalGUID,
        RecoverOldEntries,
        FOAFURL,
        LocalDateCreatedOfNewestEntry,
    };

    using CoreOf::CoreOf;

    /// The columns in the order of the table.
    static const SQLite::ColumnList& columnList();

    SQLite::ScalarColumn<Foundation::String> mIdentifier{this};  ///< a hash
    SQLite::ScalarColumn<Foundation::String> mID{this};          ///< the document's
    SQLite::ScalarColumn<Foundation::String> mTitle{this};
    SQLite::ScalarColumn<Foundation::String> mSubtitle{this};
    SQLite::ScalarColumn<Foundation::String> mRights{this};
    SQLite::ScalarColumn<double> mMinUpdateInterval{this};      ///< seconds between fetches
    SQLite::ScalarColumn<Foundation::Date> mDateUpdated{this};  ///< the document's
    SQLite::ScalarColumn<Foundation::TimeZone> mTimeZoneUpdated{this};
    SQLite::ScalarColumn<Foundation::URL> mURL{this};           ///< as subscribed
    SQLite::ScalarColumn<Foundation::URL> mAlternateURL{this};  ///< the site's page
    SQLite::ScalarColumn<Foundation::URL> mIconURL{this};
    SQLite::ScalarColumn<Foundation::URL> mLogoURL{this};
    SQLite::ScalarColumn<long long> mLastErrorDomain{this};
    SQLite::ScalarColumn<int> mLastErrorCode{this};
    /// Of the last fetch; null if it was not.
    SQLite::ScalarColumn<Foundation::URL> mRedirectedURL{this};
    /// When the stored feed changed.
    SQLite::ScalarColumn<Foundation::Date> mLocalDateUpdated{this};
    SQLite::ScalarColumn<Foundation::Date> mRefreshLocalDate{this};   ///< of the last refresh
    SQLite::ScalarColumn<Foundation::String> mRefreshHTTPDate{this};  ///< Last-Modified
    SQLite::ScalarColumn<Foundation::String> mRefreshETag{this};
    SQLite::ScalarColumn<Foundation::String> mRefreshDataHash{this};  ///< of the last document
    SQLite::ScalarColumn<Foundation::String> mLogin{this};            ///< user name
    SQLite::ScalarColumn<int> mPublishingProtocol{this};
    SQLite::ScalarColumn<bool> mRebuildXML{this};  ///< the saved XML is to be made anew
    SQLite::ScalarColumn<int> mFeedFormat{this};
    SQLite::ScalarColumn<Foundation::String> mLinkLocalGUID{this};  ///< of one found by discovery
    SQLite::ScalarColumn<bool> mRecoverOldEntries{this};  ///< saved entry files wait to be read
    SQLite::ScalarColumn<Foundation::URL> mFOAFURL{this};
    /// Kept by the triggers of entries.
    SQLite::ScalarColumn<Foundation::Date> mLocalDateCreatedOfNewestEntry{this};
    SQLite::ToManyColumn<EntryCore> mEntries{this, "feed"};
    SQLite::ToManyColumn<SubscriptionCore> mSubscriptions{this, "feed"};
};

}  // namespace Orvane
