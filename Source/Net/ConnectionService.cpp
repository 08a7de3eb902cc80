#include "Net/ConnectionService.h"

#include "Foundation/AutoreleasePool.h"
#include "Net/CacheDirectory.h"
#include "Net/ConnectionLimits.h"
#include "Net/CurlTransport.h"
#include "Utilities/FileSystem.h"

#include <utility>

namespace Orvane {

namespace {

ConnectionService* sShared = nullptr;

}  // namespace

ConnectionService::Places ConnectionService::Places::ofUser() {
    const Foundation::AutoreleasePool pool;
    Places places;
    if (const std::string caches = CacheDirectory::path(); !caches.empty()) {
        places.retryTimes = caches + "/RetryTimes";
        places.responses = caches + "/Responses";
    }
    const Foundation::Ref<Foundation::URL> storage = Compatibility::FileSystem::getStorageURL();
    places.cookies = storage->getFileSystemRepresentation() + "/Cookies";
    return places;
}

ConnectionService& ConnectionService::shared() {
    if (sShared) return *sShared;
    static auto* const sService =
        new ConnectionService(std::make_unique<CurlTransport>(), Places::ofUser());
    return *sService;
}

ConnectionService* ConnectionService::setShared(ConnectionService* service) {
    return std::exchange(sShared, service);
}

ConnectionService::ConnectionService(std::unique_ptr<Transport> transport, const Places& places)
    : mTransport(std::move(transport)),
      mHostSlots(ConnectionLimits::kMaxConnectionsPerHost),
      mRetryTimes(places.retryTimes),
      mResponseCache(places.responses),
      mCookies(places.cookies) {}

}  // namespace Orvane
