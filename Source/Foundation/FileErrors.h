#pragma once

#include "Foundation/NetError.h"

namespace Foundation {

/// Codes of the domain `kPFURL` for the work on files that URLs name.
namespace FileURLError {
inline constexpr std::int32_t kUnknown = -10;
inline constexpr std::int32_t kNotLocal = -11;  ///< the URL is not that of a local file
inline constexpr std::int32_t kNotFound = -12;
inline constexpr std::int32_t kNoAccess = -13;
}  // namespace FileURLError

/// The error of work on a file that ended with `number`, an `errno`: `kNotFound` or `kNoAccess`
/// where it is one of these, and else what it is in the domain `kPOSIX`. `None` for 0.
NetError fileError(int number);

}  // namespace Foundation
