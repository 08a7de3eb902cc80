#pragma once

#include <cstddef>

namespace Support {

/// The memory of this process that is in use, in bytes. 0 under the address sanitizer, which keeps
/// what is freed for a while.
struct ProcessMemory {
    static std::size_t now();
    /// The most that was in use since `forgetPeak`.
    static std::size_t peak();
    static void forgetPeak();
};

}  // namespace Support
