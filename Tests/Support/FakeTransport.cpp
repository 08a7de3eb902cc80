#include "Support/FakeTransport.h"

#include "Foundation/Guard.h"
#include "Foundation/RunLoop.h"

#include <algorithm>
#include <utility>

namespace Support {

using Foundation::callGuarded;

std::unique_ptr<Orvane::Exchange> FakeTransport::start(const Orvane::ExchangeRequest& request,
                                                       Orvane::ExchangeClient& client,
                                                       std::unique_ptr<Orvane::Exchange> previous) {
    if (previous) ++mRepeats;
    const Foundation::Ref<Foundation::String> url = request.message->getURL()->getAbsoluteString();
    mAsked.push_back(request.message->getMethod() + " " + url->utf8());
    mRequests.push_back(request);
    auto pending = std::make_unique<Pending>(*this, client);
    std::deque<FakeAnswer>& answers = mAnswers[url->utf8()];
    if (!answers.empty()) {
        pending->answer(answers.front());
        answers.pop_front();
    }
    return pending;
}

void FakeTransport::answer(const std::string& url, FakeAnswer answer) {
    mAnswers[url].push_back(std::move(answer));
}

FakeTransport::Pending::~Pending() {
    std::erase(mTransport.mPending, this);
}

void FakeTransport::Pending::answer(const FakeAnswer& answer) {
    Foundation::RunLoop::current().perform([this, answer, life = std::weak_ptr<int>(mLife)] {
        if (life.expired()) return;
        sendHead(answer.status, answer.headers, answer.cookies);
        if (!life.expired() && !answer.body.empty()) sendBody(answer.body);
        if (!life.expired()) end(answer.end);
    });
}

void FakeTransport::Pending::sendHead(int status, std::vector<Orvane::HTTPHeader> headers,
                                      std::vector<std::string> cookies) {
    callGuarded(__PRETTY_FUNCTION__, [&] {
        mClient.gotHead({status, std::move(headers), std::move(cookies)});
    });
}

void FakeTransport::Pending::sendBody(const std::string& block) {
    callGuarded(__PRETTY_FUNCTION__, [&] { mClient.gotBody(block); });
}

void FakeTransport::Pending::end(const Orvane::ExchangeEnd& end) {
    std::erase(mTransport.mPending, this);
    callGuarded(__PRETTY_FUNCTION__, [&] { mClient.ended(end); });
}

}  // namespace Support
