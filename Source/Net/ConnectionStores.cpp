// Answers that a connection has without asking.

#include "Net/Connection.h"

#include "Foundation/Clock.h"
#include "Foundation/Logger.h"
#include "Model/CredentialStore.h"
#include "Net/BodyReader.h"
#include "Net/ConnectionService.h"

#include <cmath>

namespace Orvane {

using Foundation::Ref;

/// Whether the cache has answered.
bool Connection::answerFromCache() {
    const Ref<CachedResponse> cached = mService.responseCache().find(mRequest);
    if (!cached) return false;
    const Ref<ConnectionResponse> response = cached->getResponse();
    const Ref<Foundation::Data> data = cached->getData();
    deliverWhole(response, data);
    return true;
}

/// Whether the host has asked to be left alone. Then the answer is the one that it gave with that,
/// so that who asks waits for his next time as he would have done.
bool Connection::answerForHost() {
    const auto refusal = mService.retryTimes().find(*mRequest->getURL());
    if (!refusal) return false;
    const double now = Foundation::Clock::current().now();
    const double seconds = std::ceil(refusal->until - now);
    gLogHTTP.log("<%s>: not asked for another %.0f seconds", mRequest->message().getPlace(),
                 seconds);
    const Ref<HTTPMessage> message =
        HTTPMessage::response(refusal->status, {{"Retry-After", OVFormat("%.0f", seconds)}});
    const Ref<ConnectionResponse> response =
        ConnectionResponse::response(&mRequest->message(), message, now);
    deliverWhole(response, nullptr);
    return true;
}

/// `data` may be null for no body.
void Connection::deliverWhole(ConnectionResponse* response, Foundation::Data* data) {
    mExchange.reset();
    mTicket.reset();
    mPhase = Phase::Body;
    mClient->didReceiveResponse(response);
    if (mClient && data && data->getLength() > 0) {
        mClient->didReceiveData(data, static_cast<long>(data->getLength()));
    }
    if (mClient) close()->didFinishLoading();
}

/// Stores the login that has been accepted, if it is to be kept.
void Connection::keepLogin(const ConnectionResponse& response) {
    constexpr int kFirstError = 400;
    if (!mSentLogin || !mLogin->credential->isPersistent() ||
        response.getHTTPMessage()->getStatus() >= kFirstError) {
        return;
    }
    CredentialStore* store = CredentialStore::current();
    if (!store) return;
    const Foundation::NetError error = store->saveInternetPassword(
        mRequest->getURL(), mLogin->credential->getUser(), mLogin->credential->getPassword());
    if (error.code != 0) Foundation::gWarn.log("Can't keep a login: %@", error);
}

}  // namespace Orvane
