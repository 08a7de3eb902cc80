#pragma once

#include <string>

namespace Orvane {

struct Trash {
    /// Moves a file or directory to the desktop's trash. Where that cannot take it, it is renamed
    /// in place to the first free name of "<name>.aside.1", "<name>.aside.2" and so on; it is never
    /// deleted. Gives 0 or the `errno` of that rename.
    [[nodiscard]] static int moveAway(const std::string& path);
};

}  // namespace Orvane
