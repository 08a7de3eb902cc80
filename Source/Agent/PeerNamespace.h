#pragma once

#include <string>

namespace Orvane {

/// Whose files a caller's paths name.
struct PeerNamespace {
    /// Whether the process behind a unique name on the user's bus sees the file system as this one
    /// does: that it is in the same mount namespace. False if that cannot be found out.
    static bool sharesFiles(const std::string& peer);
};

}  // namespace Orvane
