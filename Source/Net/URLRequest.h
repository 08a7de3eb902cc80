#pragma once

#include "Foundation/Action.h"
#include "Foundation/MutableData.h"
#include "Foundation/NetError.h"
#include "Foundation/Ref.h"
#include "Foundation/URL.h"
#include "Net/AuthenticationChallenge.h"
#include "Net/ConnectionError.h"
#include "Net/ConnectionRequest.h"
#include "Net/ConnectionResponse.h"
#include "Net/Request.h"

#include <memory>

namespace Orvane {

class Connection;
class URLDownload;

/// Fetches a URL, and tells by its actions how that goes. On the thread of the run loop.
///
/// After `mFinished` or `mFailed`, of which one comes, the request has left the queue. The one who
/// made it holds it until then, or calls `stop`. A status that stands for a failure is a response
/// like any other.
class URLRequest : public Request {
 public:
    static constexpr double kDefaultTimeout = 120.0;

    ActionOf<URLRequest> mOpened;       ///< it has begun
    ActionOf<URLRequest> mGotData;      ///< a block of the body: see `setAccumulatesData`
    ActionOf<URLRequest> mGotResponse;  ///< the headers are here
    ActionOf<URLRequest> mFailed;       ///< see `getError`
    ActionOf<URLRequest> mFinished;     ///< the body is whole

    /// Throws `AssertionFailure` for null.
    explicit URLRequest(Foundation::URL* url);
    /// Warns if it still runs.
    ~URLRequest() override;

    /// Begins at once with `priority`; otherwise in its turn of `RequestQueue::networkQueue`. What
    /// keeps it from beginning is reported, and fails the request with `OVInternalError`.
    void start(bool priority);
    /// Ends what runs or waits, without an action.
    void stop();
    /// What the queue calls: begins.
    void startRequest() override;

    void setCachePolicy(CachePolicy policy);
    /// Whether the body is put together, as it is until told otherwise. Without, each block stands
    /// alone in `getResponseData` during `mGotData`, and the size of the body has no bound.
    void setAccumulatesData(bool accumulates) { mAccumulatesData = accumulates; }
    /// A login to answer a demand with, once. It is offered only to the scheme, host and port of
    /// `storedFor`, null for those of the request, and never after a step from "https" to "http".
    void setStoredCredential(Foundation::String* user, Foundation::String* password,
                             Foundation::URL* storedFor = nullptr);
    /// Answers the challenge in hand. With `persistent` the login is kept once it has been
    /// accepted. Throws `AssertionFailure` if there is none.
    void useAuthenticationCredential(Foundation::String* user, Foundation::String* password,
                                     bool persistent);

    /// Keeps the response and its body in the shared cache, for as long as the server says but no
    /// less than `minLifetime` seconds; a positive one also overrules a server that wants it not
    /// kept. Whether it is kept: not if it is empty, or stale within a second.
    bool cacheResponse(double minLifetime);

    /// Goes on as a download into a file, from `mGotResponse` on and without accumulation; this
    /// request is then over. Throws `AssertionFailure` before a response and with accumulated data.
    Foundation::Returner<URLDownload> startDownloadToFile(Foundation::URL* destination);

    Foundation::URL* getURL() const { return mURL; }
    /// Null before `mGotResponse`.
    ConnectionResponse* getResponse() const { return mResponse; }
    /// The body, or what is there of it; may be null. Nothing is left of one that failed.
    Foundation::Data* getResponseData() const { return mResponseData; }
    Foundation::NetError getError() const { return mError; }
    /// The user that was last offered to a server, or will be; may be null.
    Foundation::String* getUsername() const { return mUsername; }
    /// Of the last demand for a login; null if there was none.
    ProtectionSpace* getProtectionSpace() const { return mProtectionSpace; }

 protected:
    /// The request for the connection, made at the first use.
    virtual ConnectionRequest* _getRequest();
    /// Whether the challenge has been, or will be, answered.
    virtual bool authenticate(AuthenticationChallenge* challenge, int previousFailures);
    virtual Foundation::Returner<ConnectionRequest> _willSendRequest(ConnectionRequest* request,
                                                                     ConnectionResponse* response);
    virtual void _didReceiveResponse(ConnectionResponse* response);
    virtual void _didReceiveData(Foundation::Data* data, long length);
    virtual void _didFinishLoading();
    virtual void _didFail(Foundation::NetError error);
    virtual void _didFail(ConnectionError* error);

    Foundation::Ref<Foundation::URL> mURL;
    Foundation::Ref<ConnectionRequest> mRequest;  ///< null before the first use
    Foundation::Ref<ConnectionResponse> mResponse;
    Foundation::Ref<Foundation::String> mUsername;
    Foundation::Ref<Foundation::String> mPassword;
    Foundation::Ref<Connection> mConnection;  ///< while it is open
    Foundation::NetError mError;
    Foundation::Ref<AuthenticationChallenge> mChallenge;
    Foundation::Ref<ProtectionSpace> mProtectionSpace;
    Foundation::Ref<Foundation::MutableData> mResponseData;
    bool mAccumulatesData = true;

 private:
    class Client;

    void _open(bool schedule);
    void couldNotStart();
    void close();
    void failed();
    void _didReceiveAuthenticationChallenge(AuthenticationChallenge* challenge);
    void _useAuthenticationCredential(Credential* credential);
    bool isOfferedTo(const AuthenticationChallenge& challenge) const;

    std::unique_ptr<Client> mClient;
    Foundation::Ref<Foundation::URL> mStoredFor;
    bool mCouldNotStart = false;  ///< and has not said so yet
};

}  // namespace Orvane
