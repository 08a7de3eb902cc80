#include "Foundation/HTTPException.h"

#include "Foundation/AssertionFailure.h"

namespace Foundation {

HTTPException::HTTPException(std::uint16_t status)
    : std::runtime_error(OVFormat("HTTP status %u", status)), mStatus(status) {
    OV_ASSERT_AS(status >= 300, "status>=300");
}

}  // namespace Foundation
