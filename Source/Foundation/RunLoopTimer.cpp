#include "Foundation/RunLoopTimer.h"

#include "Foundation/Ref.h"
#include "Foundation/RunLoop.h"

#include <cmath>
#include <utility>

namespace Foundation {

RunLoopTimer::RunLoopTimer(double fireDate, double interval, Callback callback)
    : mFireDate(fireDate), mInterval(interval), mCallback(std::move(callback)) {}

RunLoopTimer::~RunLoopTimer() = default;

void RunLoopTimer::invalidate() {
    mIsValid = false;
    if (mLoop) mLoop->removeTimer(this);
}

void RunLoopTimer::moveOn(double now) {
    if (!repeats()) {
        mIsValid = false;
        return;
    }
    const double missed = std::floor((now - mFireDate) / mInterval);
    mFireDate += (std::fmax(missed, 0) + 1) * mInterval;
}

}  // namespace Foundation
