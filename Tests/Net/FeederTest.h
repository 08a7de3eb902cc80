#pragma once

#include "Foundation/DictionaryOf.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/RunLoop.h"
#include "Model/FeedTest.h"
#include "Net/ConnectionService.h"
#include "Net/PollingFeeder.h"
#include "Net/PollingFeederFactory.h"
#include "Net/RequestQueue.h"
#include "Support/FakeTransport.h"

#include <memory>
#include <string>
#include <vector>

/// Keeps what a feeder tells: "started", "fetching", "ended".
class FeederRecorder {
 public:
    explicit FeederRecorder(Orvane::FeedRefresher& feeder) {
        feeder.mRefreshStarted.setReceiver(Orvane::receiver(this, &FeederRecorder::started));
        feeder.mFetchStarted.setReceiver(Orvane::receiver(this, &FeederRecorder::fetching));
        feeder.mRefreshFinished.setReceiver(Orvane::receiver(this, &FeederRecorder::ended));
    }

    std::string notes;
    int ends = 0;

 private:
    void started(Orvane::FeedRefresher*) { notes += "started "; }
    void fetching(Orvane::FeedRefresher*) { notes += "fetching "; }
    void ended(Orvane::FeedRefresher*) {
        notes += "ended ";
        ++ends;
    }
};

/// A document of RSS with one entry.
inline std::string rss(const std::string& title, const std::string& entry = "One",
                       const std::string& more = "") {
    return "<?xml version=\"1.0\"?><rss version=\"2.0\"><channel><title>" + title +
           "</title><link>http://example.org/</link>" + more + "<item><title>" + entry +
           "</title><guid isPermaLink=\"false\">" + entry + "</guid></item></channel></rss>";
}

/// A stored feed with its feeder, over a network inside the process.
class FeederTest : public FeedTest {
 protected:
    using Answer = Support::FakeAnswer;
    static constexpr const char* kFeed = kAddress;
    static constexpr const char* kMoved = "http://example.org/moved";

    FeederTest() {
        auto transport = std::make_unique<Support::FakeTransport>();
        mTransport = transport.get();
        mService = std::make_unique<Orvane::ConnectionService>(std::move(transport));
        Orvane::ConnectionService::setShared(mService.get());
        Orvane::FeederFactory::setCurrent(&mFactory);
        feed = storedFeed(kFeed);
        feeder = feederOf(*feed);
        recorder = std::make_unique<FeederRecorder>(*feeder);
    }
    ~FeederTest() noexcept override {
        feed->removeFeeder();
        turn();
        db().saveRows();
        Orvane::FeederFactory::setCurrent(nullptr);
        Orvane::ConnectionService::setShared(nullptr);
    }

    static Orvane::PollingFeeder* feederOf(Orvane::FeedCore& owner) {
        return static_cast<Orvane::PollingFeeder*>(owner.getFeeder());
    }
    /// Serves all that is ready.
    static void turn() {
        while (Foundation::RunLoop::current().turn()) {
        }
    }
    Support::FakeTransport& network() { return *mTransport; }
    /// What the last request but `back` had for a header; empty for none.
    std::string sent(const char* header, std::size_t back = 0) {
        const auto& requests = network().requests();
        return requests.at(requests.size() - 1 - back).message->getHeader(std::string_view(header));
    }
    /// Refreshes, the network answering so. "changed", "same" or the error, and what was told.
    std::string refresh(const Answer& answer, bool force = false, const char* address = kFeed) {
        network().answer(address, answer);
        return refreshAsIs(force);
    }
    /// The same with the answers that the network has already.
    std::string refreshAsIs(bool force = false) {
        recorder->notes.clear();
        feeder->refresh(force, false);
        turn();
        return result();
    }
    std::string result() const {
        const Foundation::NetError status = feeder->getStatus();
        if (status.code != 0) return OVFormat("%lld %d", status.domain, status.code);
        return feeder->hasChanged() ? "changed" : "same";
    }
    static Answer document(const std::string& body) {
        return {200, {{"Content-Type", "text/xml"}}, body};
    }
    static Answer redirect(int status, const char* target) {
        return {status, {{"Location", target}}};
    }
    /// The same, the network failing before it answers.
    std::string refreshAndFail(Foundation::NetError error) {
        recorder->notes.clear();
        feeder->refresh(false, false);
        turn();
        network().pending().front()->end(Orvane::ExchangeEnd{error});
        turn();
        return result();
    }

 private:
    Support::FakeTransport* mTransport;
    std::unique_ptr<Orvane::ConnectionService> mService;
    Orvane::PollingFeederFactory mFactory;

 protected:
    Orvane::FeedCore* feed;
    Foundation::Ref<Orvane::PollingFeeder> feeder;
    std::unique_ptr<FeederRecorder> recorder;
};
