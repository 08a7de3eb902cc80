#pragma once

#include <string>

namespace Orvane {

/// Where the user's caches are: what can be lost without harm.
struct CacheDirectory {
    /// "orvane" in `$XDG_CACHE_HOME`, or else in ".cache" in the user's home (XDG Base Directory
    /// Specification 0.8, which leaves relative values out of account); made, with mode 0700, if it
    /// is missing. Empty, with a warning, if it cannot be had.
    static std::string path();
};

}  // namespace Orvane
