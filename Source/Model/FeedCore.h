#pragma once

#include "Foundation/NetError.h"
#include "Foundation/NotificationNames.h"
#include "Model/FeedColumns.h"
#include "Model/FeedRefresher.h"
#include "SQLite/RowIterator.h"

#include <limits>

namespace Orvane {

/// A source of entries, which subscriptions share: a row of "Feeds". It has its last document, and
/// the entries that have left that, in files outside of the database (the "truth"), owns the feeder
/// that refreshes it, and takes all that belongs to it along when it is deleted.
///
/// A feed in no table, as the parser makes it or an application uses it, is in memory alone.
class FeedCore : public FeedColumns {
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

    using FeedColumns::FeedColumns;

    ~FeedCore() override;

    // Making and finding feeds. A URL of the form "feed:" stands for its source.

    /// The stored feed of a URL, or null.
    static Foundation::Returner<FeedCore> existingFeedWithURL(Foundation::URL* url);
    /// A new feed, in the database if `persist`. Null where feeds can't be fetched from the URL.
    /// Throws `AssertionFailure` for null, `SQLite::Exception` if it cannot be saved.
    static Foundation::Returner<FeedCore> createFeed(Foundation::URL* url, bool persist);
    /// The feed, in memory, that a document is; null if it is none.
    static Foundation::Returner<FeedCore> createFeed(Foundation::Data* data, Foundation::URL* url);

    /// The SHA-1 of the URL that the feed was first stored with, in 40 hexadecimal digits.
    Foundation::String* getIdentifier() const;
    void preloaded() override;

    // What points at the feed: all, or what meets a condition of SQL; see `BasicRowIterator`. Each
    // side of a link sets the other.

    /// Reads the saved entries first, if they wait to be read.
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
    /// Null if it is never due. Now if it has not been refreshed, or more than a day in the future.
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

    /// Takes over what a parsed feed says of itself. False, with nothing changed, if its date is
    /// the one of the last time and not `force`. Throws `AssertionFailure` for a feed of another
    /// URL, `std::runtime_error` for one with another identifier.
    bool updateFrom(FeedCore* newFeed, bool force);
    /// How far the document has been read. Who fails in merging one puts back what was before it
    /// was fetched, so that the next fetch brings it again.
    struct ReadState {
        Foundation::Ref<Foundation::Date> dateUpdated, localDateUpdated;
        Foundation::Ref<Foundation::String> httpDate, etag, dataHash;
    };
    ReadState getReadState() const;
    void setReadState(const ReadState& state);

    /// Of the last refresh.
    Foundation::NetError getLastError() const;
    void setLastError(Foundation::NetError error);
    /// By way of the agent where the row may not be changed here. Throws `NetException`.
    void public_setLogin(Foundation::String* login);
    /// Keeps the password in memory, and `saveInStore` also in the user's store of passwords, for
    /// the feed's URL and login. What went wrong with that.
    Foundation::NetError setPassword(Foundation::String* password, bool saveInStore);
    Foundation::String* getPassword() const { return mPassword.get(); }

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
    /// Brings back the entries that have files, once, if that waits to be done; by way of the agent
    /// where the row may not be changed here. Throws `SQLite::Exception`; that the agent cannot be
    /// asked is reported.
    void recoverOldEntries();
    /// The same for one file and its bytes. Whether it worked; a failure is logged.
    bool addEntryFromFile(Foundation::URL* url, Foundation::Data* data);
    /// Merges the saved document as if it had just been fetched, and lets the saved entries wait
    /// until they are asked for.
    void recoverFromXMLData();

    /// Deletes it with all its entries and files. What of these cannot be deleted is reported.
    void deleteRow() override;

    /// Throws `AssertionFailure`: clients see a feed by its subscription.
    OVObject* createOVObject() override;

 private:
    static void setReceivers(FeedRefresher& feeder, FeedCore* feed);
    void letGo();
    void askForOldEntries();
    bool recoverEntry(Foundation::URL* url, Foundation::Data* data);
    void takeRecovered(EntryCore& entry, Foundation::URL* file);
    bool adoptRecovered(EntryCore* entry, Foundation::String* identifier);
    void refreshFromFile(Foundation::URL* file);
    void refreshStarted(FeedRefresher* feeder);
    void fetchStarted(FeedRefresher* feeder);
    void refreshFinished(FeedRefresher* feeder);

    Foundation::Ref<Foundation::Data> mXMLData;  ///< of a feed without a file
    mutable Foundation::Ref<Foundation::URL> mEntryXMLDir;
    Foundation::Ref<FeedRefresher> mFeeder;
    Foundation::Ref<Foundation::String> mPassword;
};

}  // namespace Orvane
