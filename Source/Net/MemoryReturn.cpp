#include "Net/MemoryReturn.h"

#include "Foundation/RunLoop.h"

#include <malloc.h>

namespace Orvane {

namespace {

/// From here on a block is a mapping of its own, which goes back as soon as it is free.
constexpr int kMappedBytes = 1 << 20;
/// So much may lie free at the heap's end: two documents of the size that is heap's at most.
constexpr int kKeptBytes = 4 << 20;

}  // namespace

void MemoryReturn::soon(std::size_t bytes) {
    if (bytes < kWorthwhileBytes) return;
    Foundation::RunLoop::current().perform([] { malloc_trim(0); });
}

void MemoryReturn::keepRoomForDocuments() {
    mallopt(M_MMAP_THRESHOLD, kMappedBytes);
    mallopt(M_TRIM_THRESHOLD, kKeptBytes);
}

}  // namespace Orvane
