#pragma once

#include "Foundation/Ref.h"
#include "Foundation/RunLoopTimer.h"
#include "Foundation/Uncopyable.h"

namespace Foundation {

class Date;

/// A run-loop timer that calls its own `fire`. It can be armed again and again, also from inside
/// `fire`, and disarms itself when it is destroyed, which `fire` may do too.
///
/// Belongs to the run loop of the thread that arms it, and is used on that thread only. It is
/// served in every mode of the loop.
class AbstractTimer : Uncopyable {
 public:
    /// Disarms the timer.
    virtual ~AbstractTimer();

    /// What the timer is for. Called inside a pool; whatever it throws is reported and goes no
    /// further. A one-shot is disarmed by then.
    virtual void fire() = 0;

    /// Arms the timer for `fireTime`, in seconds since 2001, and then every `repeatInterval`
    /// seconds; 0 makes a one-shot. An armed timer is stopped first. Throws `AssertionFailure`
    /// for times that are no numbers.
    void start(double fireTime, double repeatInterval);
    /// Arms the timer for `interval` seconds from now, and if it `repeats` for every `interval`
    /// after. 0 fires in the loop's next turn. A repeating timer needs more than 0.0001 seconds
    /// and throws `AssertionFailure` for less.
    void start(double interval, bool repeats);
    /// Arms the timer as a one-shot for `date`; null stops it.
    void start(const Date* date);
    /// Disarms the timer, if it is armed.
    void stop();

    /// Whether the timer is armed.
    bool isRunning() const { return mTimer.get() != nullptr; }
    /// The seconds until the timer fires, which are negative for one that is late; infinity if it
    /// is not armed or its date is not after the beginning of 2001.
    double getTimeRemaining() const;

 protected:
    explicit AbstractTimer(bool deleteAfterFire = false) : mDeleteAfterFire(deleteAfterFire) {}

 private:
    static void callbackFunction(AbstractTimer* timer);
    void _fire();

    const bool mDeleteAfterFire;  ///< the timer owns itself and ends with its first fire
    Ref<RunLoopTimer> mTimer;     ///< null when not armed
};

}  // namespace Foundation
