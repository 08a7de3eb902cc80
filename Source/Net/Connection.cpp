#include "Net/Connection.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Clock.h"
#include "Foundation/Logger.h"
#include "Net/BodyReader.h"
#include "Net/ConnectionLimits.h"
#include "Net/ConnectionService.h"

#include <utility>

namespace Orvane {

using Foundation::NetError;
using Foundation::Ref;
using Foundation::Returner;

Connection::Connection(const ConnectionRequest* request, ConnectionClient* client)
    : mService(ConnectionService::shared()),
      mClient(client),
      mRequest(request->copy()),
      mFirstURL(request->getURL()),
      mBeginTimer(this, &Connection::begin),
      mStallTimer(this, &Connection::timedOut),
      mTotalTimer(this, &Connection::tookTooLong) {}

Returner<Connection> Connection::connection(const ConnectionRequest* request,
                                            ConnectionClient* client) {
    OV_ASSERT(request);
    OV_ASSERT(client);
    return Returner<Connection>::adopted(new Connection(request, client));
}

Connection::~Connection() {
    close();
}

void Connection::schedule() {
    mIsScheduled = true;
    beginIfReady();
}

void Connection::start() {
    mIsStarted = true;
    beginIfReady();
}

void Connection::beginIfReady() {
    if (mIsScheduled && mIsStarted && mPhase == Phase::New) mBeginTimer.start(0.0, false);
}

void Connection::begin() {
    const Ref<Connection> self(this);
    if (mPhase == Phase::Declined) return deliverHeld();
    if (mPhase == Phase::Skipping) return sendNext();
    const Ref<ConnectionRequest> request = mClient->willSendRequest(mRequest, nullptr);
    if (!mClient) return;
    if (!request) return fail(NetError(NetError::kPFURL, OVURLErrorCancelled));
    mRequest = request->copy();
    send();
}

/// Asks the server that the request names.
void Connection::send() {
    mPhase = Phase::Asking;
    const Foundation::URL& url = *mRequest->getURL();
    if (!url.isScheme("http") && !url.isScheme("https")) {
        return fail(NetError(NetError::kPFURL, OVURLErrorUnsupportedURL));
    }
    if (answerFromCache() || answerForHost()) return;
    takeTicket();
}

/// Waits for the host to have room. That no byte comes meanwhile counts for nothing; but whoever
/// wants a document has waited for it.
void Connection::takeTicket() {
    mStallTimer.stop();
    startTotalTimer();
    mTicket.reset();
    mTicket = mService.hostSlots().take(Origin::of(*mRequest->getURL()).host,
                                        [this] { startExchange(); });
    if (mTicket->mayRun()) startExchange();
}

void Connection::startExchange() {
    ExchangeRequest request;
    request.message = Ref<HTTPMessage>(&mRequest->message());
    request.acceptsCodings = mRequest->isDocument();
    request.handlesCookies = mRequest->handlesCookies() &&
                             mRequest->getCookieAcceptPolicy() != CookieAcceptPolicy::Never;
    if (request.handlesCookies) request.cookies = mService.cookies().findFor(*mRequest->getURL());
    mSentCookies = request.cookies;
    mSentLogin = mayUseLogin();
    if (mSentLogin) {
        request.credential = mLogin->credential;
        request.method = mLogin->method;
    }
    restartTimers();
    mExchange = mService.transport().start(request, *this, std::move(mExchange));
}

bool Connection::mayUseLogin() const {
    return mLogin && !mSteppedDown && mLogin->origin == Origin::of(*mRequest->getURL());
}

void Connection::restartTimers() {
    mIsLastChance = false;
    mStallTimer.start(mRequest->getTimeout(), false);
    startTotalTimer();
}

void Connection::startTotalTimer() {
    if (!mRequest->isDocument() || mTotalTimer.isRunning()) return;
    mTotalTimer.start(ConnectionLimits::kMaxDocumentSeconds, false);
}

void Connection::moved() {
    mIsLastChance = false;
    if (mStallTimer.isRunning()) mStallTimer.start(mRequest->getTimeout(), false);
}

void Connection::gotHead(ExchangeHead head) {
    const Ref<Connection> self(this);
    moved();
    takeCookies(head);
    const Ref<HTTPMessage> message = HTTPMessage::response(head.status, std::move(head.headers));
    const Ref<ConnectionResponse> response = ConnectionResponse::response(
        &mRequest->message(), message, Foundation::Clock::current().now(), mSentLogin);
    mService.retryTimes().note(*mRequest->getURL(), *message);
    if (followRedirect(response) || askForLogin(response)) return;
    if (mClient) deliver(response);
}

void Connection::gotBody(std::string_view block) {
    const Ref<Connection> self(this);
    moved();
    switch (mPhase) {
        case Phase::Skipping:
            mSkippedBytes += block.size();
            if (mSkippedBytes > ConnectionLimits::kMaxIgnoredBytes) {
                mExchange.reset();
                sendNext();
            }
            break;
        case Phase::Challenged:
        case Phase::Declined:
            hold(block);
            break;
        case Phase::Body:
            deliverBlock(block);
            break;
        case Phase::New:
        case Phase::Asking:
            break;
    }
}

void Connection::ended(const ExchangeEnd& end) {
    const Ref<Connection> self(this);
    switch (mPhase) {
        case Phase::Skipping:
            // Its head was whole, which is all that was wanted of it.
            if (!end.isWhole()) mExchange.reset();
            return sendNext();
        case Phase::Challenged:
        case Phase::Declined:
            mHeldEnd = end;
            return;
        case Phase::New:
        case Phase::Asking:
        case Phase::Body:
            break;
    }
    if (end.failure) return fail(end.failure.get());
    if (end.error.code != 0) return fail(end.error);
    if (mPhase != Phase::Body) return fail(NetError(NetError::kPFURL, OVURLErrorBadServerResponse));
    finishBody();
}

void Connection::takeCookies(const ExchangeHead& head) {
    const bool isHandled =
        mRequest->handlesCookies() &&
        CookieStore::accepts(mRequest->getCookieAcceptPolicy(),
                             Origin::of(*mRequest->getURL()).host, Origin::of(*mFirstURL).host);
    if (isHandled) mService.cookies().update(mSentCookies, head.cookies);
}

void Connection::deliver(ConnectionResponse* response) {
    mPhase = Phase::Body;
    keepLogin(*response);
    mReader = std::make_unique<BodyReader>(mRequest->message().getPlace(),
                                           *response->getHTTPMessage(), mRequest->isDocument());
    if (const NetError error = mReader->open(); error.code != 0) return fail(error);
    mClient->didReceiveResponse(response);
}

void Connection::deliverBlock(std::string_view block) {
    const NetError error = mReader->take(block, [this](std::string_view decoded) {
        const Ref<Foundation::Data> data =
            Foundation::Data::data(decoded.data(), decoded.size(), /*copy=*/false);
        mClient->didReceiveData(data, static_cast<long>(decoded.size()));
        return mClient != nullptr;
    });
    if (error.code != 0) fail(error);
}

void Connection::finishBody() {
    if (const NetError error = mReader->finish(); error.code != 0) return fail(error);
    close()->didFinishLoading();
}

/// A loop that was busy, or a machine that slept, finds this timer due before it has read what came
/// in the meantime: the first time only lets it read.
void Connection::timedOut() {
    const Ref<Connection> self(this);
    if (!std::exchange(mIsLastChance, true)) return mStallTimer.start(0.0, false);
    if (mPhase == Phase::Skipping) {
        mExchange.reset();
        return sendNext();
    }
    Foundation::gWarn.log("<%s>: no byte in %.0f seconds", mRequest->message().getPlace(),
                          mRequest->getTimeout());
    fail(NetError(NetError::kPFURL, OVURLErrorTimedOut));
}

void Connection::tookTooLong() {
    const Ref<Connection> self(this);
    Foundation::gWarn.log("<%s>: not complete in %.0f seconds", mRequest->message().getPlace(),
                          ConnectionLimits::kMaxDocumentSeconds);
    fail(NetError(NetError::kPFURL, OVURLErrorTimedOut));
}

ConnectionClient* Connection::close() {
    mBeginTimer.stop();
    mStallTimer.stop();
    mTotalTimer.stop();
    mExchange.reset();
    mTicket.reset();
    mPhase = Phase::New;
    mIsStarted = false;
    return std::exchange(mClient, nullptr);
}

void Connection::cancel() {
    close();
}

void Connection::fail(NetError error) {
    if (ConnectionClient* client = close()) client->didFail(error);
}

void Connection::fail(ConnectionError* error) {
    if (ConnectionClient* client = close()) client->didFail(error);
}

}  // namespace Orvane
