#pragma once

#include "Net/CookieAcceptPolicy.h"
#include "Net/HTTPMessage.h"

namespace Orvane {

/// Whether the cache of responses may answer a request.
enum class CachePolicy {
    UseProtocol = 0,    ///< while what it holds is fresh
    Reload = 1,         ///< never
    CacheElseLoad = 2,  ///< with whatever it holds
};

/// What a `Connection` is to fetch, and how. Only "http" and "https" URLs can be fetched.
class ConnectionRequest : public Foundation::PFRefCounted {
 public:
    static constexpr double kDefaultTimeout = 60.0;

    /// A GET. Cookies are not handled until told to. Throws `AssertionFailure` for null.
    static Foundation::Returner<ConnectionRequest> request(Foundation::URL* url, CachePolicy policy,
                                                           double timeout);
    /// A prepared message, which is copied. It is meant for the server: the cache does not answer
    /// it unless told to.
    static Foundation::Returner<ConnectionRequest> request(const HTTPMessage* message,
                                                           double timeout);
    Foundation::Returner<ConnectionRequest> copy() const;

    Foundation::URL* getURL() const { return mMessage->getURL(); }
    HTTPMessage& message() { return *mMessage; }
    const HTTPMessage& message() const { return *mMessage; }

    Foundation::StringReturner getHeader(const Foundation::String* name) const {
        return mMessage->getHeader(name);
    }
    void setHeader(const Foundation::String* name, const Foundation::String* value) {
        mMessage->setHeader(name, value);
    }

    CachePolicy getCachePolicy() const { return mCachePolicy; }
    void setCachePolicy(CachePolicy policy) { mCachePolicy = policy; }
    /// Seconds without a byte after which the request has failed.
    double getTimeout() const { return mTimeout; }

    CookieAcceptPolicy getCookieAcceptPolicy() const { return mCookieAcceptPolicy; }
    void setCookieAcceptPolicy(CookieAcceptPolicy policy) { mCookieAcceptPolicy = policy; }
    bool handlesCookies() const { return mHandlesCookies; }
    void setHandlesCookies(bool handles) { mHandlesCookies = handles; }

    /// Whether a whole document is to be held in memory, which bounds its size and the time that
    /// fetching it may take. True until told otherwise; other bodies are for files.
    bool isDocument() const { return mIsDocument; }
    void setIsDocument(bool isDocument) { mIsDocument = isDocument; }

 private:
    ConnectionRequest() = default;

    Foundation::Ref<HTTPMessage> mMessage;
    CachePolicy mCachePolicy = CachePolicy::UseProtocol;
    double mTimeout = kDefaultTimeout;
    CookieAcceptPolicy mCookieAcceptPolicy = CookieAcceptPolicy::OnlyFromMainDocument;
    bool mHandlesCookies = false;
    bool mIsDocument = true;
};

}  // namespace Orvane
