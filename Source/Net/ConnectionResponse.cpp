#include "Net/ConnectionResponse.h"

#include "Net/CacheDirectives.h"

#include <algorithm>

namespace Orvane {

using Foundation::Ref;
using Foundation::Returner;

namespace {

/// The statuses whose responses are whole and final: RFC 9110, 15.1, without the partial ones.
bool isCacheableStatus(int status) {
    constexpr int kStatuses[] = {200, 203, 204, 300, 301, 308, 404, 405, 410, 414, 501};
    return std::ranges::find(kStatuses, status) != std::ranges::end(kStatuses);
}

StoragePolicy storagePolicyOf(const HTTPMessage& request, const HTTPMessage& response,
                              const CacheDirectives& directives, bool hasLogin) {
    if (request.getMethod() != "GET" || !isCacheableStatus(response.getStatus()) ||
        !directives.mayBeStored) {
        return StoragePolicy::NotAllowed;
    }
    // What was given to one who had to say who he is does not belong on a disk.
    if (hasLogin || request.hasHeader("Authorization")) return StoragePolicy::AllowedInMemoryOnly;
    return StoragePolicy::Allowed;
}

}  // namespace

Returner<ConnectionResponse> ConnectionResponse::response(const HTTPMessage* request,
                                                          HTTPMessage* message, double now,
                                                          bool hasLogin) {
    const CacheDirectives directives = CacheDirectives::of(*message, now);
    Ref<ConnectionResponse> made = Returner<ConnectionResponse>(new ConnectionResponse);
    made->mURL = Ref<Foundation::URL>(request->getURL());
    made->mMessage = Ref<HTTPMessage>(message);
    made->mStoragePolicy = storagePolicyOf(*request, *message, directives, hasLogin);
    made->mExpirationTime = now + directives.lifetime.value_or(0);
    return made;
}

}  // namespace Orvane
