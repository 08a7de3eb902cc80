#pragma once

#include "Foundation/NetError.h"

namespace Foundation {
class String;
class URL;
}  // namespace Foundation

namespace Orvane {

/// Where the user's passwords are kept. Set once per process; null until then.
class CredentialStore {
 public:
    virtual ~CredentialStore() = default;

    /// Keeps the password, which may be null for none any more, that a user has where the URL
    /// leads. What went wrong.
    virtual Foundation::NetError saveInternetPassword(Foundation::URL* url,
                                                      Foundation::String* user,
                                                      Foundation::String* password) = 0;

    static CredentialStore* current();
    /// The port must outlive its use.
    static void setCurrent(CredentialStore* port);
};

}  // namespace Orvane
