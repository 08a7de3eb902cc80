#include "Net/HTTPCookieStorage.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Prefs.h"
#include "Foundation/UntypedPref.h"
#include "Net/ConnectionService.h"
#include "Net/CookieAcceptPolicyObserver.h"

namespace Orvane {

using Foundation::Ref;
using Foundation::String;

namespace {

/// The browser's settings for what it loads.
constexpr const char* kLoadingDomain = "com.tarnwick.WebFoundation";
constexpr const char* kAcceptCookiesKey = "PNHTTPAcceptCookies";

CookieAcceptPolicy policyNamed(std::string_view name) {
    if (name == "always") return CookieAcceptPolicy::Always;
    if (name == "never") return CookieAcceptPolicy::Never;
    return CookieAcceptPolicy::OnlyFromMainDocument;
}

}  // namespace

HTTPCookieStorage* HTTPCookieStorage::defaultStorage() {
    // Owned by this function for the life of the process.
    static HTTPCookieStorage* const sStorage = Foundation::retain(new HTTPCookieStorage);
    return sStorage;
}

HTTPCookieStorage::HTTPCookieStorage()
    : mObserver(std::make_unique<CookieAcceptPolicyObserver>(this)) {
    syncAcceptPolicyWithPreferences();
}

HTTPCookieStorage::~HTTPCookieStorage() = default;

void HTTPCookieStorage::syncAcceptPolicyWithPreferences() {
    const Foundation::AutoreleasePool pool;
    Foundation::Prefs prefs(kLoadingDomain);
    prefs.synchronize();
    const Ref<String> name =
        Foundation::StringReturner(Foundation::UntypedPref(prefs, kAcceptCookiesKey));
    ConnectionService::shared().cookies().setAcceptPolicy(policyNamed(String::view(name)));
}

CookieAcceptPolicy HTTPCookieStorage::cookieAcceptPolicy() const {
    return ConnectionService::shared().cookies().getAcceptPolicy();
}

}  // namespace Orvane
