#include "Net/URLRequest.h"

#include "NetTest.h"

using namespace Orvane;
using Foundation::NetError;

namespace {

using Notes = std::vector<std::string>;

class URLRequestTest : public NetTest {
 protected:
    static Ref<URLRequest> plain(const char* address) {
        return Foundation::Returner<URLRequest>::adopted(new URLRequest(url(address).get()));
    }
    /// A request of that address that has begun.
    HTTPRequest* begin(const char* address) {
        mRequest = get(address);
        mRecorder = std::make_unique<RequestRecorder>(*mRequest);
        mRequest->start(true);
        turn();
        return mRequest;
    }

    Ref<HTTPRequest> mRequest;
    std::unique_ptr<RequestRecorder> mRecorder;
};

TEST_F(URLRequestTest, TellsEachStepByItsAction) {
    network().answer("http://a/", {.body = "hello"});
    HTTPRequest* const request = begin("http://a/");
    EXPECT_EQ(mRecorder->notes, (Notes{"opened", "response 200", "data", "finished"}));
    EXPECT_EQ(request->getResponseData()->view(), "hello");
    EXPECT_EQ(request->getError(), NetError::None);
}

TEST_F(URLRequestTest, OpensBeforeAnythingIsSent) {
    const auto request = get("http://a/");
    const RequestRecorder recorder(*request);
    request->start(true);
    EXPECT_EQ(recorder.notes, Notes{"opened"});
    EXPECT_TRUE(network().asked().empty());
    turn();
    EXPECT_EQ(network().asked(), Notes{"GET http://a/"});
    request->stop();
}

TEST_F(URLRequestTest, PutsTheBodyTogether) {
    HTTPRequest* const request = begin("http://a/");
    network().pending()[0]->sendHead(200);
    network().pending()[0]->sendBody("one");
    network().pending()[0]->sendBody("two");
    network().pending()[0]->end();
    EXPECT_EQ(mRecorder->blocks, (Notes{"one", "onetwo"}));
    EXPECT_EQ(request->getResponseData()->view(), "onetwo");
}

TEST_F(URLRequestTest, ShowsEachBlockAloneWithoutAccumulation) {
    const auto request = plain("http://a/");
    RequestRecorder recorder(*request);
    request->setAccumulatesData(false);
    request->start(true);
    turn();
    network().pending()[0]->sendHead(200);
    network().pending()[0]->sendBody("one");
    EXPECT_EQ(request->getResponseData(), nullptr);
    network().pending()[0]->sendBody("two");
    network().pending()[0]->end();
    EXPECT_EQ(recorder.blocks, (Notes{"one", "two"}));
    EXPECT_EQ(request->getResponseData(), nullptr);
}

TEST_F(URLRequestTest, HasAnEmptyBodyFromTheStart) {
    network().answer("http://a/", {.status = 204});
    HTTPRequest* const request = begin("http://a/");
    EXPECT_EQ(request->getResponseData()->getLength(), 0u);
}

TEST_F(URLRequestTest, LogsEachStep) {
    const Support::LoggingOn on({&gLogHTTP});
    network().answer("http://a/", {.body = "hello"});
    const Ref<URLRequest> request = plain("http://a/");
    const Support::LogCapture log;
    request->start(true);
    turn();
    for (const char* text : {": Starting as priority.", ": Open", ": DidReceiveResponse",
                             ": Received 5 bytes of data", ": DidFinishLoading", ": Stop"}) {
        EXPECT_EQ(log.count(text), 1) << text;
    }
}

TEST_F(URLRequestTest, WaitsForItsTurnWithoutPriority) {
    const Support::LoggingOn on({&gLogHTTP});
    const Support::LogCapture log;
    std::vector<Ref<URLRequest>> requests;
    for (int i = 0; i < 5; ++i) {
        requests.push_back(plain("http://a/"));
        requests.back()->start(false);
    }
    turn();
    EXPECT_EQ(log.count(": Queuing..."), 5);
    EXPECT_EQ(network().asked().size(), 4u);
    requests[2]->stop();
    turn();
    EXPECT_EQ(network().asked().size(), 5u);
    for (const auto& request : requests) {
        request->stop();
    }
    EXPECT_TRUE(RequestQueue::networkQueue().requests().empty());
}

TEST_F(URLRequestTest, DoesNotCountWithPriority) {
    std::vector<Ref<URLRequest>> requests;
    for (int i = 0; i < 6; ++i) {
        requests.push_back(plain("http://a/"));
        requests.back()->start(i < 2);
    }
    EXPECT_EQ(RequestQueue::networkQueue().requests().size(), 4u);
    turn();
    EXPECT_EQ(network().asked().size(), 6u);
    requests[0]->stop();
    EXPECT_EQ(RequestQueue::networkQueue().requests().size(), 4u);
    for (const auto& request : requests) {
        request->stop();
    }
}

TEST_F(URLRequestTest, LeavesTheQueueWhenItHasFinishedOrFailed) {
    const auto first = plain("http://a/");
    const auto second = plain("http://b/");
    first->start(false);
    second->start(false);
    turn();
    network().pending()[1]->end({.error = NetError(NetError::kPFURL, -1005)});
    network().pending()[0]->answer({});
    turn();
    EXPECT_TRUE(RequestQueue::networkQueue().requests().empty());
}

TEST_F(URLRequestTest, SaysNothingOnceStopped) {
    HTTPRequest* const request = begin("http://a/");
    network().pending()[0]->sendHead(200);
    request->stop();
    EXPECT_TRUE(network().pending().empty());
    turn();
    EXPECT_EQ(mRecorder->notes, (Notes{"opened", "response 200"}));
}

TEST_F(URLRequestTest, WarnsWhenItEndsWhileItIsOpen) {
    const Support::LogCapture log;
    {
        const auto request = plain("http://a/");
        request->startRequest();
        turn();
        EXPECT_FALSE(log.contains("dealloced"));
    }
    EXPECT_EQ(log.count(" dealloced while connection still open!"), 1);
    EXPECT_TRUE(network().pending().empty());
}

TEST_F(URLRequestTest, GivesErrorsOfOurOwnAsTheyAre) {
    network().answer("http://a/", {.end = {.error = NetError(NetError::kPFURL, -1001)}});
    HTTPRequest* const request = begin("http://a/");
    EXPECT_EQ(mRecorder->notes.back(), "failed 15 -1001");
    EXPECT_EQ(request->getError(), NetError(NetError::kPFURL, -1001));
}

TEST_F(URLRequestTest, TakesAnUnknownErrorForAFailedLookUp) {
    network().answer("http://a/", {.end = {.error = NetError(-1, -1)}});
    begin("http://a/");
    EXPECT_EQ(mRecorder->notes.back(), "failed 15 -1006");
}

TEST_F(URLRequestTest, ConvertsErrorsOfTheLibrary) {
    const auto failureOf = [&](const char* domain, int code) {
        network().answer("http://a/",
                         {.end = {.failure = ConnectionError::error(domain, code, "text")}});
        begin("http://a/");
        return mRecorder->notes.back();
    };
    EXPECT_EQ(failureOf(ConnectionError::kNetworkDomain, -1004), "failed 15 -1004");
    EXPECT_EQ(failureOf(ConnectionError::kPOSIXDomain, 12), "failed 1 12");
    EXPECT_EQ(failureOf(ConnectionError::kResolverDomain, -2), "failed 12 -2");
    EXPECT_EQ(failureOf("Another", 7), "failed -1 -1");
}

TEST_F(URLRequestTest, LogsFailures) {
    const Support::LoggingOn on({&gLogHTTP});
    const Support::LogCapture log;
    network().answer("http://a/", {.end = {.error = NetError(NetError::kPFURL, -1001)}});
    begin("http://a/");
    EXPECT_EQ(log.count(": DidFail (15.-1001) PFURL error -1001"), 1);
    network().answer("http://a/",
                     {.end = {.failure = ConnectionError::error(ConnectionError::kNetworkDomain,
                                                                -1004, "refused")}});
    begin("http://a/");
    EXPECT_EQ(log.count(": DidFail (domain=Network, code=-1004): refused"), 1);
}

TEST_F(URLRequestTest, KeepsNothingOfABodyThatBroke) {
    network().answer("http://a/",
                     {.body = "half", .end = {.error = NetError(NetError::kPFURL, -1005)}});
    HTTPRequest* const request = begin("http://a/");
    EXPECT_EQ(request->getResponseData(), nullptr);
}

TEST_F(URLRequestTest, ReportsWhatAReceiverThrows) {
    const auto request = get("http://a/");
    request->mGotResponse.setReceiver(
        +[](URLRequest*, int) { throw std::runtime_error("no"); }, 0);
    network().answer("http://a/", {.body = "x"});
    const Support::LogCapture log;
    request->start(true);
    turn();
    EXPECT_TRUE(log.contains("\"no\" caught in"));
    EXPECT_EQ(request->getResponseData()->view(), "x");
}

TEST_F(URLRequestTest, ReportsWhatACallbackThrowsWithItsSignature) {
    class Thrower : public URLRequest {
     public:
        using URLRequest::URLRequest;
        void _didReceiveResponse(ConnectionResponse*) override { throw std::runtime_error("no"); }
    };
    const Ref<Thrower> request =
        Foundation::Returner<Thrower>::adopted(new Thrower(url("http://a/").get()));
    network().answer("http://a/", {.body = "x"});
    const Support::LogCapture log;
    request->start(true);
    turn();
    EXPECT_TRUE(log.contains("didReceiveResponse(Orvane::ConnectionResponse*)"));
    EXPECT_EQ(request->getResponseData()->view(), "x");
}

/// One that cannot begin.
class Unmade : public URLRequest {
 public:
    using URLRequest::URLRequest;
    ConnectionRequest* _getRequest() override { throw std::runtime_error("no"); }
};

TEST_F(URLRequestTest, FailsWhereItCannotBegin) {
    const Ref<Unmade> request =
        Foundation::Returner<Unmade>::adopted(new Unmade(url("http://a/").get()));
    const RequestRecorder recorder(*request);
    for (const bool priority : {true, false}) {
        const Support::LogCapture log;
        request->start(priority);
        // Whoever starts it hears of it behind that.
        EXPECT_TRUE(log.contains("std::runtime_error \"no\" caught in"));
        EXPECT_TRUE(recorder.notes.empty() || !priority);
        turn();
        EXPECT_EQ(recorder.notes.back(), "failed 1002 1");
        EXPECT_EQ(recorder.notes.size(), priority ? 1u : 2u);
        EXPECT_TRUE(RequestQueue::networkQueue().requests().empty());
    }
}

TEST_F(URLRequestTest, LetsOthersBeginWhereItCannot) {
    std::vector<Ref<URLRequest>> running;
    for (int i = 0; i < 4; ++i) {
        running.push_back(get("http://a/"));
        running.back()->start(false);
    }
    const Ref<Unmade> unmade =
        Foundation::Returner<Unmade>::adopted(new Unmade(url("http://b/").get()));
    const RequestRecorder recorder(*unmade);
    unmade->start(false);
    const auto last = get("http://c/");
    last->start(false);
    const Support::LogCapture log;
    turn();
    running[0]->stop();
    turn();
    EXPECT_EQ(recorder.notes, Notes{"failed 1002 1"});
    EXPECT_EQ(network().asked().back(), "GET http://c/");
    for (const auto& request : running) {
        request->stop();
    }
    last->stop();
}

TEST_F(URLRequestTest, SaysNothingOfAFailedStartOnceStopped) {
    const Ref<Unmade> request =
        Foundation::Returner<Unmade>::adopted(new Unmade(url("http://a/").get()));
    const RequestRecorder recorder(*request);
    const Support::LogCapture log;
    request->start(false);
    request->stop();
    turn();
    EXPECT_TRUE(recorder.notes.empty());
    EXPECT_TRUE(RequestQueue::networkQueue().requests().empty());
}

TEST_F(URLRequestTest, GivesUpAfter120SecondsWithoutAByte) {
    begin("http://a/");
    mClock.advanceBy(119);
    network().pending()[0]->sendHead(200);
    mClock.advanceBy(119);
    EXPECT_EQ(mRecorder->notes.back(), "response 200");
    const Support::LogCapture log;
    mClock.advanceBy(2);
    turn();
    EXPECT_EQ(mRecorder->notes.back(), "failed 15 -1001");
    EXPECT_TRUE(network().pending().empty());
    EXPECT_TRUE(log.contains("<http://a/>: no byte in 120 seconds"));
}

TEST_F(URLRequestTest, LetsALoopThatWasBusyReadFirst) {
    begin("http://a/");
    network().pending()[0]->answer({.body = "late"});
    mClock.jumpTo(mClock.now() + 200);
    turn();
    EXPECT_EQ(mRecorder->notes.back(), "finished");
}

TEST_F(URLRequestTest, GivesTheNextServerItsWholeTime) {
    begin("http://a/");
    network().pending()[0]->sendHead(302, {{"Location", "http://b/"}});
    // The body of the redirect never ends: it is given up, and the next server asked.
    mClock.advanceBy(121);
    ASSERT_EQ(network().asked().size(), 2u);
    mClock.advanceBy(118);
    EXPECT_EQ(mRecorder->notes, Notes{"opened"});
    mClock.advanceBy(3);
    EXPECT_EQ(mRecorder->notes.back(), "failed 15 -1001");
    // Even if it answers right when the time is over.
    begin("http://a/");
    network().pending()[0]->sendHead(302, {{"Location", "http://b/"}});
    mClock.advanceBy(121);
    mClock.jumpTo(mClock.now() + 120);
    network().pending()[0]->answer({.body = "late"});
    turn();
    EXPECT_EQ(mRecorder->notes.back(), "finished");
}

TEST_F(URLRequestTest, WritesNoPasswordIntoWarnings) {
    const Support::LogCapture log;
    begin("http://ann:secret@a/");
    mClock.advanceBy(121);
    EXPECT_EQ(log.count("<http://a/>: no byte in 120 seconds"), 1);
    EXPECT_FALSE(log.contains("secret"));
}

TEST_F(URLRequestTest, GivesUpADocumentAfter300Seconds) {
    begin("http://a/");
    network().pending()[0]->sendHead(200);
    for (int i = 0; i < 29; ++i) {
        mClock.advanceBy(10);
        network().pending()[0]->sendBody("x");
    }
    EXPECT_EQ(mRecorder->notes.back(), "data");
    const Support::LogCapture log;
    mClock.advanceBy(11);
    EXPECT_EQ(mRecorder->notes.back(), "failed 15 -1001");
    EXPECT_TRUE(log.contains("<http://a/>: not complete in 300 seconds"));
}

TEST_F(URLRequestTest, LetsAFileTakeItsTime) {
    const auto request = plain("http://a/");
    RequestRecorder recorder(*request);
    request->setAccumulatesData(false);
    request->start(true);
    turn();
    network().pending()[0]->sendHead(200);
    for (int i = 0; i < 40; ++i) {
        mClock.advanceBy(10);
        network().pending()[0]->sendBody("x");
    }
    EXPECT_EQ(recorder.notes.back(), "data");
    request->stop();
}

TEST_F(URLRequestTest, FetchesByHTTPOnly) {
    begin("ftp://a/");
    EXPECT_EQ(mRecorder->notes.back(), "failed 15 -1002");
    EXPECT_TRUE(network().asked().empty());
}

}  // namespace
