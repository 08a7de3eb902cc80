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

    /// For a process that fetches one document after the other: the allocator keeps the room of one
    /// for the next. By itself it gives back everything above some 100 KiB at once, and the system
    /// clears each page anew, which costs more than all else that is done with a body. To be called
    /// once, early; for the whole process.
    static void keepRoomForDocuments();
};

}  // namespace Orvane
