#include "Foundation/AbstractTimer.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Clock.h"
#include "Foundation/Date.h"
#include "Foundation/Logger.h"
#include "Foundation/RunLoop.h"

#include <cmath>
#include <limits>

namespace Foundation {

AbstractTimer::~AbstractTimer() {
    if (mTimer) mTimer->invalidate();
}

void AbstractTimer::start(double fireTime, double repeatInterval) {
    stop();
    // A loop keeps its timers in the order of their dates, in which NaN has no place.
    if (!std::isnan(fireTime) && !std::isnan(repeatInterval)) {
        mTimer = Returner<RunLoopTimer>::adopted(
            new RunLoopTimer(fireTime, repeatInterval, [this] { callbackFunction(this); }));
    }
    OV_ASSERT_AS(mTimer, "mTimer");
    RunLoop::current().addTimer(mTimer, RunLoop::kCommonModes);
}

void AbstractTimer::start(double interval, bool repeats) {
    OV_ASSERT_AS(!repeats || interval > 0.0001, "!repeats || interval>0.0001");
    start(Clock::current().now() + interval, repeats ? interval : 0.0);
}

void AbstractTimer::start(const Date* date) {
    if (date) {
        start(date->getAbsoluteTime(), 0.0);
    } else {
        stop();
    }
}

void AbstractTimer::stop() {
    if (!mTimer) return;
    mTimer->invalidate();
    // Released at once, as there may be no pool; a loop that is calling the timer holds it.
    mTimer = Returner<RunLoopTimer>();
}

double AbstractTimer::getTimeRemaining() const {
    constexpr double kNever = std::numeric_limits<double>::infinity();
    if (!mTimer || !mTimer->isValid()) return kNever;
    const double next = mTimer->getNextFireDate();
    return next > 0 ? next - Clock::current().now() : kNever;
}

void AbstractTimer::callbackFunction(AbstractTimer* timer) {
    // The pool ends after a timer that deletes itself, whose target may need one.
    AutoreleasePool pool;
    timer->_fire();
}

void AbstractTimer::_fire() {
    // Cleared first, so that `fire` may arm the timer anew.
    if (mTimer && !mTimer->isValid()) mTimer = Returner<RunLoopTimer>();
    // Once `fire` has been called there may be no timer left to ask.
    const bool deleteAfterFire = mDeleteAfterFire;
    try {
        fire();
    } catch (...) {
        warnAboutCurrentException("void Foundation::AbstractTimer::_fire()");
    }
    if (deleteAfterFire) delete this;
}

}  // namespace Foundation
