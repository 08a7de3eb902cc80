#pragma once

#include "Bridges/FeedObject.h"
#include "Foundation/Notification.h"

#include <memory>

namespace Orvane {

/// Whether a feed is being refreshed. It stays while it is.
class FeedRefreshing : public FeedObject {
 public:
    ~FeedRefreshing() override;

    bool isRefreshing() const { return mRefreshing; }
    /// Has the agent refresh the feed, or refreshes one in memory in this process. Whether it
    /// started. Throws what fails.
    bool startRefresh();
    void _beginRefresh();
    void _endRefresh();
    /// A refresh whose agent has died is over. Does nothing for a feed in memory.
    void _listenForAgentDeath();
    void _agentDied();

 protected:
    void stopListening();

 private:
    using Receiver = MethodReceiver<Foundation::Notification, FeedRefreshing>;

    void listen(Foundation::String* name, void* object);
    void feedNotified(Foundation::Notification* notification);
    void handleNotification(const Foundation::Notification& notification);

    std::unique_ptr<Receiver> mFeedListener;
    bool mRefreshing = false;
    unsigned mEndedRefreshes = 0;
    std::shared_ptr<OVFeed> mSelf;  ///< while it is refreshed
};

}  // namespace Orvane
