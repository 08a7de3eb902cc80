#pragma once

namespace Foundation {

class Date;

/// What to believe of dates on a machine whose clock may be wrong: one without a battery starts
/// years ago, and one that somebody had set wrong has left dates of the future in the files.
struct ClockTrust {
    /// How far in the future a stored date may be. Dates of another zone's day are no mistake.
    static constexpr double kToleranceSeconds = 86400.0;

    /// Whether a time that was stored as one of the past is further in the future than that. It
    /// says nothing then, and counts as none.
    static bool isFromWrongClock(double storedTime);
    /// The same for a date; null is none anyway.
    static bool isFromWrongClock(const Date* stored);

    /// Whether it is earlier now than the day on which this was built, which cannot be.
    static bool isClockBehindBuild();
    /// The beginning of that day in GMT, in seconds since 2001.
    static double getBuildDate();
    /// Replaces it, for tests of other times than the present.
    static void setBuildDate(double date);
};

}  // namespace Foundation
