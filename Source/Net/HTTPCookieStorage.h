#pragma once

#include "Foundation/Ref.h"
#include "Foundation/RefCounted.h"
#include "Net/CookieAcceptPolicy.h"

#include <memory>

namespace Orvane {

class CookieAcceptPolicyObserver;

/// The store of the user's cookies, `ConnectionService::cookies`: whose are kept, as the browser's
/// setting says, also when that changes while the process runs. Main thread.
class HTTPCookieStorage : public Foundation::RefCounted {
 public:
    /// Made at the first use, and as long as the process.
    static HTTPCookieStorage* defaultStorage();

    ~HTTPCookieStorage() override;

    /// Reads the browser's setting anew.
    void syncAcceptPolicyWithPreferences();
    CookieAcceptPolicy cookieAcceptPolicy() const;

 private:
    HTTPCookieStorage();

    std::unique_ptr<CookieAcceptPolicyObserver> mObserver;
};

}  // namespace Orvane
