#pragma once

#include "Bridges/OVInternal.h"
#include "Foundation/Ref.h"
#include "Model/FeedCore.h"
#include "Model/SubscriptionCore.h"

#include <Orvane/OVClientDelegate.h>
#include <Orvane/OVFeed.h>
#include <Orvane/OVNotificationCenter.h>

#include <functional>
#include <map>
#include <memory>
#include <string>

namespace Orvane {

/// The rows that an `OVFeed` stands for, and its voice. The core is the subscription; there is none
/// for a feed in memory.
class FeedObject : public OVInternal {
 public:
    ~FeedObject() override;

    /// The feed's row, for use. Throws `NetException` if it is lost.
    FeedCore& core() const;
    FeedCore* _feedCore() const { return mFeedCore.get(); }
    /// Null for a feed in memory.
    SubscriptionCore* _subscriptionCore() const;
    std::shared_ptr<OVFeed> self() const;
    /// Null for a feed in memory.
    std::shared_ptr<OVClient> client() const;

 protected:
    using Told = std::function<void(OVClientDelegate&, const std::shared_ptr<OVFeed>&)>;

    void setFeedCore(FeedCore* feed) { mFeedCore = feed; }
    /// Announces something of the feed in the application.
    void post(const char* name, std::map<std::string, OVNotification::List> info = {}) const;
    /// Lets `call` tell the delegate of the feed's client something, if there is one. What it
    /// throws is reported and goes no further.
    void tellDelegate(const Told& call) const;

 private:
    Foundation::Ref<FeedCore> mFeedCore;
};

}  // namespace Orvane
