#pragma once

#include "Bridges/FeedRefreshing.h"
#include "Bridges/OnceList.h"

#include <Orvane/OVEntry.h>

#include <memory>
#include <string>

namespace Orvane {

/// What has changed in a feed, until that is told.
class FeedChanges : public FeedRefreshing {
 public:
    void _rememberAddedEntry(const std::shared_ptr<OVEntry>& entry);
    /// By its identifier, as the entry itself may be gone when that is told.
    void _rememberDeletedEntry(const std::string& identifier);
    void _rememberUpdatedEntry(const std::shared_ptr<OVEntry>& entry);
    void _rememberFlaggedEntry(const std::shared_ptr<OVEntry>& entry);
    /// Tells the delegate and the observers of all that, inside a refresh. Throws what fails, with
    /// the refresh ended that it has begun; `AssertionFailure` for a feed in memory.
    void _sendEntryNotifications();

    /// For a feed in memory, what was last read.
    int readUnreadCount();
    /// Tells of a change, if somebody has asked for the count before.
    void _checkForUnreadCountChange();

 protected:
    /// Forgets that somebody has asked; there is nothing to ask for of a feed in memory.
    void resetUnreadCount() { mUnreadCount = _subscriptionCore() ? -1 : 0; }

 private:
    void tellChanges();

    int mUnreadCount = 0;  ///< -1 for a subscribed feed until it is asked for
    OnceList<std::shared_ptr<OVEntry>> mAddedEntries;
    OnceList<std::string> mDeletedEntries;
    OnceList<std::shared_ptr<OVEntry>> mUpdatedEntries;
    OnceList<std::shared_ptr<OVEntry>> mFlaggedEntries;
};

}  // namespace Orvane
