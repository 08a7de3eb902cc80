#pragma once

#include "FeedParser/Text/HTMLLink.h"
#include "Foundation/ArrayOf.h"
#include "Foundation/Notification.h"
#include "Foundation/Ref.h"
#include "Foundation/URL.h"
#include "Model/FeedRefresher.h"
#include "Net/ProtectionSpace.h"

namespace Orvane {

class FeedCore;

/// Drives the refreshes of one feed, one at a time: what is common to all ways of fetching. On the
/// thread of the feed's run loop. What the last refresh came to can be read until the next one.
class Feeder : public FeedRefresher {
 public:
    /// The feed, which is not retained, calls `removed` before it ends.
    explicit Feeder(const Foundation::Ref<FeedCore>& feed);
    ~Feeder() override;

    void removed() override;
    /// Whether a refresh runs now. One that runs already goes on as it began; one that cannot be
    /// begun is told by `getStatus`.
    bool refresh(bool force, bool queued) override;
    /// Whether feeds are found in the local network.
    virtual bool isLinkLocal() const { return false; }

    /// Null once it was removed.
    FeedCore* getFeed() const { return mFeed; }
    /// Of the feed, as it was when this was made.
    Foundation::URL* getURL() const { return mURL; }
    Foundation::NetError getStatus() const override { return mStatus; }
    bool hasChanged() const override { return mChanged; }
    bool isRefreshing() const { return mRefreshing; }
    /// What asked for a login when a request failed for the want of one; may be null.
    ProtectionSpace* getProtectionSpace() const { return mProtectionSpace; }
    /// The links of the document that the last refresh brought, a feed or a page; null for none.
    const Foundation::ArrayOf<HTMLLink>* getLinks() const { return mLinks; }

 protected:
    /// Begins to fetch. Whether it has begun; `endedRefresh` was called otherwise.
    virtual bool doRefresh() = 0;
    /// Lets go of what was begun.
    virtual void cancelRefresh() = 0;

    /// The refresh has gone well.
    void endedRefresh(bool changed);
    /// The refresh has ended, by an error if that has a code. Whoever calls this keeps the feeder
    /// alive: those who hear of it may let it go.
    void endedRefresh(Foundation::NetError error);

    FeedCore* mFeed;
    Foundation::Ref<Foundation::URL> mURL;
    Foundation::NetError mStatus;
    Foundation::Ref<ProtectionSpace> mProtectionSpace;
    Foundation::Ref<const Foundation::ArrayOf<HTMLLink>> mLinks;
    bool mRefreshing = false;
    bool mForce = false;   ///< fetches, parses and compares whatever is known already
    bool mQueued = false;  ///< in the background: waits its turn
    bool mChanged = false;

 private:
    bool storeError(Foundation::NetError error);
    void save(bool atOnce);
    void cancelBackgroundRefresh(Foundation::Notification* notification);

    MethodReceiver<Foundation::Notification, Feeder> mCancelReceiver;
};

}  // namespace Orvane
