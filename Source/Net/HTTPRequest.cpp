#include "Net/HTTPRequest.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Bundle.h"
#include "Foundation/Logger.h"
#include "Net/HTTPCookieStorage.h"

namespace Orvane {

using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;
using Foundation::URL;

namespace {

/// What goes along with a redirect.
constexpr const char* kCarriedHeaders[] = {"User-Agent", "If-Modified-Since", "If-None-Match"};

/// Whether whoever gets this status is to ask elsewhere from now on. 308 is 301 for any method.
bool isPermanent(int status) {
    return status == 301 || status == 308;
}

}  // namespace

HTTPRequest::HTTPRequest(URL* url, String* method) : URLRequest(url), mMethod(method) {
    OV_ASSERT(method);
    const Ref<String> name = String::string("User-Agent");
    putHeader(*HTTPRequest::_getRequest(), name, userAgent());
    gLogHTTP.log("Init HTTPRequest %p to %@ <%@>", static_cast<const void*>(this), mMethod, mURL);
}

HTTPRequest::~HTTPRequest() = default;

/// As long as the process.
String* HTTPRequest::userAgent() {
    static String* const sUserAgent = [] {
        const Ref<String> version = Foundation::Bundle::frameworkVersion();
        return String::stringWithFormat("Tarnwick-Orvane/%@", version).detach();
    }();
    return sUserAgent;
}

ConnectionRequest* HTTPRequest::_getRequest() {
    if (mRequest) return mRequest;
    const Ref<HTTPMessage> message = HTTPMessage::request(mMethod, mURL);
    mRequest = ConnectionRequest::request(message, kDefaultTimeout);
    mRequest->setCookieAcceptPolicy(HTTPCookieStorage::defaultStorage()->cookieAcceptPolicy());
    mRequest->setHandlesCookies(true);
    return mRequest;
}

void HTTPRequest::setHeader(String* header, String* value) {
    OV_ASSERT(header);
    if (value) putHeader(*_getRequest(), header, value);
}

void HTTPRequest::putHeader(ConnectionRequest& request, String* header, String* value) const {
    gLogHTTP.log("HTTPRequest %p: Set header: %@: %@", static_cast<const void*>(this), header,
                 value);
    request.setHeader(header, value);
}

Foundation::StringReturner HTTPRequest::getHeader(String* header) const {
    return mRequest->getHeader(header);
}

void HTTPRequest::makeConditional(String* lastModified, String* eTag) {
    const Ref<String> modifiedSince = String::string("If-Modified-Since");
    const Ref<String> noneMatch = String::string("If-None-Match");
    setHeader(modifiedSince, lastModified);
    setHeader(noneMatch, eTag);
}

void HTTPRequest::setBody(Foundation::Data* body) {
    _getRequest()->message().setBody(body);
}

Returner<ConnectionRequest> HTTPRequest::_willSendRequest(ConnectionRequest* request,
                                                          ConnectionResponse* response) {
    if (!response) return URLRequest::_willSendRequest(request, response);
    const HTTPMessage* message = response->getHTTPMessage();
    noteRedirect(request->getURL(), message ? message->getStatus() : 0);
    Ref<ConnectionRequest> copy = request->copy();
    for (const char* name : kCarriedHeaders) {
        const Ref<String> header = String::string(name);
        const Ref<String> value = getHeader(header);
        if (value) copy->setHeader(header, value);
    }
    return copy;
}

void HTTPRequest::noteRedirect(URL* target, int status) {
    // Equal, at the start because both are null, as long as there was no other redirect.
    const bool isUnbroken = Foundation::IsEqual(mFinalURL.get(), mFinalPermanentURL.get());
    if (isPermanent(status) && isUnbroken) mFinalPermanentURL = target;
    mFinalURL = target;
    gLogHTTP.log("%@: Redirected (%i) to <%@>", this, status, target);
}

}  // namespace Orvane
