// How a request answers demands for a login.

#include "Net/URLRequest.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Logger.h"
#include "Net/Connection.h"

namespace Orvane {

using Foundation::Ref;
using Foundation::String;

void URLRequest::setStoredCredential(String* user, String* password, Foundation::URL* storedFor) {
    mUsername = user;
    mPassword = password;
    mStoredFor = storedFor;
}

void URLRequest::_didReceiveAuthenticationChallenge(AuthenticationChallenge* challenge) {
    gLogHTTP.log("%@: DidReceiveAuthenticationChallenge: %@ (proposed username='%@') ...", this,
                 challenge, challenge->getProposedUser());
    mChallenge = challenge;
    mProtectionSpace = challenge->getProtectionSpace();
    if (authenticate(challenge, challenge->getPreviousFailureCount())) return;
    if (mChallenge) _useAuthenticationCredential(nullptr);
}

bool URLRequest::authenticate(AuthenticationChallenge* challenge, int previousFailures) {
    if (previousFailures != 0 || !mUsername || !mPassword) return false;
    if (!isOfferedTo(*challenge)) return false;
    gLogHTTP.log("%@: Auth: Using stored username/password '%@'", this, mUsername);
    useAuthenticationCredential(mUsername, mPassword, false);
    return true;
}

/// A redirect must not lead a login to somebody else.
bool URLRequest::isOfferedTo(const AuthenticationChallenge& challenge) const {
    const Foundation::URL& storedFor = mStoredFor ? *mStoredFor : *mURL;
    return challenge.isSafe() &&
           challenge.getProtectionSpace()->getOrigin() == Origin::of(storedFor);
}

void URLRequest::useAuthenticationCredential(String* user, String* password, bool persistent) {
    const int persistence = Credential::kForSession | (persistent ? Credential::kPersistentBit : 0);
    const Ref<Credential> credential = Credential::credential(user, password, persistence);
    _useAuthenticationCredential(credential);
}

void URLRequest::_useAuthenticationCredential(Credential* credential) {
    OV_ASSERT(mConnection);
    OV_ASSERT(mChallenge);
    if (credential) {
        mUsername = credential->getUser();
        gLogHTTP.log("%@: useAuthenticationCredential: user=%@, persistent=%i", this, mUsername,
                     credential->getPersistence());
    } else {
        gLogHTTP.log("%@: Canceling auth challenge", this);
    }
    mConnection->useCredential(credential);
    mChallenge = nullptr;
}

}  // namespace Orvane
