#pragma once

#include "Net/Transport.h"

#include <deque>
#include <functional>
#include <map>
#include <memory>
#include <string>
#include <vector>

namespace Support {

/// What a server of `FakeTransport` answers.
struct FakeAnswer {
    int status = 200;
    std::vector<Orvane::HTTPHeader> headers = {};
    std::string body = {};
    Orvane::ExchangeEnd end = {};
    /// Lines of a cookie file that the response sets.
    std::vector<std::string> cookies = {};
};

/// A network inside the process: keeps what is asked, and answers when the test says so. Answers
/// come in turns of the run loop, as those of a real one do.
class FakeTransport : public Orvane::Transport {
 public:
    /// A request that has not ended.
    class Pending;

    std::unique_ptr<Orvane::Exchange> start(const Orvane::ExchangeRequest& request,
                                            Orvane::ExchangeClient& client,
                                            std::unique_ptr<Orvane::Exchange> previous) override;

    /// The next request of this URL that has no other answer gets this one, as soon as it comes.
    void answer(const std::string& url, FakeAnswer answer);

    /// All requests, in their order: "GET http://host/path".
    const std::vector<std::string>& asked() const { return mAsked; }
    /// The same requests whole.
    const std::vector<Orvane::ExchangeRequest>& requests() const { return mRequests; }
    /// Those that have no end yet, in their order.
    const std::vector<Pending*>& pending() const { return mPending; }
    /// How many requests were given the ended one that asked them for a login.
    int repeats() const { return mRepeats; }

 private:
    std::map<std::string, std::deque<FakeAnswer>> mAnswers;
    std::vector<std::string> mAsked;
    std::vector<Orvane::ExchangeRequest> mRequests;
    std::vector<Pending*> mPending;
    int mRepeats = 0;
};

class FakeTransport::Pending : public Orvane::Exchange {
 public:
    Pending(FakeTransport& transport, Orvane::ExchangeClient& client)
        : mTransport(transport), mClient(client) {
        mTransport.mPending.push_back(this);
    }
    ~Pending() override;

    /// All of an answer in one turn of the loop.
    void answer(const FakeAnswer& answer);
    void sendHead(int status, std::vector<Orvane::HTTPHeader> headers = {},
                  std::vector<std::string> cookies = {});
    void sendBody(const std::string& block);
    /// Whole, or with an error. Nothing can be said after it.
    void end(const Orvane::ExchangeEnd& end = {});

 private:
    FakeTransport& mTransport;
    Orvane::ExchangeClient& mClient;
    std::shared_ptr<int> mLife = std::make_shared<int>();
};

}  // namespace Support
