#pragma once

#include <chrono>
#include <string>

namespace Commands::TimeText {

/// A time in the form of ISO 8601, in UTC: "2005-10-21T00:12:34Z".
std::string iso8601(std::chrono::sys_seconds time);

}  // namespace Commands::TimeText
