// How a connection gets past a demand for a login.

#include "Net/Connection.h"

#include "Foundation/AssertionFailure.h"
#include "Net/ConnectionLimits.h"

#include <utility>

namespace Orvane {

using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;

/// The login that stands in the URL itself; null if there is none.
Returner<Credential> Connection::credentialOfURL() const {
    const Ref<String> user = mRequest->getURL()->getUser();
    const Ref<String> password = mRequest->getURL()->getPassword();
    if (!user || !password) return {};
    return Credential::credential(user, password, Credential::kForSession);
}

/// Whether the response is not the client's business, or not yet: it asks for a login that may be
/// had.
bool Connection::askForLogin(ConnectionResponse* response) {
    if (!mClient) return true;
    const Ref<ProtectionSpace> space =
        ProtectionSpace::fromResponse(*mRequest->getURL(), *response->getHTTPMessage());
    if (!space) return false;
    if (mSentLogin && mLogin->isFromClient) ++mRefusedLogins;
    const Ref<Credential> ofURL = credentialOfURL();
    if (ofURL && !mSteppedDown && !std::exchange(mTriedLoginOfURL, true)) {
        repeatWith(ofURL, *space, /*isFromClient=*/false);
        return true;
    }
    const Ref<String> user = mRequest->getURL()->getUser();
    const Ref<AuthenticationChallenge> challenge =
        AuthenticationChallenge::challenge(space, user, mRefusedLogins, !mSteppedDown);
    mChallenge = challenge;
    mResponse = Ref<ConnectionResponse>(response);
    mPhase = Phase::Challenged;
    mHeldBody.clear();
    mHeldEnd.reset();
    // Nobody is late but a person who may have to be asked.
    mStallTimer.stop();
    mTotalTimer.stop();
    mClient->didReceiveAuthenticationChallenge(challenge);
    if (mPhase != Phase::Declined) return true;
    mBeginTimer.stop();
    return false;
}

void Connection::useCredential(Credential* credential) {
    OV_ASSERT(mChallenge && mPhase == Phase::Challenged);
    const Ref<AuthenticationChallenge> challenge = std::move(mChallenge);
    restartTimers();
    if (credential && challenge->isSafe()) {
        repeatWith(credential, *challenge->getProtectionSpace(), /*isFromClient=*/true);
        // From a turn of the loop, as everything that the client may hear of.
        if (mHeldEnd) mBeginTimer.start(0.0, false);
        return;
    }
    mPhase = Phase::Declined;
    mBeginTimer.start(0.0, false);
}

void Connection::repeatWith(Credential* credential, const ProtectionSpace& space,
                            bool isFromClient) {
    mLogin = Login{credential, space.getOrigin(), space.getMethod(), isFromClient};
    const Ref<ConnectionRequest> again = mRequest;
    leadOn(again);
    mKeepsExchange = true;
}

void Connection::hold(std::string_view block) {
    if (mHeldBody.size() + block.size() <= ConnectionLimits::kMaxIgnoredBytes) {
        mHeldBody += block;
        return;
    }
    mExchange.reset();
    mHeldEnd = ExchangeEnd{};
}

/// The response that asked for a login that nobody has, once the client has said so in its own
/// time.
void Connection::deliverHeld() {
    const Ref<ConnectionResponse> response = mResponse;
    deliver(response);
    if (mClient && !mHeldBody.empty()) deliverBlock(std::exchange(mHeldBody, {}));
    if (mClient && mHeldEnd) ended(*mHeldEnd);
}

}  // namespace Orvane
