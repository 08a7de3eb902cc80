#include "Support/LoopWatch.h"

#include <glib.h>
#include <time.h>

#include <algorithm>
#include <fstream>

namespace Support {

namespace {

LoopWatch* sWatch = nullptr;

/// The time of this thread: what passes, but not while it could run and was not let.
double ownTime() {
    timespec now{};
    clock_gettime(CLOCK_MONOTONIC, &now);
    double running = 0;
    double waiting = 0;  // for a processor
    std::ifstream("/proc/thread-self/schedstat") >> running >> waiting;
    return static_cast<double>(now.tv_sec) + (static_cast<double>(now.tv_nsec) - waiting) * 1e-9;
}

}  // namespace

LoopWatch::LoopWatch() {
    sWatch = this;
    g_main_context_set_poll_func(nullptr, wait);
}

LoopWatch::~LoopWatch() {
    g_main_context_set_poll_func(nullptr, nullptr);
    sWatch = nullptr;
}

int LoopWatch::wait(_GPollFD* fds, unsigned count, int timeout) {
    LoopWatch& self = *sWatch;
    if (self.mReturned > 0) self.mLongest = std::max(self.mLongest, ownTime() - self.mReturned);
    const int result = g_poll(fds, count, timeout);
    self.mReturned = ownTime();
    return result;
}

}  // namespace Support
