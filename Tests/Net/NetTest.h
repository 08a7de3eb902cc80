#pragma once

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Bundle.h"
#include "Foundation/RunLoop.h"
#include "Net/ConnectionService.h"
#include "Net/HTTPRequest.h"
#include "Net/RequestQueue.h"
#include "SQLite/FakeCenter.h"
#include "Support/FakeTransport.h"
#include "Support/LogCapture.h"
#include "Support/ManualClock.h"

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <utility>
#include <vector>

/// Keeps what a request tells by its actions.
class RequestRecorder {
 public:
    explicit RequestRecorder(Orvane::URLRequest& request) {
        request.mOpened.setReceiver(Orvane::receiver(this, &RequestRecorder::opened));
        request.mGotResponse.setReceiver(Orvane::receiver(this, &RequestRecorder::gotResponse));
        request.mGotData.setReceiver(Orvane::receiver(this, &RequestRecorder::gotData));
        request.mFailed.setReceiver(Orvane::receiver(this, &RequestRecorder::failed));
        request.mFinished.setReceiver(Orvane::receiver(this, &RequestRecorder::finished));
    }

    std::vector<std::string> notes;
    std::vector<std::string> blocks;  ///< what was there of the body at each
    bool isOver = false;

 private:
    using URLRequest = Orvane::URLRequest;
    void opened(URLRequest*) { notes.emplace_back("opened"); }
    void gotResponse(URLRequest* request) {
        const int status = request->getResponse()->getHTTPMessage()->getStatus();
        notes.push_back("response " + std::to_string(status));
    }
    void gotData(URLRequest* request) {
        notes.emplace_back("data");
        constexpr std::size_t kShort = 65536;
        const auto data = Foundation::Data::asBytes(request->getResponseData()).view();
        blocks.emplace_back(data.substr(0, kShort));
    }
    void failed(URLRequest* request) {
        isOver = true;
        const Foundation::NetError error = request->getError();
        notes.push_back("failed " + std::to_string(error.domain) + " " +
                        std::to_string(error.code));
    }
    void finished(URLRequest*) {
        isOver = true;
        notes.emplace_back("finished");
    }
};

/// Requests over a network inside the process, on a clock driven by hand.
class NetTest : public testing::Test {
 protected:
    using Answer = Support::FakeAnswer;
    template <class T>
    using Ref = Foundation::Ref<T>;

    NetTest() {
        auto transport = std::make_unique<Support::FakeTransport>();
        mTransport = transport.get();
        mService = std::make_unique<Orvane::ConnectionService>(std::move(transport),
                                                               Orvane::ConnectionService::Places());
        Orvane::ConnectionService::setShared(mService.get());
    }
    ~NetTest() noexcept override {
        turn();
        Orvane::ConnectionService::setShared(nullptr);
    }

    static Ref<Foundation::String> text(const char* utf8) {
        return Foundation::String::string(utf8);
    }
    static Ref<Foundation::URL> url(const char* utf8) {
        return Foundation::URL::url(text(utf8).get());
    }
    static Ref<Orvane::HTTPRequest> get(const char* address) {
        return Foundation::Returner<Orvane::HTTPRequest>::adopted(
            new Orvane::HTTPRequest(url(address).get(), text("GET").get()));
    }
    static std::string version() {
        const Ref<Foundation::String> text = Foundation::Bundle::frameworkVersion();
        return text->utf8();
    }
    /// Serves all that is ready.
    static void turn() {
        while (Foundation::RunLoop::current().turn()) {
        }
    }
    Support::FakeTransport& network() { return *mTransport; }

    Foundation::AutoreleasePool mPool;
    FakeCenter mCenter;
    Support::ManualClock mClock;

 private:
    Support::FakeTransport* mTransport;
    std::unique_ptr<Orvane::ConnectionService> mService;
};
