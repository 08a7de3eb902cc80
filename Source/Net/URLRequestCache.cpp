// How a request keeps its response for later.

#include "Net/URLRequest.h"

#include "Foundation/Clock.h"
#include "Foundation/Logger.h"
#include "Net/ConnectionService.h"

namespace Orvane {

using Foundation::Ref;

namespace {

constexpr double kLeastSeconds = 1.0;
constexpr double kSecondsPerMinute = 60.0;

}  // namespace

bool URLRequest::cacheResponse(double minLifetime) {
    if (!mResponse || !mResponseData) return false;
    const StoragePolicy recommended = mResponse->getRecommendedStoragePolicy();
    const bool overrule = minLifetime > 0 && recommended == StoragePolicy::NotAllowed;
    const StoragePolicy policy = overrule ? StoragePolicy::Allowed : recommended;
    if (mResponseData->getLength() == 0 || policy == StoragePolicy::NotAllowed) {
        gLogHTTP.log("%@: Couldn't cache response", this);
        return false;
    }
    const double now = Foundation::Clock::current().now();
    double remaining = mResponse->getExpirationTime() - now;
    if (minLifetime > 0 && minLifetime > remaining) {
        mResponse->setExpirationTime(now + minLifetime);
        remaining = minLifetime;
    }
    if (remaining < kLeastSeconds) {
        gLogHTTP.log("%@: Couldn't cache response", this);
        return false;
    }
    gLogHTTP.log("%@: Caching response (%u bytes, expires in %.1lf min)", this,
                 static_cast<unsigned>(mResponseData->getLength()), remaining / kSecondsPerMinute);
    const Ref<CachedResponse> cached =
        CachedResponse::cachedResponse(mResponse, mResponseData, policy);
    ConnectionService::shared().responseCache().add(cached, mRequest);
    return true;
}

}  // namespace Orvane
