#pragma once

#include "Foundation/UniqueFD.h"

namespace Orvane {

/// Keeps other agents from the storage as long as this lives: one that no bus knows of, or one that
/// is started while this one, which has given up its name already, still saves and closes. The
/// process's end ends it in any case. Main thread.
class AgentLock : Foundation::Uncopyable {
 public:
    static constexpr double kWaitSeconds = 20.0;
    static constexpr double kRetrySeconds = 0.02;

    /// Waits at most `seconds` for another agent's end. False if it goes on. Where nothing can be
    /// locked, because the storage cannot be made or its file system has no locks, there is nothing
    /// to wait for either; that is warned of.
    bool take(double seconds);

 private:
    Foundation::UniqueFD mFile;
};

}  // namespace Orvane
