#pragma once

#include "Net/Credential.h"
#include "Net/ProtectionSpace.h"

namespace Orvane {

/// A server's demand for a login, which the one who made the request answers through
/// `Connection::useCredential`.
class AuthenticationChallenge : public Foundation::PFRefCounted {
 public:
    /// `proposedUser` may be null. `isSafe` is whether the request got here without a step from an
    /// encrypted connection to an open one.
    static Foundation::Returner<AuthenticationChallenge> challenge(ProtectionSpace* space,
                                                                   Foundation::String* proposedUser,
                                                                   int previousFailures,
                                                                   bool isSafe) {
        return Foundation::Returner<AuthenticationChallenge>(
            new AuthenticationChallenge(space, proposedUser, previousFailures, isSafe));
    }

    ProtectionSpace* getProtectionSpace() const { return mSpace; }
    /// The user named in the URL, or null.
    Foundation::String* getProposedUser() const { return mProposedUser; }
    /// How many answers the server has refused in this request.
    int getPreviousFailureCount() const { return mPreviousFailures; }
    /// False where no login may be sent any more.
    bool isSafe() const { return mIsSafe; }
    /// The protection space.
    Foundation::StringReturner toString() const override { return mSpace->toString(); }

 private:
    AuthenticationChallenge(ProtectionSpace* space, Foundation::String* proposedUser,
                            int previousFailures, bool isSafe)
        : mSpace(space),
          mProposedUser(proposedUser),
          mPreviousFailures(previousFailures),
          mIsSafe(isSafe) {}

    Foundation::Ref<ProtectionSpace> mSpace;
    Foundation::Ref<Foundation::String> mProposedUser;
    int mPreviousFailures;
    bool mIsSafe;
};

}  // namespace Orvane
