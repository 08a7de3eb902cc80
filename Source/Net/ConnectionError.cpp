#include "Net/ConnectionError.h"

#include <utility>

namespace Orvane {

using Foundation::NetError;

Foundation::Returner<ConnectionError> ConnectionError::error(const char* domain, std::int32_t code,
                                                             std::string text) {
    return Foundation::Returner<ConnectionError>(
        new ConnectionError(domain, code, std::move(text)));
}

NetError ConnectionError::toNetError() const {
    if (mDomain->view() == kPOSIXDomain) return {NetError::kPOSIX, mCode};
    if (mDomain->view() == kResolverDomain) return {NetError::kNetDB, mCode};
    return {NetError::kCustom, -1};
}

NetError ConnectionError::toLoadingError() const {
    if (mDomain->view() == kNetworkDomain) return {NetError::kPFURL, mCode};
    return toNetError();
}

Foundation::StringReturner ConnectionError::toString() const {
    return Foundation::String::stringOfUTF8(mText);
}

}  // namespace Orvane
