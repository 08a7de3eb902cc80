#pragma once

#include "Foundation/Ref.h"
#include "Foundation/String.h"
#include "Foundation/URL.h"

#include <optional>
#include <string>
#include <vector>

namespace Orvane {

class HTTPMessage;

/// The scheme, host and port of a URL: who a server is. Scheme and host in lower case; the port is
/// the scheme's own where the URL has none.
struct Origin {
    std::string scheme;
    std::string host;
    int port = -1;

    static Origin of(const Foundation::URL& url);
    bool operator==(const Origin&) const = default;
};

/// How a user proves who he is, RFC 7617 and RFC 7616.
enum class AuthenticationMethod { Basic, Digest };

/// The part of a server that asks for a login: its origin, the name it gives that part, and how it
/// wants to be answered.
class ProtectionSpace : public Foundation::PFRefCounted {
 public:
    /// What a response with status 401 asks for; the strongest of the methods that are known here.
    /// Null if it asks for none of them.
    static Foundation::Returner<ProtectionSpace> fromResponse(const Foundation::URL& url,
                                                              const HTTPMessage& response);

    const Origin& getOrigin() const { return mOrigin; }
    const std::string& getHost() const { return mOrigin.host; }
    int getPort() const { return mOrigin.port; }
    /// Empty if the server names none.
    Foundation::String* getRealm() const { return mRealm; }
    AuthenticationMethod getMethod() const { return mMethod; }
    /// "Digest realm 'Feeds' of https://host:443".
    Foundation::StringReturner toString() const override;

 private:
    ProtectionSpace(Origin origin, std::string realm, AuthenticationMethod method);

    Origin mOrigin;
    Foundation::Ref<Foundation::String> mRealm;
    AuthenticationMethod mMethod;
};

}  // namespace Orvane
