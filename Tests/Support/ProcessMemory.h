#pragma once

#include <cstddef>

namespace Support {

/// The memory of this process that is in use, in bytes.
struct ProcessMemory {
    static std::size_t now();
    /// The most that was in use since `forgetPeak`.
    static std::size_t peak();
    static void forgetPeak();
};

}  // namespace Support
