#pragma once

#include "Foundation/Uncopyable.h"
#include "Net/CookieStore.h"
#include "Net/HostSlots.h"
#include "Net/ResponseCache.h"
#include "Net/RetryTimes.h"
#include "Net/Transport.h"

#include <memory>
#include <string>

namespace Orvane {

/// What all connections of the process share.
class ConnectionService : Foundation::Uncopyable {
 public:
    /// Where it keeps what is to outlive the process; an empty path keeps it in memory.
    struct Places {
        std::string retryTimes;  ///< a file
        std::string responses;   ///< a directory
        std::string cookies;     ///< a file

        /// The user's.
        static Places ofUser();
    };

    /// Over libcurl, with the user's places. Made at the first use and never destroyed.
    static ConnectionService& shared();
    /// Puts another in its place, for tests, and gives the one before; null for the one above. It
    /// must outlive its connections.
    static ConnectionService* setShared(ConnectionService* service);

    ConnectionService(std::unique_ptr<Transport> transport, const Places& places);
    /// One that keeps all in memory.
    explicit ConnectionService(std::unique_ptr<Transport> transport)
        : ConnectionService(std::move(transport), Places()) {}

    Transport& transport() { return *mTransport; }
    HostSlots& hostSlots() { return mHostSlots; }
    RetryTimes& retryTimes() { return mRetryTimes; }
    ResponseCache& responseCache() { return mResponseCache; }
    CookieStore& cookies() { return mCookies; }

 private:
    std::unique_ptr<Transport> mTransport;
    HostSlots mHostSlots;
    RetryTimes mRetryTimes;
    ResponseCache mResponseCache;
    CookieStore mCookies;
};

}  // namespace Orvane
