#pragma once

#include "Foundation/ArrayOf.h"
#include "Foundation/NotificationNames.h"
#include "Model/CoreOf.h"
#include "SQLite/ScalarColumn.h"
#include "SQLite/ToOneColumn.h"

namespace Foundation {
class MIMEType;
}

namespace Orvane {

class ClientCore;
class EnclosureCore;
class FeedCore;

/// A client's link to a feed, with its settings for it: a row of "Subscriptions". The one without a
/// feed has the client's defaults, which a 0 elsewhere stands for.
class SubscriptionCore : public CoreOf<SubscriptionCore> {
 public:
    static constexpr const char* kTableName = "Subscriptions";
    static constexpr bool kRetainRows = true;
    static const char kSchema[];
    static const SQLite::Table::IndexSpec kSchemaIndexes[];

    /// The positions of the columns, behind "rowID".
    enum ColumnID : int {
        Client = 0,
        Feed,
        RefreshInterval,
        ExpirationInterval,
        ExpirationDate,
        RefreshesInBackground,
        DownloadsEnclosures,
        MaxEnclosureSize,
        EnclosureTypesString,
        UnreadCount,
    };

    using CoreOf::CoreOf;

    /// The columns in the order of the table.
    static const SQLite::ColumnList& columnList();

    static constexpr double kDefaultRefreshInterval = 1800.0;  ///< seconds
    static constexpr const Foundation::NotificationName& kUnreadCountChangedNotification =
        Foundation::NotificationNames::kUnreadCountChanged;

    ClientCore* getClient() const;
    FeedCore* getFeed() const;
    /// The feed, which may be null, must outlive the link if it is not stored.
    void setFeed(FeedCore* feed);
    /// Whether it has the client's defaults instead of a feed.
    bool isClientSettings() const { return !mFeed; }

    /// Seconds; infinity if it is not refreshed now. It is not while the client is not in use.
    double getCurrentRefreshInterval() const;
    /// How many of the feed's entries have not expired: all of them, or those that are unread.
    /// Throws `AssertionFailure` for the client's settings, and while entries wait to be saved.
    int getEntryCount(bool all) const;
    /// Counts the unread entries anew. Whether that changed the count, which is then announced.
    bool updateUnreadCount();

    OVObject* createOVObject() override;

    // Which enclosures are downloaded without being asked for.

    /// MIME types joined by tabs, as they are stored; an empty text for null.
    static Foundation::StringReturner serializeEnclosureTypes(
        const Foundation::ArrayOf<Foundation::String>* types);
    /// The other way; null for null.
    static Foundation::Returner<Foundation::ArrayOf<Foundation::String>> deserializeEnclosureTypes(
        const Foundation::String* types);
    Foundation::Returner<Foundation::ArrayOf<Foundation::String>> getEnclosureTypes() const;
    /// Whether the type, which may be null, is on the list; all are on one that is empty.
    bool willAutoDownload(const Foundation::MIMEType* type) const;
    /// Whether the subscription wants the file. One of unknown length is never too large.
    bool willAutoDownload(const EnclosureCore* enclosure) const;

    SQLite::ToOneColumn<ClientCore, true> mClient{this};     ///< the owner
    SQLite::ToOneColumn<FeedCore, true> mFeed{this};         ///< none in the settings row
    SQLite::ScalarColumn<double> mRefreshInterval{this};     ///< seconds; below 0 never
    SQLite::ScalarColumn<double> mExpirationInterval{this};  ///< seconds; below 0 never
    /// Entries created before it do not count.
    SQLite::ScalarColumn<Foundation::Date> mExpirationDate{this};
    /// Even while the client does not run.
    SQLite::ScalarColumn<bool> mRefreshesInBackground{this};
    SQLite::ScalarColumn<bool> mDownloadsEnclosures{this};
    SQLite::ScalarColumn<double> mMaxEnclosureSize{this};  ///< bytes
    /// MIME types, joined by a tab.
    SQLite::ScalarColumn<Foundation::String> mEnclosureTypesString{this};
    SQLite::ScalarColumn<int> mUnreadCount{this};  ///< a cache
};

}  // namespace Orvane
