#pragma once

namespace Foundation {

/// Seconds from 1970-01-01 to 2001-01-01, the start of the system's own count.
inline constexpr double kUnixEpochOffset = 978307200.0;

/// The time behind timers, deadlines, sleeps and "now". Tests put one in that they drive by hand.
class Clock {
 public:
    virtual ~Clock() = default;

    /// Seconds since 2001-01-01 00:00:00 GMT.
    virtual double now() const = 0;
    /// Lets time pass: blocks the thread, or moves a clock that is driven by hand.
    virtual void sleep(double seconds) = 0;
    /// Whether `now` goes on by itself with the machine's time, so that waiting makes sense.
    virtual bool runsByItself() const = 0;
    /// A run loop has nothing to do before `next`. A clock that is driven by hand may move there
    /// and give true; false lets the loop wait for its descriptors.
    virtual bool advanceIdle(double next) = 0;

    /// The clock of the process.
    static Clock& current();
    /// Replaces it; null stands for the machine's clock. Main thread, with no loop running.
    static void setCurrent(Clock* clock);
};

}  // namespace Foundation
