#pragma once

#include <cstddef>

namespace Orvane {

/// Gives memory back to the system that large bodies leave behind, which the allocator would keep
/// for the next one.
struct MemoryReturn {
    static constexpr std::size_t kWorthwhileBytes = std::size_t{4} << 20;

    /// So much has been, or is about to be, given up in this turn of the current run loop: the
    /// next one gives it back. Does nothing for little.
    static void soon(std::size_t bytes);
};

}  // namespace Orvane
