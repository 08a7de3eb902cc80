#include "Net/ConnectionService.h"
#include "Net/CurlTransport.h"
#include "NetTest.h"
#include "Support/ScriptedServer.h"
#include "Support/TurnUntil.h"

using namespace Orvane;
using Support::ServerAnswer;

namespace {

using Notes = std::vector<std::string>;

/// What may be done to requests through libcurl from inside of what they tell.
class CurlNestingTest : public testing::Test {
 protected:
    template <class T>
    using Ref = Foundation::Ref<T>;
    using Action = ActionOf<URLRequest> URLRequest::*;

    CurlNestingTest() : mService(std::make_unique<CurlTransport>(), ConnectionService::Places()) {
        ConnectionService::setShared(&mService);
        mServer.answer("/a", ServerAnswer().body("first"));
        mServer.answer("/b", ServerAnswer().body("second"));
    }
    ~CurlNestingTest() noexcept override { ConnectionService::setShared(nullptr); }

    static Ref<HTTPRequest> make(const std::string& address) {
        const Ref<Foundation::String> text = Foundation::String::string(address);
        const Ref<Foundation::URL> url = Foundation::URL::url(text);
        const Ref<Foundation::String> method = Foundation::String::string("GET");
        return Foundation::Returner<HTTPRequest>::adopted(new HTTPRequest(url, method));
    }
    /// Starts a request that is stopped and let go as soon as it fires an action.
    void fetchAndLetGoAt(const std::string& address, Action action) {
        mRequest = make(address);
        ((*mRequest).*action).setReceiver(receiver(this, &CurlNestingTest::letGo));
        mRequest->start(true);
        EXPECT_TRUE(Support::turnUntil([this] { return mRequest.get() == nullptr; }));
    }
    void letGo(URLRequest* request) {
        request->stop();
        mRequest = nullptr;
    }
    std::string bodyOf(const std::string& address) {
        mRequest = make(address);
        const RequestRecorder recorder(*mRequest);
        mRequest->start(true);
        EXPECT_TRUE(Support::turnUntil([&] { return recorder.isOver; }));
        return std::string(Foundation::Data::asBytes(mRequest->getResponseData()).view());
    }
    /// In one fetches something else to its end.
    void fetchOther(URLRequest*) {
        const Ref<HTTPRequest> outer = mRequest;
        mOther = bodyOf(mServer.url("/b"));
        mRequest = outer;
    }
    void fetchOtherAt(HTTPRequest& request, Action action) {
        (request.*action).setReceiver(receiver(this, &CurlNestingTest::fetchOther));
    }

    Foundation::AutoreleasePool mPool;
    FakeCenter mCenter;
    Support::ManualClock mClock;
    Support::ScriptedServer mServer;
    ConnectionService mService;
    Ref<HTTPRequest> mRequest;
    std::string mOther;
};

TEST_F(CurlNestingTest, LetsGoOfARequestInAnyOfItsActions) {
    for (const Action action : {&URLRequest::mOpened, &URLRequest::mGotResponse,
                                &URLRequest::mGotData, &URLRequest::mFinished}) {
        fetchAndLetGoAt(mServer.url("/a"), action);
    }
    fetchAndLetGoAt("http://127.0.0.1:1/", &URLRequest::mFailed);
    EXPECT_EQ(bodyOf(mServer.url("/b")), "second");
}

TEST_F(CurlNestingTest, ServesOthersWhileARequestTellsSomething) {
    for (const Action action : {&URLRequest::mGotResponse, &URLRequest::mGotData}) {
        const Ref<HTTPRequest> request = make(mServer.url("/a"));
        const RequestRecorder recorder(*request);
        fetchOtherAt(*request, action);
        mRequest = request;
        request->start(true);
        EXPECT_TRUE(Support::turnUntil([&] { return recorder.isOver; }));
        EXPECT_EQ(std::exchange(mOther, {}), "second");
        EXPECT_EQ(recorder.notes.back(), "finished");
        EXPECT_EQ(request->getResponseData()->view(), "first");
    }
}

}  // namespace
