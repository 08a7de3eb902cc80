#pragma once

#include "Bridges/OVInternal.h"
#include "Bridges/OnceList.h"
#include "Foundation/Notification.h"
#include "Model/FeedCore.h"
#include "Model/SubscriptionCore.h"

#include <Orvane/OVFeed.h>
#include <Orvane/OVNotificationCenter.h>

#include <map>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace Orvane {
class ClientCore;
}

/// The state of an `OVFeed`. Its core is the subscription; there is none for a feed in memory.
class OVFeedInternal : public OVInternal {
 public:
    /// The public object of a feed and of the subscription to it, which may be null. Null without a
    /// feed.
    static std::shared_ptr<OVFeed> _initWithFeedCore(Orvane::FeedCore* feedCore,
                                                     Orvane::SubscriptionCore* subscriptionCore);
    ~OVFeedInternal() override;

    /// The feed's row, for use. Throws `NetException` if it is lost.
    Orvane::FeedCore& core() const;
    Orvane::FeedCore* _feedCore() const { return mFeedCore.get(); }
    /// Null for a feed in memory.
    Orvane::SubscriptionCore* _subscriptionCore() const;
    const std::string& getURL() const { return mURL; }
    std::shared_ptr<OVFeed> self() const;
    std::shared_ptr<OVClient> client() const;

    // Subscribing.

    /// Whether the client has it now; false if it had a feed of that URL before. Throws
    /// `OVException` for a feed that has a client.
    bool _addToClient(Orvane::ClientCore& client);
    /// Ends the subscription. Whether the agent did it, which is reported.
    bool _remove();
    std::optional<OVFeedSettings> getSettings() const;
    void setSettings(const std::optional<OVFeedSettings>& settings);

    // Refreshing.

    bool isRefreshing() const { return mRefreshing; }
    /// Whether it started. Throws what fails.
    bool startRefresh();
    void _beginRefresh();
    void _endRefresh();
    void _listenForAgentDeath();
    void _agentDied();

    // What has changed, until it is told.

    void _rememberAddedEntry(const std::shared_ptr<OVEntry>& entry);
    void _rememberDeletedEntry(const std::shared_ptr<OVEntry>& entry);
    void _rememberUpdatedEntry(const std::shared_ptr<OVEntry>& entry);
    void _rememberFlaggedEntry(const std::shared_ptr<OVEntry>& entry);
    /// Tells the delegate and the observers of all that, inside a refresh.
    void _sendEntryNotifications();
    int readUnreadCount();
    /// Tells of a change, if somebody has asked for the count before.
    void _checkForUnreadCountChange();

 protected:
    Rank getRank() const override { return Rank::Feed; }
    Foundation::Ref<Orvane::Core> findAgain() override;
    void foundAgain() override;

 private:
    using Receiver = Orvane::MethodReceiver<Foundation::Notification, OVFeedInternal>;

    void adopt(Orvane::SubscriptionCore* subscription);
    void becomeUnsubscribed();
    void listen(Foundation::String* name, void* object);
    void stopListening();
    void feedNotified(Foundation::Notification* notification);
    void handleNotification(const Foundation::Notification& notification);
    void tellChanges();
    void post(const char* name, std::map<std::string, OVNotification::List> info = {});

    Foundation::Ref<Orvane::FeedCore> mFeedCore;
    // By which the feed is found again.
    std::string mURL;
    std::string mClientSignature;
    std::unique_ptr<Receiver> mFeedListener;
    bool mRefreshing = false;
    unsigned mEndedRefreshes = 0;
    std::shared_ptr<OVFeed> mSelf;  ///< while it is refreshed
    int mUnreadCount = 0;           ///< -1 for a subscribed feed until it is asked for
    Orvane::OnceList<std::shared_ptr<OVEntry>> mAddedEntries;
    Orvane::OnceList<std::string> mDeletedEntries;
    Orvane::OnceList<std::shared_ptr<OVEntry>> mUpdatedEntries;
    Orvane::OnceList<std::shared_ptr<OVEntry>> mFlaggedEntries;
    std::optional<OVFeedSettings> mTemporarySettings;  ///< of a feed in memory
};
