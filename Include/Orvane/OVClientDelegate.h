#pragma once

#include <Orvane/OVEntry.h>
#include <Orvane/OVFeed.h>

#include <memory>
#include <string>
#include <vector>

/// What an application is told of its feeds. Override what is of interest.
///
/// Called from the run loop and not from inside operations that the application calls, but for
/// `OVClient::sendChangesSinceDate` and `OVFeed::refresh`. What a callback throws is reported and
/// goes no further.
class OVClientDelegate {
 public:
    virtual ~OVClientDelegate() = default;

    // Changes of entries always come between these two, whoever made them.

    /// The feed has begun to be refreshed.
    virtual void feedDidBeginRefresh(const std::shared_ptr<OVFeed>& /*feed*/) {}
    /// That has ended, in whatever way: see `OVFeed::lastError`. Also if the agent has died.
    virtual void feedDidEndRefresh(const std::shared_ptr<OVFeed>& /*feed*/) {}

    /// Entries that are new.
    virtual void feedDidAddEntries(const std::shared_ptr<OVFeed>& /*feed*/,
                                   const OVEntry::List& /*entries*/) {}
    /// Entries that are gone, or have expired for this client.
    virtual void feedDidRemoveEntriesWithIdentifiers(
        const std::shared_ptr<OVFeed>& /*feed*/, const std::vector<std::string>& /*identifiers*/) {}
    /// Entries whose content has changed.
    virtual void feedDidUpdateEntries(const std::shared_ptr<OVFeed>& /*feed*/,
                                      const OVEntry::List& /*entries*/) {}
    /// Entries that were marked as read or flagged, or as neither.
    virtual void feedDidChangeFlagsInEntries(const std::shared_ptr<OVFeed>& /*feed*/,
                                             const OVEntry::List& /*entries*/) {}
    /// `OVFeed::unreadCount` has changed, of a feed that has been asked for it before.
    virtual void feedUnreadCountChanged(const std::shared_ptr<OVFeed>& /*feed*/) {}
};
