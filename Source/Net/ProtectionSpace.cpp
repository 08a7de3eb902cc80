#include "Net/ProtectionSpace.h"

#include "Foundation/FormatObjects.h"
#include "Net/HTTPMessage.h"
#include "Net/WWWAuthenticate.h"

#include <utility>

namespace Orvane {

using Foundation::Returner;
using Foundation::String;
using Foundation::URL;

namespace {

std::string lowered(const String* text) {
    std::string result(String::view(text));
    for (char& c : result) {
        if (c >= 'A' && c <= 'Z') c = static_cast<char>(c - 'A' + 'a');
    }
    return result;
}

const char* nameOf(AuthenticationMethod method) {
    return method == AuthenticationMethod::Digest ? "Digest" : "Basic";
}

}  // namespace

Origin Origin::of(const URL& url) {
    const Foundation::Ref<String> scheme = url.getScheme();
    const Foundation::Ref<String> host = url.getHost();
    Origin origin{lowered(scheme), lowered(host), url.getPort()};
    if (origin.port == -1) origin.port = origin.scheme == "https" ? 443 : 80;
    return origin;
}

ProtectionSpace::ProtectionSpace(Origin origin, std::string realm, AuthenticationMethod method)
    : mOrigin(std::move(origin)), mRealm(String::stringOfUTF8(std::move(realm))), mMethod(method) {}

Returner<ProtectionSpace> ProtectionSpace::fromResponse(const URL& url,
                                                        const HTTPMessage& response) {
    if (response.getStatus() != 401) return {};
    const WWWAuthenticate asked(response.getHeader("WWW-Authenticate"));
    for (const AuthenticationMethod method :
         {AuthenticationMethod::Digest, AuthenticationMethod::Basic}) {
        const WWWAuthenticate::Challenge* challenge = asked.find(nameOf(method));
        if (!challenge) continue;
        return Returner<ProtectionSpace>(
            new ProtectionSpace(Origin::of(url), challenge->getParameter("realm"), method));
    }
    return {};
}

Foundation::StringReturner ProtectionSpace::toString() const {
    return String::stringWithFormat("%s realm '%@' of %s://%s:%d", nameOf(mMethod), mRealm,
                                    mOrigin.scheme, mOrigin.host, mOrigin.port);
}

}  // namespace Orvane
