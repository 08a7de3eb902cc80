#pragma once

#include "Net/HTTPMessage.h"
#include "Net/URLRequest.h"

namespace Orvane {

/// A request of HTTP, which follows redirects and keeps where they led.
class HTTPRequest : public URLRequest {
 public:
    /// Throws `AssertionFailure` for null.
    HTTPRequest(Foundation::URL* url, Foundation::String* method);
    ~HTTPRequest() override;

    /// Null leaves the header as it is. Throws `AssertionFailure` without a name.
    void setHeader(Foundation::String* header, Foundation::String* value);
    /// Null if it is not set.
    Foundation::StringReturner getHeader(Foundation::String* header) const;
    /// Asks for the body only if it has changed since the response that had these two headers,
    /// either of which may be null.
    void makeConditional(Foundation::String* lastModified, Foundation::String* eTag);
    /// The body of the request; may be null.
    void setBody(Foundation::Data* body);

    /// Where the response came from.
    Foundation::URL* getFinalURL() const { return mFinalURL ? mFinalURL : mURL; }
    /// Where to ask from now on: as far as every redirect from the start was a permanent one.
    Foundation::URL* getFinalPermanentURL() const {
        return mFinalPermanentURL ? mFinalPermanentURL : mURL;
    }
    /// Null before `mGotResponse`.
    HTTPMessage* getHTTPResponse() const {
        return mResponse ? mResponse->getHTTPMessage() : nullptr;
    }

 protected:
    ConnectionRequest* _getRequest() override;
    Foundation::Returner<ConnectionRequest> _willSendRequest(ConnectionRequest* request,
                                                             ConnectionResponse* response) override;

 private:
    static Foundation::String* userAgent();
    void putHeader(ConnectionRequest& request, Foundation::String* header,
                   Foundation::String* value) const;
    void noteRedirect(Foundation::URL* target, int status);

    Foundation::Ref<Foundation::String> mMethod;
    Foundation::Ref<Foundation::URL> mFinalURL;
    Foundation::Ref<Foundation::URL> mFinalPermanentURL;
};

}  // namespace Orvane
