#pragma once

namespace Orvane {

/// Who looks after the whole database, which rows and migrations ask for. Set once per process;
/// null until then.
class Housekeeping {
 public:
    virtual ~Housekeeping() = default;

    /// Counts the unread entries of every subscription anew, in the loop's next turn.
    virtual void updateAllUnreadCountsSoon() = 0;
    /// Deletes the entries that have expired for all subscriptions of their feed, with all that
    /// belongs to them, unless they are flagged or still in the feed's document. How many rows that
    /// were. Goes by what is saved, and forgets what is in memory of entries. Throws
    /// `SQLite::Exception`.
    virtual int expungeOldArticles() = 0;

    static Housekeeping* current();
    /// The port must outlive its use.
    static void setCurrent(Housekeeping* port);
};

}  // namespace Orvane
