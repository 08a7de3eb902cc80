#pragma once

#include "Foundation/Returner.h"

namespace Orvane {

class FeedCore;
class FeedRefresher;

/// Who makes the feeders of feeds. Set once per process; null until then: no feed can be fetched,
/// and none be made of a URL.
class FeederFactory {
 public:
    virtual ~FeederFactory() = default;

    /// Whether feeds can be fetched from there.
    virtual bool supportsURL(const Foundation::URL* url) const = 0;
    /// A new feeder, which does not own the feed.
    virtual Foundation::Returner<FeedRefresher> makeFeeder(FeedCore* feed) = 0;

    static FeederFactory* current();
    /// The port must outlive its use.
    static void setCurrent(FeederFactory* port);
};

}  // namespace Orvane
