#pragma once

#include "Foundation/Clock.h"

namespace Support {

/// A clock that a test drives by hand. It is the clock of the process while it lives.
class ManualClock : public Foundation::Clock {
 public:
    /// 2026-01-01 00:00:00 GMT, a time like any other.
    static constexpr double kStart = 788918400.0;

    explicit ManualClock(double start = kStart);
    ~ManualClock() override;

    double now() const override { return mNow; }
    /// Moves on at once.
    void sleep(double seconds) override;
    bool runsByItself() const override { return false; }
    bool advanceIdle(double next) override;

    /// Moves to `date`, from one timer of the current run loop's default mode to the next: each
    /// fires at its own time, and what is ready is served in between.
    void advanceTo(double date);
    void advanceBy(double seconds) { advanceTo(mNow + seconds); }
    /// Moves at once, as when the machine slept or somebody set the clock: timers see it in the
    /// loop's next turn.
    void jumpTo(double date) { mNow = date; }
    /// Lets a blocking run that has nothing to do move on to what it waits for next.
    void setAdvancesWhenIdle(bool advances) { mAdvancesWhenIdle = advances; }
    /// How many seconds have been slept.
    double slept() const { return mSlept; }

 private:
    double mNow;
    double mSlept = 0;
    bool mAdvancesWhenIdle = false;
};

}  // namespace Support
