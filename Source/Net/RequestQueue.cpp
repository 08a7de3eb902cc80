#include "Net/RequestQueue.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Guard.h"
#include "Foundation/Logger.h"

#include <algorithm>

namespace Orvane {

using Foundation::Ref;

RequestQueue& RequestQueue::networkQueue() {
    // Never destroyed: requests that end with the process leave it.
    static auto* const sQueue = new RequestQueue(kNetworkLimit);
    return *sQueue;
}

RequestQueue::Requests::iterator RequestQueue::find(const Request* request) {
    return std::ranges::find(mRequests, request, &Ref<Request>::get);
}

void RequestQueue::addRequest(Request* req) {
    OV_ASSERT(req);
    const auto where = find(req);
    OV_ASSERT_AS(where == mRequests.end(), "where==mRequests.end()");
    const auto count = static_cast<unsigned>(mRequests.size());
    mRequests.emplace_back(req);
    if (count >= mLimit) {
        gLogQueue.log("Added request[%u] to start later", count);
        return;
    }
    gLogQueue.log("Added request[%u] and starting it", count);
    try {
        req->startRequest();
    } catch (...) {
        removeRequest(req);
        throw;
    }
}

void RequestQueue::removeRequest(Request* req) {
    OV_ASSERT(req);
    const auto where = find(req);
    if (where == mRequests.end()) return;
    const auto index = static_cast<unsigned>(where - mRequests.begin());
    Ref<Request> removed = std::move(*where);
    mRequests.erase(where);
    gLogQueue.log("Removed request[%u] now [%d]", index, static_cast<int>(mRequests.size()));
    if (index < mLimit && mRequests.size() >= mLimit) {
        gLogQueue.log("Starting request[%u]", mLimit - 1);
        startMovedUp();
    }
    // Its caller may be working in it.
    removed = nullptr;
}

/// What it throws is none of the business of whoever has left.
void RequestQueue::startMovedUp() {
    const Ref<Request> next = mRequests[mLimit - 1];
    bool hasStarted = false;
    Foundation::callGuarded(__PRETTY_FUNCTION__, [&] {
        next->startRequest();
        hasStarted = true;
    });
    if (!hasStarted) removeRequest(next);
}

}  // namespace Orvane
