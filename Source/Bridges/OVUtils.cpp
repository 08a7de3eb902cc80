#include <Orvane/OVUtils.h>

#include "Bridges/Barriers.h"
#include "Foundation/NetError.h"

using namespace Foundation;
using namespace Orvane;

OVError OVUtils::errorWithNetError(std::int64_t domain, std::int32_t code, const std::string& url) {
    return raising("+[OVUtils errorWithNetError:URL:]",
                   [&] { return Foundation::errorWithNetError(NetError(domain, code), url); });
}

OVError OVUtils::orvaneErrorWithCode(int code, const std::string& url) {
    return raising("+[OVUtils orvaneErrorWithCode:URL:]", [&] { return errorWithCode(code, url); });
}
