#pragma once

#include "Foundation/Timer.h"
#include "Net/AuthenticationChallenge.h"
#include "Net/ConnectionClient.h"
#include "Net/ConnectionRequest.h"
#include "Net/ConnectionResponse.h"
#include "Net/CookieStore.h"
#include "Net/HostSlots.h"
#include "Net/Transport.h"

#include <memory>
#include <optional>
#include <string>

namespace Orvane {

class BodyReader;
class ConnectionService;

/// Fetches what a URL leads to: asks server after server as redirects lead on, answers demands for
/// a login, and hands the last response and its body, decoded, to its client.
///
/// Everything has its bound (`ConnectionLimits`), and all time-outs run on the process's clock.
/// Redirects lead to "http" and "https" only. A login goes to no other origin than the one that
/// asked for it, and to none at all after a step from "https" to "http".
class Connection : public Foundation::RefCounted, private ExchangeClient {
 public:
    /// The request is copied. The client outlives the connection, or cancels it.
    static Foundation::Returner<Connection> connection(const ConnectionRequest* request,
                                                       ConnectionClient* client);
    ~Connection() override;

    /// Lets the current run loop serve it, in the common modes. Nothing happens before.
    void schedule();
    /// Begins, in the next turn of the loop.
    void start();
    /// Ends everything; the client hears no more. Does nothing to a connection that has ended.
    void cancel();
    /// Answers the challenge that was received last: with a login, or, for null, by taking the
    /// response for what it is. Throws `AssertionFailure` if there is none to answer.
    void useCredential(Credential* credential);

    /// False once it has finished, failed or been cancelled.
    bool isOpen() const { return mClient != nullptr; }
    /// Hands it on to another client, as it stands.
    void setClient(ConnectionClient* client) { mClient = client; }

 private:
    enum class Phase {
        New,
        Asking,      ///< until the head of a response
        Skipping,    ///< the body of a response that leads on, to `mNext`
        Challenged,  ///< until the client answers
        Declined,    ///< the client has no login: the response is to be delivered
        Body,
    };
    struct Login {
        Foundation::Ref<Credential> credential;
        Origin origin;
        AuthenticationMethod method;
        bool isFromClient;
    };

    Connection(const ConnectionRequest* request, ConnectionClient* client);

    // What the exchange says.
    void moved() override;
    void gotHead(ExchangeHead head) override;
    void gotBody(std::string_view block) override;
    void ended(const ExchangeEnd& end) override;

    void beginIfReady();
    void begin();
    void send();
    void takeTicket();
    void startExchange();
    void takeCookies(const ExchangeHead& head);
    bool answerFromCache();
    bool answerForHost();
    void deliverWhole(ConnectionResponse* response, Foundation::Data* data);
    bool mayUseLogin() const;

    bool followRedirect(ConnectionResponse* response);
    Foundation::URLReturner redirectTarget(const HTTPMessage& response) const;
    Foundation::Returner<ConnectionRequest> redirected(Foundation::URL* target, int status) const;
    void leadOn(ConnectionRequest* next);
    void sendNext();

    bool askForLogin(ConnectionResponse* response);
    Foundation::Returner<Credential> credentialOfURL() const;
    void repeatWith(Credential* credential, const ProtectionSpace& space, bool isFromClient);
    void restartTimers();
    void startTotalTimer();
    void hold(std::string_view block);
    void deliverHeld();

    void deliver(ConnectionResponse* response);
    void keepLogin(const ConnectionResponse& response);
    void deliverBlock(std::string_view block);
    void finishBody();

    void timedOut();
    void tookTooLong();
    void fail(Foundation::NetError error);
    void fail(ConnectionError* error);
    /// Ends all but the word to the client, who is given back.
    ConnectionClient* close();

    ConnectionService& mService;
    ConnectionClient* mClient;                      ///< null once it has ended
    Foundation::Ref<ConnectionRequest> mRequest;    ///< the one that is asked now
    Foundation::Ref<ConnectionRequest> mNext;       ///< the one after it
    Foundation::Ref<ConnectionResponse> mResponse;  ///< of the challenge, until it is answered
    Foundation::Ref<AuthenticationChallenge> mChallenge;
    const Foundation::Ref<Foundation::URL> mFirstURL;  ///< the one that the client asked for
    std::unique_ptr<HostSlots::Ticket> mTicket;        ///< while it asks a host
    std::unique_ptr<Exchange> mExchange;
    CookieStore::Lines mSentCookies;
    std::unique_ptr<BodyReader> mReader;  ///< of the response that is delivered
    Phase mPhase = Phase::New;
    bool mIsScheduled = false;
    bool mIsStarted = false;
    int mRedirects = 0;
    bool mSteppedDown = false;  ///< from "https" to "http", somewhere on the way
    std::optional<Login> mLogin;
    bool mTriedLoginOfURL = false;
    bool mSentLogin = false;  ///< with the request that is asked now
    int mRefusedLogins = 0;   ///< of those that the client gave
    std::string mHeldBody;    ///< what came while the client was asked
    std::optional<ExchangeEnd> mHeldEnd;
    std::size_t mSkippedBytes = 0;
    bool mKeepsExchange = false;  ///< what it learned is of use for `mNext`

    Foundation::Timer<Connection> mBeginTimer;
    Foundation::Timer<Connection> mStallTimer;
    bool mIsLastChance = false;  ///< the stall timer has fired once since the last byte
    Foundation::Timer<Connection> mTotalTimer;
};

}  // namespace Orvane
