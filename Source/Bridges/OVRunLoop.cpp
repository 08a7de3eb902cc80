#include <Orvane/OVRunLoop.h>

#include "Foundation/RunLoop.h"

#include <algorithm>

using Foundation::RunLoop;

bool OVRunLoop::run(double seconds) {
    const RunLoop::Result result =
        RunLoop::current().runInMode(RunLoop::kDefaultMode, std::max(seconds, 0.0), false);
    return result == RunLoop::Result::Stopped;
}

void OVRunLoop::stop() {
    RunLoop::current().stop();
}
