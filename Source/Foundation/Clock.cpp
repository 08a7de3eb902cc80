#include "Foundation/Clock.h"

#include <cerrno>
#include <cmath>
#include <ctime>

namespace Foundation {

namespace {

constexpr double kLongest = 1e9;  // three decades: what the system's own types can hold

class SystemClock : public Clock {
 public:
    double now() const override {
        std::timespec t = {};
        clock_gettime(CLOCK_REALTIME, &t);
        return static_cast<double>(t.tv_sec) - kUnixEpochOffset +
               static_cast<double>(t.tv_nsec) * 1e-9;
    }

    void sleep(double seconds) override {
        if (!(seconds > 0)) return;
        seconds = std::fmin(seconds, kLongest);
        std::timespec left = {};
        left.tv_sec = static_cast<std::time_t>(seconds);
        left.tv_nsec = static_cast<long>((seconds - static_cast<double>(left.tv_sec)) * 1e9);
        while (clock_nanosleep(CLOCK_MONOTONIC, 0, &left, &left) == EINTR) {
        }
    }

    bool runsByItself() const override { return true; }
    bool advanceIdle(double) override { return false; }
};

Clock* sCurrent = nullptr;

}  // namespace

Clock& Clock::current() {
    // Never destroyed, as what ends with the process may still ask for the time.
    static auto* const sSystemClock = new SystemClock;
    return sCurrent ? *sCurrent : *sSystemClock;
}

void Clock::setCurrent(Clock* clock) {
    sCurrent = clock;
}

}  // namespace Foundation
