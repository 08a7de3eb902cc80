#pragma once

#include "Foundation/Ref.h"
#include "Foundation/Uncopyable.h"
#include "Net/Request.h"

#include <vector>

namespace Orvane {

/// Requests in the order in which they came, of which the first `limit` run and the others wait. It
/// keeps all of them alive. On the thread of the run loop.
class RequestQueue : Foundation::Uncopyable {
 public:
    static constexpr unsigned kNetworkLimit = 4;

    /// The queue of everything that the process fetches without hurry. Made at the first use.
    static RequestQueue& networkQueue();

    explicit RequestQueue(unsigned limit) : mLimit(limit) {}

    /// Starts the request, now or when it has moved up. Throws `AssertionFailure` for null and for
    /// a request that is in the queue already, and what a start throws, which leaves the request
    /// out of the queue.
    void addRequest(Request* request);
    /// Takes the request out, and starts the one that moves up by that; one whose start throws is
    /// taken out too, with a report. Does nothing for one that is not in the queue. Throws
    /// `AssertionFailure` for null.
    void removeRequest(Request* request);

    const std::vector<Foundation::Ref<Request>>& requests() const { return mRequests; }

 private:
    using Requests = std::vector<Foundation::Ref<Request>>;

    Requests::iterator find(const Request* request);
    void startMovedUp();

    const unsigned mLimit;
    Requests mRequests;
};

}  // namespace Orvane
