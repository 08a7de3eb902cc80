#pragma once

#include "Foundation/NetError.h"

#include <functional>

namespace Foundation {
class String;
class URL;
}  // namespace Foundation

namespace Orvane {

/// Where the user's passwords are kept. Set once per process; null until then.
class CredentialStore {
 public:
    /// Gets a password, or null.
    using PasswordHandler = std::function<void(Foundation::String* password)>;

    virtual ~CredentialStore() = default;

    /// Keeps the password, which may be null for none any more, that a user has where the URL
    /// leads. What went wrong.
    virtual Foundation::NetError saveInternetPassword(Foundation::URL* url,
                                                      Foundation::String* user,
                                                      Foundation::String* password) = 0;

    /// Looks for the password that a user has where the URL leads. `found` is called once, at once
    /// or in a later turn of the run loop, with null if none is known. A store that keeps passwords
    /// for others alone knows none.
    virtual void findInternetPassword(Foundation::URL* url, Foundation::String* user,
                                      PasswordHandler found);

    static CredentialStore* current();
    /// The port must outlive its use.
    static void setCurrent(CredentialStore* port);
};

}  // namespace Orvane
