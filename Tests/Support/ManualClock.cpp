#include "Support/ManualClock.h"

#include "Foundation/RunLoop.h"

#include <cmath>

namespace Support {

using Foundation::RunLoop;

ManualClock::ManualClock(double start) : mNow(start) {
    setCurrent(this);
}

ManualClock::~ManualClock() {
    setCurrent(nullptr);
}

void ManualClock::sleep(double seconds) {
    mSlept += seconds;
    mNow += seconds;
}

bool ManualClock::advanceIdle(double next) {
    if (!mAdvancesWhenIdle || !std::isfinite(next)) return false;
    mNow = std::fmax(mNow, next);
    return true;
}

void ManualClock::advanceTo(double date) {
    RunLoop& loop = RunLoop::current();
    loop.turn();
    while (loop.getNextFireDate() <= date) {
        mNow = std::fmax(mNow, loop.getNextFireDate());
        loop.turn();
    }
    mNow = std::fmax(mNow, date);
    loop.turn();
}

}  // namespace Support
