#include "Net/URLRequest.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Guard.h"
#include "Foundation/RunOnceTimer.h"
#include "Net/Connection.h"
#include "Net/MemoryReturn.h"
#include "Net/RequestQueue.h"
#include "Net/URLDownload.h"

#include <Orvane/OVErrorCode.h>

#include <algorithm>
#include <utility>

namespace Orvane {

using Foundation::callGuarded;
using Foundation::NetError;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;
using Foundation::URL;

namespace {

/// There was an error, and nobody knows which.
constexpr NetError kUnknownError(NetError::kCustom, -1);

/// What a server says of the length of a body is believed that far.
constexpr long long kMaxReservedBytes = 1 << 20;

/// The length that a body is said to have; 0 for none.
std::size_t claimedLength(const ConnectionResponse* response) {
    const HTTPMessage* message = response ? response->getHTTPMessage() : nullptr;
    if (!message) return 0;
    const Ref<String> name = String::string("Content-Length");
    const Ref<String> length = message->getHeader(name.get());
    return static_cast<std::size_t>(std::clamp(String::toLongLong(length), 0LL, kMaxReservedBytes));
}

bool isUnknown(const NetError& error) {
    return error.domain == kUnknownError.domain && error.code == kUnknownError.code;
}

}  // namespace

/// The barrier between the connection and the request: nothing that is thrown gets through.
class URLRequest::Client : public ConnectionClient {
 public:
    explicit Client(URLRequest* request) : mOwner(request) {}

    Returner<ConnectionRequest> willSendRequest(ConnectionRequest* request,
                                                ConnectionResponse* response) noexcept override {
        Ref<ConnectionRequest> result(request);
        guarded(__PRETTY_FUNCTION__, [&] { result = mOwner->_willSendRequest(request, response); });
        return result;
    }
    void didReceiveResponse(ConnectionResponse* response) noexcept override {
        guarded(__PRETTY_FUNCTION__, [&] { mOwner->_didReceiveResponse(response); });
    }
    void didReceiveData(Foundation::Data* data, long length) noexcept override {
        guarded(__PRETTY_FUNCTION__, [&] { mOwner->_didReceiveData(data, length); });
    }
    void didFinishLoading() noexcept override {
        guarded(__PRETTY_FUNCTION__, [&] { mOwner->_didFinishLoading(); });
    }
    void didFail(NetError error) noexcept override {
        guarded(__PRETTY_FUNCTION__, [&] { mOwner->_didFail(error); });
    }
    void didFail(ConnectionError* error) noexcept override {
        guarded(__PRETTY_FUNCTION__, [&] { mOwner->_didFail(error); });
    }
    void didReceiveAuthenticationChallenge(AuthenticationChallenge* challenge) noexcept override {
        guarded(__PRETTY_FUNCTION__,
                [&] { mOwner->_didReceiveAuthenticationChallenge(challenge); });
    }

 private:
    /// Keeps the request, and with it this, until the call is over.
    template <class Body>
    void guarded(const char* where, Body body) noexcept {
        callGuarded(where, [&] {
            const Ref<URLRequest> owner(mOwner);
            body();
        });
    }

    URLRequest* const mOwner;
};

URLRequest::URLRequest(URL* url) : mURL(url), mClient(std::make_unique<Client>(this)) {
    OV_ASSERT(url);
}

URLRequest::~URLRequest() {
    if (mResponseData) MemoryReturn::soon(mResponseData->getLength());
    if (!mConnection) return;
    Foundation::gWarn.log("%@ dealloced while connection still open!",
                          static_cast<Foundation::RefCounted*>(this));
    mConnection->cancel();
}

void URLRequest::start(bool priority) {
    if (priority) {
        gLogHTTP.log("%@: Starting as priority.", this);
        startRequest();
        return;
    }
    gLogHTTP.log("%@: Queuing...", this);
    RequestQueue::networkQueue().addRequest(this);
}

void URLRequest::startRequest() {
    try {
        _open(true);
    } catch (...) {
        Foundation::warnAboutCurrentException(__PRETTY_FUNCTION__);
        close();
        mCouldNotStart = true;
        Foundation::callAfterDelay<URLRequest>(0.0, this, &URLRequest::couldNotStart);
    }
}

/// Whoever waits for it hears of that as of any failure, and so not before `start` has returned.
void URLRequest::couldNotStart() {
    if (std::exchange(mCouldNotStart, false)) {
        _didFail(NetError(NetError::kOrvane, OVInternalError));
    }
}

void URLRequest::_open(bool schedule) {
    gLogHTTP.log("%@: Open", this);
    ConnectionRequest* request = _getRequest();
    request->setIsDocument(mAccumulatesData);
    mConnection = Connection::connection(request, mClient.get());
    OV_ASSERT(mConnection);
    if (schedule) mConnection->schedule();
    mConnection->start();
    if (mAccumulatesData) mResponseData = Foundation::Data::mutableData();
    mOpened.invoke(this);
}

void URLRequest::stop() {
    gLogHTTP.log("%@: Stop", this);
    close();
    RequestQueue::networkQueue().removeRequest(this);
}

void URLRequest::close() {
    mCouldNotStart = false;
    if (!mConnection) return;
    mChallenge = nullptr;
    const Ref<Connection> connection = std::move(mConnection);
    connection->cancel();
}

Returner<URLDownload> URLRequest::startDownloadToFile(URL* destination) {
    OV_ASSERT(mResponse);
    OV_ASSERT(!mResponseData);
    const Ref<Connection> connection = std::move(mConnection);
    Ref<URLDownload> download = Returner<URLDownload>::adopted(
        new URLDownload(connection, mRequest, mResponse, destination));
    RequestQueue::networkQueue().removeRequest(this);
    return download;
}

ConnectionRequest* URLRequest::_getRequest() {
    if (!mRequest) {
        mRequest = ConnectionRequest::request(mURL, CachePolicy::UseProtocol, kDefaultTimeout);
    }
    return mRequest;
}

void URLRequest::setCachePolicy(CachePolicy policy) {
    _getRequest()->setCachePolicy(policy);
}

Returner<ConnectionRequest> URLRequest::_willSendRequest(ConnectionRequest* request,
                                                         ConnectionResponse*) {
    return Returner<ConnectionRequest>::retained(request);
}

void URLRequest::_didReceiveResponse(ConnectionResponse* response) {
    gLogHTTP.log("%@: DidReceiveResponse", this);
    mResponse = response;
    mGotResponse.invoke(this);
}

void URLRequest::_didReceiveData(Foundation::Data* data, long) {
    gLogHTTP.log("%@: Received %u bytes of data", this, static_cast<unsigned>(data->getLength()));
    if (mResponseData) {
        // A block that grows as it comes is copied again and again.
        if (mResponseData->getLength() == 0) mResponseData->reserve(claimedLength(mResponse));
        mResponseData->append(data);
    } else {
        mResponseData = Foundation::Data::mutableData(data->asBytes());
    }
    mGotData.invoke(this);
    if (!mAccumulatesData) mResponseData = nullptr;
}

void URLRequest::_didFinishLoading() {
    gLogHTTP.log("%@: DidFinishLoading", this);
    stop();
    mFinished.invoke(this);
}

void URLRequest::_didFail(NetError error) {
    if (isUnknown(error)) error = NetError(NetError::kPFURL, OVURLErrorDNSLookupFailed);
    gLogHTTP.log("%@: DidFail (%d.%d) %@", this, static_cast<int>(error.domain), error.code, error);
    mError = error;
    failed();
}

void URLRequest::_didFail(ConnectionError* error) {
    gLogHTTP.log("%@: DidFail (domain=%@, code=%i): %@", this, error->getDomain(), error->getCode(),
                 error);
    mError = error->toLoadingError();
    failed();
}

void URLRequest::failed() {
    // Half of a body is none.
    if (mResponseData) MemoryReturn::soon(mResponseData->getLength());
    mResponseData = nullptr;
    stop();
    mFailed.invoke(this);
}

}  // namespace Orvane
