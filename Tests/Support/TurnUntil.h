#pragma once

#include <functional>

namespace Support {

/// Turns the current run loop's default mode until `condition` holds, for what comes from the
/// kernel or from another process in its own time. False if it does not hold after `seconds` of
/// real time, far more than any machine should need.
[[nodiscard]] bool turnUntil(const std::function<bool()>& condition, double seconds = 60);

}  // namespace Support
