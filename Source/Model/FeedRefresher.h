#pragma once

#include "Foundation/Action.h"
#include "Foundation/NetError.h"
#include "Foundation/RefCounted.h"

namespace Foundation {
class Data;
}

namespace Orvane {

/// What a feed knows of its feeder, which fetches its document and merges it into it.
class FeedRefresher : public Foundation::RefCounted {
 public:
    /// The feed has no more use for it: ends what runs, and does not touch the feed again.
    virtual void removed() = 0;
    /// Whether a refresh is due.
    virtual bool needsRefresh() const = 0;
    /// Starts a refresh, unless one runs: `force` fetches and compares all, `queued` lets it wait
    /// its turn behind others. Whether one runs now.
    virtual bool refresh(bool force, bool queued) = 0;
    /// Parses a document and merges it into the feed as if it had just been fetched, and stores in
    /// the feed what came of it. May throw `SQLite::Exception`.
    virtual void refreshFromData(Foundation::Data* data) = 0;
    /// What ended the last refresh; code 0 if nothing did.
    virtual Foundation::NetError getStatus() const = 0;
    /// Whether the last refresh changed the feed.
    virtual bool hasChanged() const = 0;

    ActionOf<FeedRefresher> mRefreshStarted;
    ActionOf<FeedRefresher> mFetchStarted;  ///< the network is now in use for it
    ActionOf<FeedRefresher> mRefreshFinished;
};

}  // namespace Orvane
