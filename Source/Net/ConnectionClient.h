#pragma once

#include "Foundation/Data.h"
#include "Foundation/NetError.h"

namespace Orvane {

class AuthenticationChallenge;
class ConnectionError;
class ConnectionRequest;
class ConnectionResponse;

/// Who hears of a `Connection`. Each call comes from a turn of the run loop, never from inside an
/// operation of the connection. It may cancel the connection. It must not throw.
class ConnectionClient {
 public:
    virtual ~ConnectionClient() = default;

    /// What is about to be sent: the request itself, with no response, or the one that a redirect
    /// led to, with the response that did. What is handed back is sent; null stops at the response,
    /// which then comes as any other.
    virtual Foundation::Returner<ConnectionRequest> willSendRequest(
        ConnectionRequest* request, ConnectionResponse* response) noexcept = 0;
    virtual void didReceiveResponse(ConnectionResponse* response) noexcept = 0;
    /// A block of the body, decoded. `data` is good for the call: it is a view.
    virtual void didReceiveData(Foundation::Data* data, long length) noexcept = 0;
    virtual void didFinishLoading() noexcept = 0;
    /// The connection has failed by a rule of ours.
    virtual void didFail(Foundation::NetError error) noexcept = 0;
    /// The library below has failed.
    virtual void didFail(ConnectionError* error) noexcept = 0;
    /// The server wants a login. Where `Connection::useCredential` was not called by the end of the
    /// call, the connection waits for it.
    virtual void didReceiveAuthenticationChallenge(AuthenticationChallenge* challenge) noexcept = 0;
};

}  // namespace Orvane
