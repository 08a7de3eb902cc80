#pragma once

#include "Foundation/ProcessInfo.h"
#include "Model/CoreOf.h"
#include "Model/SubscriptionCore.h"
#include "SQLite/RowIterator.h"
#include "SQLite/ScalarColumn.h"
#include "SQLite/ToManyColumn.h"

#include <optional>

namespace Orvane {

class EntryCore;
class FeedCore;

/// An application that uses the store: a row of "Clients". Its subscriptions say which feeds it
/// has; one of them has no feed and is its settings row, with what goes for all others.
///
/// In a process that reads, what changes something asks the agent (`AgentLink`), which throws
/// `NetException`; a writer does it itself and throws `SQLite::Exception`.
class ClientCore : public CoreOf<ClientCore> {
 public:
    using Dictionary = Foundation::Dictionary;
    using RowID = SQLite::RowID;
    using String = Foundation::String;
    using URL = Foundation::URL;
    template <class T>
    using Returner = Foundation::Returner<T>;

    static constexpr double kDormantSeconds = 1209600.0;   ///< unused for so long
    static constexpr double kReportUseSeconds = 302400.0;  ///< before a client says it again
    static constexpr double kNoteUseSeconds = 3600.0;      ///< before the agent stores it again

    static constexpr const char* kTableName = "Clients";
    static constexpr bool kRetainRows = true;
    static const char kSchema[];
    static const SQLite::Table::IndexSpec kSchemaIndexes[];

    /// The positions of the columns, behind "rowID".
    enum ColumnID : int {
        Signature = 0,
        Private,
        DateUsed,
    };

    using CoreOf::CoreOf;

    /// The columns in the order of the table.
    static const SQLite::ColumnList& columnList();

    /// Opens the database of the process for reading, unless it is open; see `ClientSession`.
    static void openClientSession();
    /// Takes away how an older version was started. Failures draw a warning.
    static void removeOldSvcdPlist();

    /// Null if there is none.
    static Returner<ClientCore> existingClientWithSignature(String* signature);
    /// The client that there is, or else a new one, which is in use and has its settings row.
    /// Throws `AssertionFailure` for null.
    static Returner<ClientCore> createClient(String* signature);

    ~ClientCore() override;

    /// Keeps the date of the last use fresh, without writing at every use. The end of a dormant
    /// time is announced as a change of the schedule.
    void markInUse();
    void public_setPrivate(bool value);
    /// Whether the application runs.
    bool isProcessRunning() const;
    /// Whether it has not been used for so long that its feeds are left alone.
    bool isDormant() const;

    // Subscriptions. Each side of a link sets the other.

    /// All, the settings row too, or those that meet a condition; see `RowIterator`.
    SQLite::RowIterator<SubscriptionCore> getSubscriptions(const char* condition) const;
    void addToSubscriptions(SubscriptionCore* subscription);
    void removeFromSubscriptions(SubscriptionCore* subscription);

    // Null if there is none.

    Returner<SubscriptionCore> getSubscription(const FeedCore* feed) const;
    /// Throws `AssertionFailure` for null.
    Returner<SubscriptionCore> getSubscription(URL* url) const;
    /// 0 finds the settings row.
    Returner<SubscriptionCore> getSubscriptionWithFeedRowID(RowID feed) const;
    /// Throws `AssertionFailure` for null.
    Returner<SubscriptionCore> getSubscriptionWithFeedIdentifier(String* identifier) const;
    /// The settings row, which the client keeps; made and saved if there is none.
    SubscriptionCore* getDefaultSubscription();

    /// The subscription that there is, or else a new one, saved, with a new feed if need be. Null
    /// for a URL that feeds cannot have. The settings, which may be null, go to the agent; a writer
    /// leaves the subscription at its defaults.
    Returner<SubscriptionCore> createSubscription(URL* url, Dictionary* settings);
    /// The same for a feed, which a writer saves if need be. Throws `AssertionFailure` for null.
    Returner<SubscriptionCore> createSubscription(FeedCore* feed, Dictionary* settings);

    // Work over all subscriptions.

    /// Reads the feeds of all subscriptions by one query, if next to none are in memory.
    void prefetchFeeds();
    /// Lets all entries expire that are there now, and deletes those that no other client keeps.
    void expireAllEntries();
    /// Refreshes the feeds that nobody has refreshed while the client did not run and that are due.
    void refreshNonBackgroundSubscriptions();
    /// An entry of a subscribed feed, and its subscription; null and null if there is none. Throws
    /// `AssertionFailure` for null.
    Returner<EntryCore> getEntryWithIdentifier(String* identifier,
                                               Foundation::Ref<SubscriptionCore>& outSub);

    OVObject* createOVObject() override;

    SQLite::ScalarColumn<Foundation::String> mSignature{this};  ///< the bundle identifier
    SQLite::ScalarColumn<bool> mPrivate{this};                  ///< only it itself may open it
    SQLite::ScalarColumn<Foundation::Date> mDateUsed{this};
    SQLite::ToManyColumn<SubscriptionCore> mSubscriptions{this, "Client"};
    /// Whether a change of an entry's XML alone counts as one, see `UpdatedEntryIterator`.
    bool mUsesXML = true;

 private:
    void _makeRows(String* signature);
    /// Behind a transaction that failed, see `giveUpNewRow`.
    void _giveUpNewRows();
    Returner<SubscriptionCore> _createSubscription(FeedCore* feed);
    Returner<SubscriptionCore> _subscribe(FeedCore* feed);
    Returner<SubscriptionCore> _getSubscription(RowID feedRowID) const;

    Foundation::Ref<SubscriptionCore> mDefaultSubscription;
    mutable std::optional<Foundation::ProcessInfo> mProcessInfo;  ///< made on first use
};

}  // namespace Orvane
