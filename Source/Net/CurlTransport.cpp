#include "Net/CurlTransport.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/RunLoop.h"
#include "Net/ConnectionLimits.h"
#include "Net/CurlExchange.h"

#include <curl/curl.h>
#include <fcntl.h>
#include <poll.h>

#include <cstdlib>
#include <ctime>
#include <filesystem>
#include <system_error>
#include <utility>
#include <vector>

namespace Orvane {

using Foundation::RunLoop;
using Foundation::RunLoopSource;

namespace {

/// Connections without work that are kept, to all hosts.
constexpr long kKeptConnections = 16;

std::int64_t monotonicMicroseconds() {
    std::timespec now;
    clock_gettime(CLOCK_MONOTONIC, &now);
    return std::int64_t{now.tv_sec} * 1000000 + now.tv_nsec / 1000;
}

std::set<int> openDescriptors() {
    std::set<int> descriptors;
    std::error_code error;
    for (const auto& entry : std::filesystem::directory_iterator("/proc/self/fd", error)) {
        descriptors.insert(std::atoi(entry.path().filename().c_str()));
    }
    // Without the one that it was read by.
    std::erase_if(descriptors, [](int fd) { return fcntl(fd, F_GETFD) < 0; });
    return descriptors;
}

void closeInChildren(int fd) {
    fcntl(fd, F_SETFD, FD_CLOEXEC);
}

template <class Value>
void set(CURLM* multi, CURLMoption option, Value value) {
    OV_ASSERT(curl_multi_setopt(multi, option, value) == CURLM_OK);
}

}  // namespace

/// The multi handle, and what it calls.
class CurlTransport::Multi : Foundation::Uncopyable {
 public:
    explicit Multi(CurlTransport& transport) {
        OV_ASSERT(curl_global_init(CURL_GLOBAL_DEFAULT) == CURLE_OK);
        const std::set<int> others = openDescriptors();
        mHandle = curl_multi_init();
        // Those by which it wakes itself up; processes that this one starts would inherit them.
        for (const int fd : openDescriptors()) {
            if (!others.contains(fd)) closeInChildren(fd);
        }
        OV_ASSERT(mHandle);
        set(mHandle, CURLMOPT_SOCKETFUNCTION, &Multi::socketCallback);
        set(mHandle, CURLMOPT_SOCKETDATA, &transport);
        set(mHandle, CURLMOPT_TIMERFUNCTION, &Multi::timerCallback);
        set(mHandle, CURLMOPT_TIMERDATA, &transport);
        set(mHandle, CURLMOPT_MAXCONNECTS, kKeptConnections);
        set(mHandle, CURLMOPT_MAX_HOST_CONNECTIONS,
            static_cast<long>(ConnectionLimits::kMaxConnectionsPerHost));
    }
    ~Multi() {
        curl_multi_cleanup(mHandle);
        curl_global_cleanup();
    }

    CURLM* get() const { return mHandle; }

 private:
    static int socketCallback(CURL*, curl_socket_t socket, int what, void* transport, void*) {
        static_cast<CurlTransport*>(transport)->watch(socket, what);
        return 0;
    }
    static int timerCallback(CURLM*, long milliseconds, void* transport) {
        static_cast<CurlTransport*>(transport)->setDeadline(milliseconds);
        return 0;
    }

    CURLM* mHandle = nullptr;
};

class CurlTransport::SocketSource : public RunLoopSource {
 public:
    SocketSource(CurlTransport& transport, int socket) : mTransport(transport), mSocket(socket) {
        addTo(RunLoop::current(), RunLoop::kCommonModes);
    }

    void setEvents(short events) { mEvents = events; }

 private:
    Interest interest() noexcept override { return {.fd = mSocket, .events = mEvents}; }
    // Ends this where libcurl is done with the socket.
    void ready(short events) override {
        int mask = 0;
        if (events & POLLIN) mask |= CURL_CSELECT_IN;
        if (events & POLLOUT) mask |= CURL_CSELECT_OUT;
        if (events & (POLLERR | POLLHUP | POLLNVAL)) mask |= CURL_CSELECT_ERR;
        mTransport.serve(mSocket, mask);
    }
    bool isReentrant() const noexcept override { return true; }

    CurlTransport& mTransport;
    const int mSocket;
    short mEvents = 0;
};

/// libcurl's own small waits: between two addresses of a host, for the resolver, and for nothing at
/// all to begin with. They are no time-outs and follow the machine's time.
class CurlTransport::TimerSource : public RunLoopSource {
 public:
    explicit TimerSource(CurlTransport& transport) : mTransport(transport) {
        addTo(RunLoop::current(), RunLoop::kCommonModes);
    }

    void setDeadline(std::int64_t deadline) { mDeadline = deadline; }

 private:
    Interest interest() noexcept override { return {.deadline = mDeadline}; }
    void ready(short) override {
        mDeadline = -1;
        mTransport.serve(CURL_SOCKET_TIMEOUT, 0);
    }
    bool isReentrant() const noexcept override { return true; }

    CurlTransport& mTransport;
    std::int64_t mDeadline = -1;
};

CurlTransport::CurlTransport() : mMulti(std::make_unique<Multi>(*this)) {}

CurlTransport::~CurlTransport() {
    // While there are sources for it to let go of.
    mMulti.reset();
}

std::unique_ptr<Exchange> CurlTransport::start(const ExchangeRequest& request,
                                               ExchangeClient& client,
                                               std::unique_ptr<Exchange> previous) {
    CurlExchange::Easy easy;
    if (auto* exchange = dynamic_cast<CurlExchange*>(previous.get())) easy = exchange->detachEasy();
    return std::make_unique<CurlExchange>(*this, request, client, std::move(easy));
}

void CurlTransport::add(CurlExchange& exchange) {
    mExchanges.insert(&exchange);
    const CURLMcode result = curl_multi_add_handle(mMulti->get(), exchange.getEasy());
    if (result == CURLM_OK) return;
    exchange.finish(CURLE_FAILED_INIT);
    setDeadline(0);
}

void CurlTransport::remove(CurlExchange& exchange) {
    if (mExchanges.erase(&exchange) == 0) return;
    curl_multi_remove_handle(mMulti->get(), exchange.getEasy());
}

void CurlTransport::watch(int socket, int what) {
    if (what == CURL_POLL_REMOVE) {
        mSockets.erase(socket);
        return;
    }
    std::unique_ptr<SocketSource>& source = mSockets[socket];
    if (!source) {
        // The resolver's are made by libcurl itself.
        closeInChildren(socket);
        source = std::make_unique<SocketSource>(*this, socket);
    }
    short events = 0;
    if (what & CURL_POLL_IN) events |= POLLIN;
    if (what & CURL_POLL_OUT) events |= POLLOUT;
    source->setEvents(events);
}

void CurlTransport::setDeadline(long milliseconds) {
    if (!mTimer) mTimer = std::make_unique<TimerSource>(*this);
    mTimer->setDeadline(milliseconds < 0 ? -1 : monotonicMicroseconds() + milliseconds * 1000);
}

/// A socket is ready, or libcurl's timer is due.
void CurlTransport::serve(int socket, int mask) {
    int running = 0;
    curl_multi_socket_action(mMulti->get(), socket, mask, &running);
    readMessages();
    flush();
}

void CurlTransport::readMessages() {
    int left = 0;
    while (const CURLMsg* message = curl_multi_info_read(mMulti->get(), &left)) {
        if (message->msg != CURLMSG_DONE) continue;
        char* exchange = nullptr;
        curl_easy_getinfo(message->easy_handle, CURLINFO_PRIVATE, &exchange);
        reinterpret_cast<CurlExchange*>(exchange)->finish(message->data.result);
    }
}

void CurlTransport::flush() {
    const std::vector<CurlExchange*> exchanges(mExchanges.begin(), mExchanges.end());
    for (CurlExchange* exchange : exchanges) {
        if (!mExchanges.contains(exchange) || !exchange->hasNews()) continue;
        exchange->flush();
    }
}

}  // namespace Orvane
