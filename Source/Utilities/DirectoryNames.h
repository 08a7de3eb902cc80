#pragma once

#include "Foundation/UniqueFD.h"

#include <string>
#include <vector>

namespace Orvane {

struct DirectoryNames {
    /// Adds the names in a directory to `names`, but for "." and "..", in the file system's order.
    /// Takes the descriptor over. Gives 0 or an `errno`. Any thread.
    [[nodiscard]] static int read(Foundation::UniqueFD directory, std::vector<std::string>& names);
};

}  // namespace Orvane
