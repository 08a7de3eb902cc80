#pragma once

#include <string>

namespace Orvane {

/// Icons of file types, from the desktop's icon themes.
struct FileIcons {
    /// The path of the icon for a MIME type or, where that is empty or unknown, for a file name or
    /// bare extension. Empty if no theme has one.
    static std::string find(const std::string& mimeType, const std::string& name);
};

}  // namespace Orvane
