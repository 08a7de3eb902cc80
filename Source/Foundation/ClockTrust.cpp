#include "Foundation/ClockTrust.h"

#include "Foundation/Clock.h"
#include "Foundation/Date.h"

namespace Foundation {

namespace {

// The build gives the day in seconds since 1970.
double sBuildDate = ORVANE_BUILD_DAY - kUnixEpochOffset;

}  // namespace

bool ClockTrust::isFromWrongClock(double storedTime) {
    return storedTime > Clock::current().now() + kToleranceSeconds;
}

bool ClockTrust::isFromWrongClock(const Date* stored) {
    return stored && isFromWrongClock(stored->getAbsoluteTime());
}

bool ClockTrust::isClockBehindBuild() {
    return Clock::current().now() < sBuildDate;
}

double ClockTrust::getBuildDate() {
    return sBuildDate;
}

void ClockTrust::setBuildDate(double date) {
    sBuildDate = date;
}

}  // namespace Foundation
