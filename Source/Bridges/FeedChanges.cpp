#include "Bridges/FeedChanges.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Logger.h"

#include <map>
#include <utility>

namespace Orvane {

void FeedChanges::_rememberAddedEntry(const std::shared_ptr<OVEntry>& entry) {
    mAddedEntries.add(entry);
}

void FeedChanges::_rememberDeletedEntry(const std::string& identifier) {
    mDeletedEntries.add(identifier);
}

void FeedChanges::_rememberUpdatedEntry(const std::shared_ptr<OVEntry>& entry) {
    mUpdatedEntries.add(entry);
}

void FeedChanges::_rememberFlaggedEntry(const std::shared_ptr<OVEntry>& entry) {
    mFlaggedEntries.add(entry);
}

void FeedChanges::_sendEntryNotifications() {
    const std::shared_ptr<OVFeed> keep = self();
    OV_ASSERT_MESSAGE_AS(client() != nullptr, "client", "No client");
    const bool isBegun = !isRefreshing();
    if (isBegun) _beginRefresh();
    try {
        tellChanges();
        _checkForUnreadCountChange();
    } catch (...) {
        if (isBegun) _endRefresh();
        throw;
    }
    if (isBegun) _endRefresh();
}

void FeedChanges::tellChanges() {
    std::map<std::string, OVNotification::List> info;
    const auto tell = [&](auto& changes, const char* key, auto callback) {
        const auto list = changes.take();
        if (list.empty()) return;
        tellDelegate([&](OVClientDelegate& delegate, const std::shared_ptr<OVFeed>& feed) {
            (delegate.*callback)(feed, list);
        });
        info[key] = list;
    };
    tell(mAddedEntries, OVFeedAddedEntriesKey, &OVClientDelegate::feedDidAddEntries);
    tell(mDeletedEntries, OVFeedRemovedEntriesKey,
         &OVClientDelegate::feedDidRemoveEntriesWithIdentifiers);
    tell(mUpdatedEntries, OVFeedUpdatedEntriesKey, &OVClientDelegate::feedDidUpdateEntries);
    tell(mFlaggedEntries, OVFeedDidChangeEntryFlagsKey,
         &OVClientDelegate::feedDidChangeFlagsInEntries);
    post(OVFeedEntriesChangedNotification, std::move(info));
}

int FeedChanges::readUnreadCount() {
    if (const SubscriptionCore* subscription = _subscriptionCore()) {
        mUnreadCount = subscription->mUnreadCount;
    }
    return mUnreadCount;
}

void FeedChanges::_checkForUnreadCountChange() {
    const int old = mUnreadCount;
    if (old < 0) return;
    const int count = readUnreadCount();
    if (count == old) return;
    gLogAPI.log("Unread count of %@ changed from %i to %i", getOwner(), old, count);
    tellDelegate([](OVClientDelegate& delegate, const std::shared_ptr<OVFeed>& feed) {
        delegate.feedUnreadCountChanged(feed);
    });
    post(OVFeedUnreadCountChangedNotification);
}

}  // namespace Orvane
