#pragma once

#include "Net/HTTPMessage.h"

namespace Orvane {

/// Where a response may be kept.
enum class StoragePolicy {
    Allowed = 0,
    AllowedInMemoryOnly = 1,
    NotAllowed = 2,
};

/// What a server said before the body.
class ConnectionResponse : public Foundation::PFRefCounted {
 public:
    /// The response to `request` that `message` is, got at `now`, seconds since 2001. What the
    /// server says of its lifetime (RFC 9111) is read here; where it says none there is none.
    /// `hasLogin` says that the transport sent a login with the request.
    static Foundation::Returner<ConnectionResponse> response(const HTTPMessage* request,
                                                             HTTPMessage* message, double now,
                                                             bool hasLogin = false);

    /// Where it came from, after all redirects.
    Foundation::URL* getURL() const { return mURL; }
    HTTPMessage* getHTTPMessage() const { return mMessage; }

    StoragePolicy getRecommendedStoragePolicy() const { return mStoragePolicy; }
    /// Until when it is fresh, seconds since 2001.
    double getExpirationTime() const { return mExpirationTime; }
    void setExpirationTime(double time) { mExpirationTime = time; }

 private:
    ConnectionResponse() = default;

    Foundation::Ref<Foundation::URL> mURL;
    Foundation::Ref<HTTPMessage> mMessage;
    StoragePolicy mStoragePolicy = StoragePolicy::NotAllowed;
    double mExpirationTime = 0;
};

}  // namespace Orvane
