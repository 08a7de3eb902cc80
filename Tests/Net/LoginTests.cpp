#include "Net/HTTPRequest.h"

#include "Model/CredentialStore.h"
#include "NetTest.h"
#include "Support/AssertionOf.h"

using namespace Orvane;
using Foundation::String;

namespace {

using Notes = std::vector<std::string>;

const std::vector<HTTPHeader> kBasic = {{"WWW-Authenticate", "Basic realm=\"Feeds\""}};
const std::vector<HTTPHeader> kDigest = {
    {"WWW-Authenticate", "Digest realm=\"Feeds\", nonce=\"n\", qop=\"auth\""}};

class LoginTest : public NetTest {
 protected:
    HTTPRequest* fetch(const char* address, const char* user = nullptr) {
        mRequest = get(address);
        if (user) mRequest->setStoredCredential(text(user).get(), text("secret").get());
        mRecorder = std::make_unique<RequestRecorder>(*mRequest);
        mRequest->start(true);
        turn();
        return mRequest;
    }
    /// The logins of the requests that were sent, "-" for none.
    Notes logins() {
        Notes all;
        for (const ExchangeRequest& request : network().requests()) {
            all.push_back(request.credential ? request.credential->getUser()->utf8() : "-");
        }
        return all;
    }

    Ref<HTTPRequest> mRequest;
    std::unique_ptr<RequestRecorder> mRecorder;
};

TEST_F(LoginTest, AnswersADemandWithTheStoredCredentialOnce) {
    const Support::LoggingOn on({&gLogHTTP});
    const Support::LogCapture log;
    network().answer("http://a/", {.status = 401, .headers = kBasic});
    network().answer("http://a/", {.body = "in"});
    HTTPRequest* const request = fetch("http://a/", "ann");
    EXPECT_EQ(logins(), (Notes{"-", "ann"}));
    EXPECT_EQ(network().repeats(), 1);
    EXPECT_EQ(mRecorder->notes, (Notes{"opened", "response 200", "data", "finished"}));
    EXPECT_EQ(request->getUsername()->view(), "ann");
    EXPECT_EQ(request->getProtectionSpace()->getRealm()->view(), "Feeds");
    EXPECT_EQ(log.count(": DidReceiveAuthenticationChallenge: Basic realm 'Feeds' of http://a:80 "
                        "(proposed username='(null)') ..."),
              1);
    EXPECT_EQ(log.count(": Auth: Using stored username/password 'ann'"), 1);
    EXPECT_EQ(log.count(": useAuthenticationCredential: user=ann, persistent=2"), 1);
}

TEST_F(LoginTest, LetsASecondDemandThroughAsAResponse) {
    const Support::LoggingOn on({&gLogHTTP});
    const Support::LogCapture log;
    network().answer("http://a/", {.status = 401, .headers = kBasic});
    network().answer("http://a/", {.status = 401, .headers = kBasic, .body = "no"});
    HTTPRequest* const request = fetch("http://a/", "ann");
    EXPECT_EQ(logins(), (Notes{"-", "ann"}));
    EXPECT_EQ(mRecorder->notes, (Notes{"opened", "response 401", "data", "finished"}));
    EXPECT_EQ(request->getResponseData()->view(), "no");
    EXPECT_EQ(log.count(": Canceling auth challenge"), 1);
}

TEST_F(LoginTest, LetsADemandThroughWithoutACredential) {
    network().answer("http://a/", {.status = 401, .headers = kBasic, .body = "no"});
    HTTPRequest* const request = fetch("http://a/");
    EXPECT_EQ(logins(), Notes{"-"});
    EXPECT_EQ(mRecorder->notes, (Notes{"opened", "response 401", "data", "finished"}));
    EXPECT_EQ(request->getProtectionSpace()->getHost(), "a");
}

TEST_F(LoginTest, LetsADemandThroughThatNobodyKnowsAnAnswerTo) {
    network().answer("http://a/",
                     {.status = 401, .headers = {{"WWW-Authenticate", "Negotiate, NTLM"}}});
    HTTPRequest* const request = fetch("http://a/", "ann");
    EXPECT_EQ(mRecorder->notes.back(), "finished");
    EXPECT_EQ(request->getProtectionSpace(), nullptr);
}

TEST_F(LoginTest, TakesTheStrongerOfTwoMethods) {
    network().answer("http://a/", {.status = 401, .headers = {kBasic[0], kDigest[0]}});
    fetch("http://a/", "ann");
    EXPECT_EQ(network().requests()[1].method, AuthenticationMethod::Digest);
    mRequest->stop();
}

TEST_F(LoginTest, SendsNoLoginWhereARedirectLeadsElsewhere) {
    network().answer("http://a/", {.status = 302, .headers = {{"Location", "http://b/"}}});
    network().answer("http://b/", {.status = 401, .headers = kBasic});
    fetch("http://a/", "ann");
    EXPECT_EQ(logins(), (Notes{"-", "-"}));
    EXPECT_EQ(mRecorder->notes.back(), "finished");
}

TEST_F(LoginTest, SendsNoLoginToAnotherPortOrScheme) {
    for (const char* place : {"http://a:81/", "https://a/"}) {
        network().answer("http://a/", {.status = 302, .headers = {{"Location", place}}});
        network().answer(place, {.status = 401, .headers = kBasic});
        fetch("http://a/", "ann");
        EXPECT_EQ(mRequest->getHTTPResponse()->getStatus(), 401) << place;
    }
    EXPECT_EQ(logins(), (Notes{"-", "-", "-", "-"}));
}

TEST_F(LoginTest, TakesALoginNotAlongToWhereARedirectLeads) {
    network().answer("http://a/", {.status = 401, .headers = kBasic});
    network().answer("http://a/", {.status = 302, .headers = {{"Location", "http://b/"}}});
    network().answer("http://b/", {});
    fetch("http://a/", "ann");
    EXPECT_EQ(logins(), (Notes{"-", "ann", "-"}));
}

TEST_F(LoginTest, KeepsALoginWithinItsOrigin) {
    network().answer("http://a/", {.status = 401, .headers = kBasic});
    network().answer("http://a/", {.status = 302, .headers = {{"Location", "/b"}}});
    network().answer("http://a/b", {});
    fetch("http://a/", "ann");
    EXPECT_EQ(logins(), (Notes{"-", "ann", "ann"}));
}

TEST_F(LoginTest, SendsNoLoginAfterAStepFromAnEncryptedConnectionToAnOpenOne) {
    network().answer("http://a/", {.status = 302, .headers = {{"Location", "https://a/"}}});
    network().answer("https://a/", {.status = 302, .headers = {{"Location", "http://a/x"}}});
    network().answer("http://a/x", {.status = 401, .headers = kBasic});
    fetch("http://a/", "ann");
    EXPECT_EQ(logins(), (Notes{"-", "-", "-"}));
    EXPECT_EQ(mRequest->getHTTPResponse()->getStatus(), 401);
}

TEST_F(LoginTest, OffersALoginWhereItWasStoredFor) {
    network().answer("http://a/", {.status = 401, .headers = kBasic});
    mRequest = get("http://a/");
    mRequest->setStoredCredential(text("ann").get(), text("x").get(), url("http://b/").get());
    mRequest->start(true);
    turn();
    EXPECT_EQ(logins(), Notes{"-"});
}

TEST_F(LoginTest, TriesTheLoginOfTheURLFirst) {
    network().answer("http://bob:pw@a/", {.status = 401, .headers = kBasic});
    network().answer("http://bob:pw@a/", {.status = 401, .headers = kBasic});
    network().answer("http://bob:pw@a/", {});
    const Support::LoggingOn on({&gLogHTTP});
    const Support::LogCapture log;
    fetch("http://bob:pw@a/", "ann");
    EXPECT_EQ(logins(), (Notes{"-", "bob", "ann"}));
    EXPECT_TRUE(log.contains("(proposed username='bob')"));
}

/// Asks a person, who takes his time.
class AskingRequest : public HTTPRequest {
 public:
    using HTTPRequest::HTTPRequest;
    bool authenticate(AuthenticationChallenge*, int failures) override {
        failuresSeen.push_back(failures);
        return true;
    }
    std::vector<int> failuresSeen;
};

class AskingTest : public LoginTest {
 protected:
    AskingTest() {
        mAsking = Foundation::Returner<AskingRequest>::adopted(
            new AskingRequest(url("http://a/").get(), text("GET").get()));
        mRecorder = std::make_unique<RequestRecorder>(*mAsking);
        network().answer("http://a/", {.status = 401, .headers = kBasic, .body = "no"});
        mAsking->start(true);
        turn();
    }
    ~AskingTest() noexcept override { mAsking->stop(); }

    Ref<AskingRequest> mAsking;
};

TEST_F(AskingTest, WaitsForAnAnswer) {
    mClock.advanceBy(1000);
    EXPECT_EQ(mRecorder->notes, Notes{"opened"});
    network().answer("http://a/", {});
    mAsking->useAuthenticationCredential(text("zoe").get(), text("x").get(), false);
    EXPECT_EQ(mRecorder->notes, Notes{"opened"});
    turn();
    EXPECT_EQ(logins(), (Notes{"-", "zoe"}));
    EXPECT_EQ(mRecorder->notes.back(), "finished");
}

TEST_F(AskingTest, CountsRefusedAnswers) {
    for (const char* user : {"one", "two"}) {
        network().answer("http://a/", {.status = 401, .headers = kBasic});
        mAsking->useAuthenticationCredential(text(user).get(), text("x").get(), false);
        turn();
    }
    EXPECT_EQ(mAsking->failuresSeen, (std::vector<int>{0, 1, 2}));
}

TEST_F(AskingTest, HasOneAnswerToAChallenge) {
    mAsking->useAuthenticationCredential(text("zoe").get(), text("x").get(), false);
    EXPECT_EQ(Support::assertionOf([&] {
                  mAsking->useAuthenticationCredential(text("zoe").get(), text("x").get(), false);
              }),
              "mChallenge");
    mAsking->stop();
    EXPECT_EQ(Support::assertionOf([&] {
                  mAsking->useAuthenticationCredential(text("zoe").get(), text("x").get(), false);
              }),
              "mConnection");
}

TEST_F(AskingTest, StoresALoginThatIsToBeKeptOnceItIsAccepted) {
    struct Store : CredentialStore {
        Foundation::NetError saveInternetPassword(Foundation::URL* where, String* user,
                                                  String* password) override {
            saved.push_back(where->text() + " " + user->utf8() + " " + password->utf8());
            return {};
        }
        Notes saved;
    } store;
    CredentialStore::setCurrent(&store);
    const Support::LoggingOn on({&gLogHTTP});
    const Support::LogCapture log;
    network().answer("http://a/", {.status = 401, .headers = kBasic});
    mAsking->useAuthenticationCredential(text("zoe").get(), text("x").get(), true);
    turn();
    EXPECT_EQ(log.count(": useAuthenticationCredential: user=zoe, persistent=3"), 1);
    EXPECT_TRUE(store.saved.empty());
    network().answer("http://a/", {});
    mAsking->useAuthenticationCredential(text("zoe").get(), text("y").get(), true);
    turn();
    CredentialStore::setCurrent(nullptr);
    EXPECT_EQ(store.saved, Notes{"http://a/ zoe y"});
}

}  // namespace
