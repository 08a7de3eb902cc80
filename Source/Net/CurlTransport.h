#pragma once

#include "Net/Transport.h"

#include <map>
#include <memory>
#include <set>
#include <string>
#include <vector>

namespace Orvane {

class CurlExchange;

/// HTTP by libcurl: one multi handle, whose sockets and timer are sources of the run loop of the
/// thread that uses it, in the common modes. Connections are kept for the next request, at most
/// `ConnectionLimits::kMaxConnectionsPerHost` to one host. The environment's proxies are used.
///
/// libcurl keeps no time-out of its own here, follows no redirect and decodes nothing. Certificates
/// are checked against the system's, or what `SSL_CERT_FILE` and `SSL_CERT_DIR` name.
class CurlTransport : public Transport {
 public:
    CurlTransport();
    /// REQUIRES: its exchanges have ended.
    ~CurlTransport() override;

    std::unique_ptr<Exchange> start(const ExchangeRequest& request, ExchangeClient& client,
                                    std::unique_ptr<Exchange> previous) override;

 private:
    friend class CurlExchange;
    class Multi;
    class SocketSource;
    class TimerSource;

    void add(CurlExchange& exchange);
    void remove(CurlExchange& exchange);
    void serve(int socket, int mask);
    void readMessages();
    void flush();

    void watch(int socket, int what);
    void setDeadline(long milliseconds);

    std::unique_ptr<Multi> mMulti;
    std::map<int, std::unique_ptr<SocketSource>> mSockets;
    std::unique_ptr<TimerSource> mTimer;
    std::set<CurlExchange*> mExchanges;
};

}  // namespace Orvane
