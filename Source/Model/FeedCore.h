#pragma once

#include "Foundation/NetError.h"
#include "Foundation/NotificationNames.h"
#include "Model/CoreOf.h"
#include "Model/FeedRefresher.h"
#include "SQLite/RowIterator.h"
#include "SQLite/ScalarColumn.h"
#include "SQLite/ToManyColumn.h"

#include <limits>

namespace Orvane {

class EntryCore;
class SubscriptionCore;

/// A source of entries, which subscriptions share: a row of "Feeds". It has its last document, and
/// the entries that have left that, in files outside of the database (the "truth"), owns the feeder
/// that refreshes it, and takes all that belongs to it along when it is deleted.
///
/// A feed in no table, as the parser makes it or an application uses it, is in memory alone.
class FeedCore : public CoreOf<FeedCore> {
 public:
    // Posted in the local centre with the feed as object. The info of the last one has
    // "ErrorDomain" and "ErrorCode" if the refresh failed, and "DidChange" if it changed the feed.
    static constexpr const Foundation::NotificationName& kWillRefreshNotification =
        Foundation::NotificationNames::kFeedWillRefresh;
    static constexpr const Foundation::NotificationName& kBeganUpdateLocalNotification =
        Foundation::NotificationNames::kFeedBeganUpdate;
    static constexpr const Foundation::NotificationName& kEndedUpdateLocalNotification =
        Foundation::NotificationNames::kFeedEndedUpdate;

    static constexpr double kRefreshNever = std::numeric_limits<double>::infinity();
    static double sMinimumRefreshInterval;  ///< seconds, for all feeds of the process

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

    ~FeedCore() override;

    /// The SHA-1 of the URL that the feed was first stored with, in 40 hexadecimal digits.
    Foundation::String* getIdentifier() const;
    void preloaded() override;

    // What points at the feed: all, or what meets a condition of SQL; see `BasicRowIterator`. Each
    // side of a link sets the other.

    SQLite::RowIterator<EntryCore> getEntries(const char* condition) const;
    void addToEntries(EntryCore* entry);
    void removeFromEntries(EntryCore* entry);
    SQLite::RowIterator<SubscriptionCore> getSubscriptions(const char* condition) const;
    void addToSubscriptions(SubscriptionCore* subscription);
    void removeFromSubscriptions(SubscriptionCore* subscription);
    /// Counts the unread entries of all subscriptions anew and saves what has changed. Does nothing
    /// for a feed in memory, or while the database is restored.
    void updateUnreadCounts();

    // Refreshing.

    /// The shortest interval of the subscriptions in seconds, at least the minimum;
    /// `kRefreshNever` if there is none.
    double getRefreshInterval() const;
    /// Null if it is never due.
    Foundation::Returner<Foundation::Date> getNextRefreshDate() const;
    /// The feed's own, made on first use; null if feeders cannot be made.
    FeedRefresher* getFeeder();
    /// Ends what it does, and lets it go.
    void removeFeeder();
    bool needsRefresh();
    /// See `FeedRefresher::refresh`.
    bool refresh(bool force, bool queued);
    /// The same, queued; by way of the agent where the row may not be changed here.
    bool startRefresh();

    /// Of the last refresh.
    Foundation::NetError getLastError() const;
    void setLastError(Foundation::NetError error);
    /// By way of the agent where the row may not be changed here. Throws `NetException`.
    void public_setLogin(Foundation::String* login);

    // Saved documents. An operation that writes throws `AssertionFailure` where the row may not be
    // changed; that a file cannot be written or deleted draws a warning.

    /// The last document that was fetched; null for a feed in memory.
    Foundation::URLReturner getURLOfXMLFile() const;
    Foundation::DataReturner getXMLData() const;
    /// Null deletes it. For a feed in memory, and while the database is restored, no file changes.
    void setXMLData(Foundation::Data* data);
    /// Where saved entries are, made if `create`; null for a feed in memory, and if it is not
    /// there.
    Foundation::URL* getURLOfEntryXMLDir(bool create) const;
    Foundation::URLReturner getURLOfEntryXMLFile(Foundation::String* identifier);
    /// Null data deletes it.
    void saveEntryToFile(Foundation::String* identifier, Foundation::Data* data);
    void deleteEntryFile(Foundation::String* identifier);

    /// None: clients see a feed by its subscription.
    OVObject* createOVObject() override;

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

 private:
    void refreshStarted(FeedRefresher* feeder);
    void fetchStarted(FeedRefresher* feeder);
    void refreshFinished(FeedRefresher* feeder);

    Foundation::Ref<Foundation::Data> mXMLData;  ///< of a feed without a file
    mutable Foundation::Ref<Foundation::URL> mEntryXMLDir;
    Foundation::Ref<FeedRefresher> mFeeder;
};

}  // namespace Orvane
