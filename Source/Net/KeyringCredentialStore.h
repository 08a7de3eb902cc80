#pragma once

#include "Model/CredentialStore.h"

namespace Orvane {

/// The user's keyring: the Secret Service of the desktop by libsecret, or the file that libsecret
/// keeps where the environment says so (`SECRET_BACKEND`). A password is kept for the user's name
/// and the scheme, host and port of the URL.
///
/// Nothing here waits: what the keyring says comes in later turns of the run loop. Where there is
/// none, or it is locked, no password is found and none kept; whoever has one in memory goes on
/// with that.
class KeyringCredentialStore : public CredentialStore {
 public:
    /// How long a password is waited for.
    static constexpr double kLookUpSeconds = 2.0;

    /// Begins to keep the password; a locked keyring asks the user. An error for a URL without a
    /// host; what fails later is warned of.
    Foundation::NetError saveInternetPassword(Foundation::URL* url, Foundation::String* user,
                                              Foundation::String* password) override;
    /// Asks the user nothing: of a keyring that is locked it finds none.
    void findInternetPassword(Foundation::URL* url, Foundation::String* user,
                              PasswordHandler found) override;
};

}  // namespace Orvane
