#pragma once

#include "Foundation/RefCounted.h"

#include <cstdint>
#include <functional>

namespace Foundation {

class RunLoop;

/// A timer with an absolute fire date, on the clock of the process. Add it to a `RunLoop`, which
/// then holds it until it is invalid. Used on the loop's thread.
class RunLoopTimer : public RefCounted {
 public:
    using Callback = std::function<void()>;

    /// Fires at `fireDate`, in seconds since 2001, and then every `interval` seconds; an interval
    /// of 0 makes a one-shot. A repeating timer that comes late skips what it has missed.
    RunLoopTimer(double fireDate, double interval, Callback callback);
    ~RunLoopTimer() override;

    /// False once invalidated or, for a one-shot, from just before its callback is called.
    bool isValid() const { return mIsValid; }
    /// When it fires next. Meaningless once invalid.
    double getNextFireDate() const { return mFireDate; }
    bool repeats() const { return mInterval > 0; }

    /// Leaves its loop and never fires again.
    void invalidate();

 private:
    friend class RunLoop;

    /// Moves to the next date after `now`, or becomes invalid.
    void moveOn(double now);

    double mFireDate;
    double mInterval;
    Callback mCallback;
    RunLoop* mLoop = nullptr;
    std::uint64_t mSequence = 0;  ///< timers of one date fire in the order they were added
    bool mIsValid = true;
    bool mIsFiring = false;
};

}  // namespace Foundation
