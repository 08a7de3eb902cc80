#pragma once

#include <string>

namespace Orvane {

/// Where a downloaded file comes from. Empty fields are unknown.
struct FileOrigin {
    std::string url;        ///< of its content
    std::string referrer;   ///< of the page that led to it
    std::string publisher;  ///< that page's title
    std::string creator;    ///< who sent it
};

struct Quarantine {
    /// Marks a file as downloaded: sets the extended attributes "user.xdg.origin.url",
    /// "user.xdg.referrer.url", "user.xdg.publisher" and "user.xdg.creator" that freedesktop.org
    /// has agreed on, and removes those for which there is no value. Gives 0 or the first `errno`
    /// of what failed; a file system without attributes is no failure.
    [[nodiscard]] static int mark(const std::string& path, const FileOrigin& origin);
};

}  // namespace Orvane
