#pragma once

#include "Foundation/Timer.h"
#include "Foundation/URL.h"
#include "Foundation/Uncopyable.h"

namespace Orvane {

class FeedCore;

/// The agent's view of the database on the disk: where its files are, how one that is there is
/// opened and brought up to date, and how one that is broken or too old is moved out of the way and
/// made anew. What is needed for that stands outside of it: the file of clients and subscriptions,
/// and the documents and old entries of the feeds, the "truth".
///
///     Orvane/Database/Database.sqlite3   the database; its directory goes as a whole
///     Orvane/Clients.plist               see `ClientsPlist`
///     Orvane/.clients-changed            there while that is still to be saved
///     Orvane/Feeds/<feed>.xml            a feed's last document
///     Orvane/Feeds/<feed>/<entry>.xml    an entry that is no longer in it
///
/// Only the agent uses it, on its main thread.
class MinistryOfTruth : Foundation::Uncopyable {
 public:
    using String = Foundation::String;
    using URL = Foundation::URL;

    static constexpr double kSaveDelaySeconds = 5.0;

    /// Made on first use, and destroyed at the process's end.
    static MinistryOfTruth* instance();

    /// Opens the database of the process for writing, and makes it, migrates it or makes it anew as
    /// need be. Takes up what an earlier process did not come to: the file of clients and
    /// subscriptions, and directories that were to be deleted. From then on changes of the database
    /// are announced. To be called once.
    ///
    /// Throws `NetException` if a directory cannot be made, or a database that is broken not be
    /// moved away, and what making it anew throws: that is taken up again the next time.
    void openDatabase();
    /// Moves the database of the process away and makes it anew. Throws as `openDatabase` does.
    void recoverBrokenDatabase(String* reason);

    /// Saves the file of clients and subscriptions in 5 seconds, or when an earlier request said.
    /// A process that ends before leaves that to the next one's start.
    void saveSubscriptionsSoon();
    /// Saves it now. That it cannot be written draws a warning. Throws `SQLite::Exception`.
    void saveSubscriptions();
    static Foundation::URLReturner getClientPListURL();

    /// Takes the directory with the feed's saved entries away at once and deletes it by and by, so
    /// that no transaction waits for a big one, and a feed that is added again finds none; see
    /// `TruthRemoval`. `directory` may be null: there is none then.
    void deleteTruthDirectoryForFeed(FeedCore* feed, URL* directory);

    /// Whether a new database is being filled with what there was in an earlier one. The documents
    /// that arrive then come from the truth and are not written to it, and unread entries are not
    /// counted.
    bool isRestoring() const { return mRestoring; }

 private:
    MinistryOfTruth();

    void openExistingDatabase();
    void openNewDatabase();
    void openDBFile();
    void initializeDatabase();
    void restore();
    bool checkDatabaseSchema();
    void createDirectories();
    void deleteDatabase();
    bool restoreSubscriptions();
    bool convertOldSeedDatabase();

    bool mRestoring = false;
    Foundation::Timer<MinistryOfTruth> mSaveTimer;
    bool mPostsNotifications = false;
};

}  // namespace Orvane
