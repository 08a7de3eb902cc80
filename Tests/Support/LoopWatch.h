#pragma once

struct _GPollFD;

namespace Support {

/// Measures, while it lives, how long the loop of this thread is kept from turning: the longest
/// time between two of its waits, less what the machine gave to other programs in between.
class LoopWatch {
 public:
    LoopWatch();
    ~LoopWatch();
    LoopWatch(const LoopWatch&) = delete;
    LoopWatch& operator=(const LoopWatch&) = delete;

    double getLongestSeconds() const { return mLongest; }

 private:
    static int wait(_GPollFD* fds, unsigned count, int timeout);

    double mReturned = 0;  ///< when the last wait ended; 0 before the first
    double mLongest = 0;
};

}  // namespace Support
