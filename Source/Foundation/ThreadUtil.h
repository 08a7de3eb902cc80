#pragma once

#include <cstdint>

namespace Foundation {

/// Names a running thread. Never 0, and not shared by two threads that run at the same time.
using ThreadID = std::uintptr_t;

struct ThreadUtil {
    /// The calling thread's identifier.
    static ThreadID IDCurrent();
};

}  // namespace Foundation
