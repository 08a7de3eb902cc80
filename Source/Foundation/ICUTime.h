#pragma once

#include "Foundation/Clock.h"

#include <algorithm>
#include <cmath>

namespace Foundation {

/// ICU's time, milliseconds since 1970, for one of the system's. ICU counts days in 32 bits, so
/// what lies too far out is moved to the last time that it can take; what is no number counts as
/// 0.0.
inline double toICUTime(double absoluteTime) {
    constexpr double kFurthest = 8.64e15;
    if (std::isnan(absoluteTime)) absoluteTime = 0;
    // Rounded: the sum cannot hold a time's milliseconds exactly, and ICU would cut them.
    return std::clamp(std::round((absoluteTime + kUnixEpochOffset) * 1000), -kFurthest, kFurthest);
}

}  // namespace Foundation
