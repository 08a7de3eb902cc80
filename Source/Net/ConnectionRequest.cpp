#include "Net/ConnectionRequest.h"

#include "Foundation/AssertionFailure.h"

namespace Orvane {

using Foundation::Ref;
using Foundation::Returner;

Returner<ConnectionRequest> ConnectionRequest::request(Foundation::URL* url, CachePolicy policy,
                                                       double timeout) {
    const Ref<Foundation::String> get = Foundation::String::string("GET");
    Ref<ConnectionRequest> made = Returner<ConnectionRequest>(new ConnectionRequest);
    made->mMessage = HTTPMessage::request(get, url);
    made->mCachePolicy = policy;
    made->mTimeout = timeout;
    return made;
}

Returner<ConnectionRequest> ConnectionRequest::request(const HTTPMessage* message, double timeout) {
    OV_ASSERT(message && message->isRequest());
    Ref<ConnectionRequest> made = Returner<ConnectionRequest>(new ConnectionRequest);
    made->mMessage = message->copy();
    made->mCachePolicy = CachePolicy::Reload;
    made->mTimeout = timeout;
    return made;
}

Returner<ConnectionRequest> ConnectionRequest::copy() const {
    Ref<ConnectionRequest> made = Returner<ConnectionRequest>(new ConnectionRequest);
    made->mMessage = mMessage->copy();
    made->mCachePolicy = mCachePolicy;
    made->mTimeout = mTimeout;
    made->mCookieAcceptPolicy = mCookieAcceptPolicy;
    made->mHandlesCookies = mHandlesCookies;
    made->mIsDocument = mIsDocument;
    return made;
}

}  // namespace Orvane
