#pragma once

#include "Foundation/NetError.h"
#include "Foundation/Ref.h"
#include "Net/ConnectionError.h"
#include "Net/Credential.h"
#include "Net/HTTPMessage.h"
#include "Net/ProtectionSpace.h"

#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace Orvane {

/// One request to one server.
struct ExchangeRequest {
    Foundation::Ref<HTTPMessage> message;
    /// Asks for a body that is coded: what a `BodyDecoder` can undo.
    bool acceptsCodings = true;
    /// Null for none. Sent by `method`, to this server alone.
    Foundation::Ref<Credential> credential;
    AuthenticationMethod method = AuthenticationMethod::Basic;
    /// Whether cookies are sent and taken; those that may be sent, as lines of a cookie file.
    bool handlesCookies = false;
    std::vector<std::string> cookies;
};

/// How a response begins. With cookies, `cookies` is what `ExchangeRequest::cookies` has become.
struct ExchangeHead {
    int status = 0;
    std::vector<HTTPHeader> headers;
    std::vector<std::string> cookies;
};

/// Why an exchange ended: whole, or by a rule of ours, or by the library's failure.
struct ExchangeEnd {
    Foundation::NetError error = {};
    Foundation::Ref<ConnectionError> failure = {};

    bool isWhole() const { return error.code == 0 && !failure.get(); }
};

/// Who hears of an exchange. Called from a turn of the run loop, never from inside `start`. Each
/// call may destroy the exchange.
class ExchangeClient {
 public:
    virtual ~ExchangeClient() = default;

    /// Some bytes have come, or gone, in whatever direction.
    virtual void moved() = 0;
    /// Once, before any body.
    virtual void gotHead(ExchangeHead head) = 0;
    /// As it was sent: with its codings, but without those of the transfer.
    virtual void gotBody(std::string_view block) = 0;
    /// Once, and then nothing more.
    virtual void ended(const ExchangeEnd& end) = 0;
};

/// A running exchange; its end cancels it.
class Exchange : Foundation::Uncopyable {
 public:
    virtual ~Exchange() = default;
};

/// What brings one request to a server and its answer back. Follows no redirect, and keeps no time.
class Transport : Foundation::Uncopyable {
 public:
    virtual ~Transport() = default;

    /// `previous` may be null, or the ended exchange that told that a login is needed: what it
    /// learned is used. The client outlives the exchange.
    virtual std::unique_ptr<Exchange> start(const ExchangeRequest& request, ExchangeClient& client,
                                            std::unique_ptr<Exchange> previous) = 0;
};

}  // namespace Orvane
