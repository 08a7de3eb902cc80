#pragma once

#include "Foundation/NotificationCenter.h"

namespace Orvane {

class HTTPCookieStorage;

/// Tells a storage of cookies, which it does not own, that the browser's setting has changed.
class CookieAcceptPolicyObserver : public Foundation::NotificationReceiver {
 public:
    /// The browser's, which it posts to all.
    static constexpr const char* kPolicyChangedNotification =
        "com.tarnwick.Foundation.PNHTTPCookieManagerAcceptPolicyChanged";

    explicit CookieAcceptPolicyObserver(HTTPCookieStorage* storage);
    ~CookieAcceptPolicyObserver() override;

    void operator()(void* notification) override;

 private:
    HTTPCookieStorage* mStorage;
};

}  // namespace Orvane
