#pragma once

#include <Orvane/OVBase.h>

#include <limits>

/// The run loop, for applications that have no toolkit which turns it: GLib's default main context,
/// from which delegates and observers are called. The thread of the library's objects.
class OVRunLoop {
 public:
    OVRunLoop() = delete;

    /// Turns the loop until `stop`, for so many seconds at most. Whether it was stopped. A time of
    /// 0 or less serves what is ready, and does not wait. Runs may nest.
    OV_EXPORT static bool run(double seconds = std::numeric_limits<double>::infinity());
    /// Ends the innermost run, once what calls this has returned. Outside of a run it does nothing:
    /// whoever waits for something looks first whether that has come already.
    OV_EXPORT static void stop();
};
