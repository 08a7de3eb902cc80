#include "Bridges/Barriers.h"
#include "Bridges/OVClientInternal.h"
#include "Bridges/OVFeedInternal.h"
#include "Bridges/PublicObjectFactory.h"
#include "Foundation/AssertionFailure.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/NotificationNames.h"
#include "Model/AgentLink.h"

#include <algorithm>

using namespace Foundation;
using namespace Orvane;

// What a feed tells of its refreshes and of its entries.

bool OVFeedInternal::startRefresh() {
    if (SubscriptionCore* subscription = _subscriptionCore()) {
        if (!subscription->startRefresh()) return false;
        _beginRefresh();
        return true;
    }
    if (!mFeedListener) listen(nullptr, mFeedCore.get());
    const unsigned ended = mEndedRefreshes;
    if (!mFeedCore->refresh(false, true)) return false;
    // It may be over already.
    if (mEndedRefreshes == ended) _beginRefresh();
    return true;
}

void OVFeedInternal::_beginRefresh() {
    if (!mRefreshing) {
        mRefreshing = true;
        mSelf = self();
        post(OVFeedRefreshingNotification);
        OVClientInternal::tellDelegateOf(
            *this, [](OVClientDelegate& delegate, const std::shared_ptr<OVFeed>& feed) {
                delegate.feedDidBeginRefresh(feed);
            });
    }
    _listenForAgentDeath();
}

void OVFeedInternal::_endRefresh() {
    ++mEndedRefreshes;
    if (!mRefreshing) return;
    // The object may end with this reference.
    const std::shared_ptr<OVFeed> feed = std::move(mSelf);
    mSelf = nullptr;
    mRefreshing = false;
    post(OVFeedRefreshingNotification);
    OVClientInternal::tellDelegateOf(
        *this, [](OVClientDelegate& delegate, const std::shared_ptr<OVFeed>& self) {
            delegate.feedDidEndRefresh(self);
        });
}

void OVFeedInternal::_listenForAgentDeath() {
    if (!_subscriptionCore()) return;
    AgentLink::current().listenForAgentDeath();
    if (mFeedListener) return;
    gLogIPC.log("%@ listening for agent-died notifications", getOwner());
    listen(NotificationNames::kAgentDied, nullptr);
}

void OVFeedInternal::_agentDied() {
    const std::shared_ptr<OVFeed> keep = self();
    _endRefresh();
    stopListening();
}

void OVFeedInternal::listen(String* name, void* object) {
    mFeedListener = std::make_unique<Receiver>(this, &OVFeedInternal::feedNotified);
    NotificationCenter::getLocal()->addObserver(mFeedListener.get(), name, object);
}

void OVFeedInternal::stopListening() {
    if (!mFeedListener) return;
    NotificationCenter::getLocal()->removeObserver(mFeedListener.get());
    mFeedListener = nullptr;
}

void OVFeedInternal::feedNotified(Notification* notification) {
    const std::shared_ptr<OVFeed> keep = self();
    try {
        handleNotification(*notification);
    } catch (const std::exception& exception) {
        gWarn.log("OVFeed: Exception handling feed change: %s", exception.what());
    } catch (...) {
        gWarn.log("OVFeed: Exception handling feed change: %s", "of an unknown kind");
    }
}

void OVFeedInternal::handleNotification(const Notification& notification) {
    const std::string& name = notification.name->utf8();
    if (name == NotificationNames::kAgentDied.text()) return _agentDied();
    if (notification.object != mFeedCore.get()) return;
    if (name == FeedCore::kWillRefreshNotification.text()) {
        _beginRefresh();
    } else if (name == FeedCore::kEndedUpdateLocalNotification.text()) {
        _endRefresh();
    }
}

void OVFeedInternal::_rememberAddedEntry(const std::shared_ptr<OVEntry>& entry) {
    mAddedEntries.add(entry);
}

void OVFeedInternal::_rememberDeletedEntry(const std::shared_ptr<OVEntry>& entry) {
    mDeletedEntries.add(entry->identifier().value_or(""));
}

void OVFeedInternal::_rememberUpdatedEntry(const std::shared_ptr<OVEntry>& entry) {
    mUpdatedEntries.add(entry);
}

void OVFeedInternal::_rememberFlaggedEntry(const std::shared_ptr<OVEntry>& entry) {
    mFlaggedEntries.add(entry);
}

void OVFeedInternal::_sendEntryNotifications() {
    const std::shared_ptr<OVFeed> keep = self();
    OV_ASSERT_MESSAGE_AS(client() != nullptr, "client", "No client");
    const bool isBegun = !mRefreshing;
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

void OVFeedInternal::tellChanges() {
    std::map<std::string, OVNotification::List> info;
    const auto tell = [&](auto& changes, const char* key, auto callback) {
        const auto list = changes.take();
        if (list.empty()) return;
        OVClientInternal::tellDelegateOf(
            *this, [&](OVClientDelegate& delegate, const std::shared_ptr<OVFeed>& feed) {
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

int OVFeedInternal::readUnreadCount() {
    if (const SubscriptionCore* subscription = _subscriptionCore()) {
        mUnreadCount = subscription->mUnreadCount;
    }
    return mUnreadCount;
}

void OVFeedInternal::_checkForUnreadCountChange() {
    const int old = mUnreadCount;
    if (old < 0) return;
    const int count = readUnreadCount();
    if (count == old) return;
    gLogAPI.log("Unread count of %@ changed from %i to %i", getOwner(), old, count);
    OVClientInternal::tellDelegateOf(
        *this, [](OVClientDelegate& delegate, const std::shared_ptr<OVFeed>& feed) {
            delegate.feedUnreadCountChanged(feed);
        });
    post(OVFeedUnreadCountChangedNotification);
}

void OVFeedInternal::post(const char* name, std::map<std::string, OVNotification::List> info) {
    OVNotificationCenter::defaultCenter().post({name, self(), std::move(info)});
}
