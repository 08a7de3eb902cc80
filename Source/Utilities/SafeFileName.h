#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace Orvane {

/// Names for files that somebody on the network has chosen.
struct SafeFileName {
    static constexpr std::size_t kMaxBytes = 255;  ///< of a name, in file systems

    /// What of a name, in UTF-8, can be the name of a plain file that is seen: its last component,
    /// with "/" and "\" as separators, without control characters, those that turn the direction of
    /// writing, and dots and blanks in front. A longer name than `maxBytes` loses the end of what
    /// stands before its extension, or its end. Empty if nothing is left.
    static std::string make(std::string_view name, std::size_t maxBytes = kMaxBytes);
};

}  // namespace Orvane
