#pragma once

#include "Foundation/Data.h"
#include "Net/ConnectionResponse.h"

namespace Orvane {

/// A response with its body, and where it may be kept.
class CachedResponse : public Foundation::PFRefCounted {
 public:
    static Foundation::Returner<CachedResponse> cachedResponse(ConnectionResponse* response,
                                                               Foundation::Data* data,
                                                               StoragePolicy policy) {
        return Foundation::Returner<CachedResponse>(new CachedResponse(response, data, policy));
    }

    ConnectionResponse* getResponse() const { return mResponse; }
    Foundation::Data* getData() const { return mData; }
    StoragePolicy getStoragePolicy() const { return mPolicy; }

 private:
    CachedResponse(ConnectionResponse* response, Foundation::Data* data, StoragePolicy policy)
        : mResponse(response), mData(data), mPolicy(policy) {}

    Foundation::Ref<ConnectionResponse> mResponse;
    Foundation::Ref<Foundation::Data> mData;
    StoragePolicy mPolicy;
};

}  // namespace Orvane
