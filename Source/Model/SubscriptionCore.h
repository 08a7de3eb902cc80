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

/// A client's link to a feed, with its settings for it: a row of "Subscriptions". The client's
/// settings row is one without a feed. It has the defaults, which a 0 in the others stands for.
///
/// An entry that was first seen before a subscription's expiration date does not count for it. That
/// date only moves forward.
class SubscriptionCore : public CoreOf<SubscriptionCore> {
 public:
    using Date = Foundation::Date;
    using String = Foundation::String;
    template <class T>
    using ArrayOf = Foundation::ArrayOf<T>;

    // What 0 stands for in the settings row.
    static constexpr double kDefaultRefreshInterval = 1800.0;        ///< seconds
    static constexpr double kDefaultExpirationInterval = 1209600.0;  ///< seconds: 14 days
    static constexpr double kDefaultMaxEnclosureSize = 8388608.0;    ///< bytes
    // What a new settings row has.
    static constexpr bool kDefaultBackground = true;
    static constexpr bool kDefaultAutoDownload = false;

    // Posted in the local centre with the subscription as object; the first one without an object
    // too, if it goes for all of a client's.
    static constexpr const Foundation::NotificationName& kRefreshScheduleChangedNotification =
        Foundation::NotificationNames::kRefreshScheduleChanged;
    static constexpr const Foundation::NotificationName& kUnreadCountChangedNotification =
        Foundation::NotificationNames::kUnreadCountChanged;

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

    /// The feeds that somebody wants to be refreshed, each once. Throws `SQLite::Exception`.
    static Foundation::Returner<ArrayOf<FeedCore>> getSubscribedFeeds();

    // The owners. Each side of a link sets the other. What is set may be null, and must outlive the
    // link if it is not stored.

    ClientCore* getClient() const;
    void setClient(ClientCore* client);
    FeedCore* getFeed() const;
    void setFeed(FeedCore* feed);
    /// Whether it is the client's settings row.
    bool isClientSettings() const { return !mFeed; }

    // Settings. In the settings row 0 becomes the constant above. A refresh interval below 0 is
    // for never; an expiration interval below 0 keeps entries for good; a size of 0 has no limit.

    /// Announces a change as one of the schedule.
    void setRefreshInterval(double seconds);
    /// Lets entries expire that are too old by now, of all subscriptions that it goes for.
    void setExpirationInterval(double seconds);
    void setMaxEnclosureSize(double bytes);
    /// Sets all of them, in one call to the agent where the row may not be changed here; none if
    /// nothing changes. Throws `NetException`.
    void setSettings(double refreshInterval, double expirationInterval, bool refreshesInBackground,
                     bool downloadsEnclosures, double maxEnclosureSize,
                     ArrayOf<String>* enclosureTypes);
    /// The agent's half of it. `enclosureTypes` is joined, and may be null.
    void setSettingsActual(double refreshInterval, double expirationInterval,
                           bool refreshesInBackground, bool downloadsEnclosures,
                           double maxEnclosureSize, String* enclosureTypes);
    /// The settings of a new row. Throws `AssertionFailure` for one with a feed and without a
    /// client.
    void setDefaultSettings();

    // Refreshing.

    /// Seconds; infinity if it is not to be refreshed now.
    double getCurrentRefreshInterval() const;
    void notifyRefreshScheduleChanged() const;
    /// See `FeedCore::startRefresh`.
    bool startRefresh();

    // Expiration and counts.

    /// Moves the expiration date to the interval before `date`, or before the last midnight for
    /// null. Whether it moved: it does so once a day.
    bool bumpExpirationDate(Date* date);
    /// How many entries of the feed have not expired: all of them, or those that are unread. Throws
    /// `AssertionFailure` for a settings row, and while entries wait to be saved.
    int getEntryCount(bool all) const;
    /// Counts the unread entries anew. Whether the count changed, which is then announced.
    bool updateUnreadCount();

    // Which enclosures are downloaded without being asked for. A list of MIME types is stored as
    // one text, with tabs in between.

    /// An empty text for null.
    static Foundation::StringReturner serializeEnclosureTypes(const ArrayOf<String>* types);
    /// The other way; null for null.
    static Foundation::Returner<ArrayOf<String>> deserializeEnclosureTypes(const String* types);
    Foundation::Returner<ArrayOf<String>> getEnclosureTypes() const;
    /// Whether the type, which may be null, is on the list; all are on one that is empty.
    bool willAutoDownload(const Foundation::MIMEType* type) const;
    /// Whether the subscription wants the file. One of unknown length is never too large.
    bool willAutoDownload(const EnclosureCore* enclosure) const;

    void saveChanges() override;
    /// Deletes the feed too if this is its last subscription.
    void deleteRow() override;
    void ipcDidChangeColumn(int column) override;
    OVObject* createOVObject() override;

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

 private:
    static Foundation::Ref<Date> today();
    double orDefault(double value, double constant) const;
    void bumpThoseOfDefaultInterval();
    void forgetOwners();
};

}  // namespace Orvane
