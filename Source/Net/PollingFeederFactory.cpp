#include "Net/PollingFeederFactory.h"

#include "Net/PollingFeeder.h"

namespace Orvane {

using Foundation::Returner;

bool PollingFeederFactory::supportsURL(const Foundation::URL* url) const {
    return PollingFeeder::supportsURL(url);
}

Returner<FeedRefresher> PollingFeederFactory::makeFeeder(FeedCore* feed) {
    return Returner<PollingFeeder>::adopted(new PollingFeeder(feed));
}

}  // namespace Orvane
