#pragma once

#include <cstddef>

namespace Support {

/// How often `operator new` was asked for memory so far, in a program that lists
/// AllocationCounter.cpp among its sources.
std::size_t allocations();

}  // namespace Support
