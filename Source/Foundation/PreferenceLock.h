#pragma once

#include "Foundation/UniqueFD.h"

#include <string>

namespace Foundation {

/// Keeps all other processes that write preferences out of a folder while it lives.
///
/// Another process holds the lock for the time of one read and one write. As one that is stopped
/// in the middle must not stop this one too, the wait ends after 2 seconds.
class PreferenceLock {
 public:
    static constexpr double kPatienceSeconds = 2.0;

    /// Makes the folder where it is missing, with mode 0700, and waits for the lock.
    explicit PreferenceLock(const std::string& folder);

    /// 0 if the lock is held, else the `errno` of why it is not: `EWOULDBLOCK` if another process
    /// did not let it go in time.
    int getError() const { return mError; }

 private:
    int acquire(const std::string& folder);
    int waitForLock() const;

    UniqueFD mFD;  ///< closing it gives the lock up
    int mError;
};

}  // namespace Foundation
