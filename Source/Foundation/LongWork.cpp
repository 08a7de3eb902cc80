#include "Foundation/LongWork.h"

#include "Foundation/Clock.h"
#include "Foundation/Logger.h"
#include "Foundation/URL.h"

#include <cmath>

namespace Foundation {

LongWork::LongWork(const char* what, URL* feed)
    : mWhat(what), mFeed(feed), mStart(Clock::current().now()) {}

LongWork::~LongWork() {
    const double seconds = Clock::current().now() - mStart;
    if (!(seconds > kSeconds)) return;
    const long milliseconds = std::lround(seconds * 1000);
    if (mFeed.get()) {
        gWarn.log("Long work on the run loop: %s of <%@> took %ld ms", mWhat, mFeed, milliseconds);
    } else {
        gWarn.log("Long work on the run loop: %s took %ld ms", mWhat, milliseconds);
    }
}

}  // namespace Foundation
