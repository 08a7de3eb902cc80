// How a connection gets from one server to the next.

#include "Net/Connection.h"
#include "Net/ConnectionLimits.h"

#include "Foundation/Logger.h"

#include <utility>

namespace Orvane {

using Foundation::NetError;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;
using Foundation::URL;

namespace {

bool isRedirect(int status) {
    return status == 301 || status == 302 || status == 303 || status == 307 || status == 308;
}

bool isHTTP(const URL& url) {
    return url.isScheme("http") || url.isScheme("https");
}

}  // namespace

/// Null where the response names no place that can be made out.
Foundation::URLReturner Connection::redirectTarget(const HTTPMessage& response) const {
    const Ref<String> name = String::string("Location");
    const Ref<String> location = response.getHeader(name);
    const Ref<String> text = location ? Ref<String>(location->getTrimmedString()) : nullptr;
    return URL::lenientURL(text, mRequest->getURL());
}

/// The request that a redirect asks for: RFC 9110, 15.4. Headers do not go along; who made the
/// request knows which may be seen by others.
Returner<ConnectionRequest> Connection::redirected(URL* target, int status) const {
    const HTTPMessage& old = mRequest->message();
    const bool becomesGet = old.getMethod() != "GET" && old.getMethod() != "HEAD" &&
                            (status == 303 || (status <= 302 && old.getMethod() == "POST"));
    Ref<ConnectionRequest> next = mRequest->copy();
    HTTPMessage& message = next->message();
    const std::vector<HTTPHeader> headers = message.headers();
    for (const HTTPHeader& header : headers) {
        message.removeHeader(header.name);
    }
    message.setURL(target);
    if (becomesGet) {
        message.setMethod("GET");
        message.setBody(nullptr);
    } else if (message.getBody() && old.hasHeader("Content-Type")) {
        message.setHeader("Content-Type", old.getHeader("Content-Type"));
    }
    return next;
}

/// Whether the response was a redirect and is dealt with.
bool Connection::followRedirect(ConnectionResponse* response) {
    const HTTPMessage& message = *response->getHTTPMessage();
    if (!isRedirect(message.getStatus()) || !message.hasHeader("Location")) return false;
    if (++mRedirects > ConnectionLimits::kMaxRedirects) {
        Foundation::gWarn.log("<%s>: more than %d redirects", mRequest->message().getPlace(),
                              ConnectionLimits::kMaxRedirects);
        fail(NetError(NetError::kPFURL, OVURLErrorTooManyRedirects));
        return true;
    }
    const Ref<URL> target = redirectTarget(message);
    if (!target || !target->hasScheme()) {
        fail(NetError(NetError::kPFURL, OVURLErrorBadRedirect));
        return true;
    }
    if (!isHTTP(*target)) {
        Foundation::gWarn.log("<%s>: redirects to <%@>", mRequest->message().getPlace(), target);
        fail(NetError(NetError::kPFURL, OVURLErrorUnsupportedURL));
        return true;
    }
    const Ref<ConnectionRequest> offered = redirected(target, message.getStatus());
    const Ref<ConnectionRequest> next = mClient->willSendRequest(offered, response);
    if (!mClient) return true;
    if (!next) return false;
    mSteppedDown |= mRequest->getURL()->isScheme("https") && next->getURL()->isScheme("http");
    leadOn(next);
    return true;
}

/// Goes on to another request once the body of this response is out of the way.
void Connection::leadOn(ConnectionRequest* next) {
    mNext = next->copy();
    mSkippedBytes = 0;
    mPhase = Phase::Skipping;
}

void Connection::sendNext() {
    if (!std::exchange(mKeepsExchange, false)) mExchange.reset();
    mRequest = std::move(mNext);
    send();
}

}  // namespace Orvane
