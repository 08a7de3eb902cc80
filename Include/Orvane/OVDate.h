#pragma once

#include <chrono>
#include <compare>

/// A point in time, as the database keeps it: seconds since 2001-01-01 00:00:00 GMT, with
/// fractions of microseconds. A plain value. Any thread.
class OVDate {
 public:
    /// A point in time of the standard library.
    using TimePoint = std::chrono::system_clock::time_point;

    /// REQUIRES: a number.
    constexpr explicit OVDate(double absoluteTime) : mAbsoluteTime(absoluteTime) {}
    OVDate(TimePoint time) : mAbsoluteTime(std::chrono::duration<double>(time - epoch()).count()) {}

    /// Seconds since the start of the count, exactly as they are kept.
    constexpr double absoluteTime() const { return mAbsoluteTime; }
    /// The same for the standard library, which counts in other steps.
    TimePoint timePoint() const {
        return epoch() + std::chrono::duration_cast<TimePoint::duration>(
                             std::chrono::duration<double>(mAbsoluteTime));
    }
    /// Seconds after this date, before it if negative.
    constexpr OVDate addingSeconds(double seconds) const { return OVDate(mAbsoluteTime + seconds); }

    /// By the time.
    constexpr bool operator==(const OVDate&) const = default;
    constexpr std::partial_ordering operator<=>(const OVDate&) const = default;

    /// 2001-01-01 00:00:00 GMT.
    static constexpr TimePoint epoch() { return TimePoint(std::chrono::seconds(978307200)); }

 private:
    double mAbsoluteTime;
};
