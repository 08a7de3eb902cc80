#pragma once

#include "Model/FeederFactory.h"

namespace Orvane {

/// Makes a `PollingFeeder` for every feed.
class PollingFeederFactory : public FeederFactory {
 public:
    bool supportsURL(const Foundation::URL* url) const override;
    Foundation::Returner<FeedRefresher> makeFeeder(FeedCore* feed) override;
};

}  // namespace Orvane
