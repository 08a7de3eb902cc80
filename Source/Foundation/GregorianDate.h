#pragma once

#include <cstdint>

namespace Foundation {

class Date;
class TimeZone;
template <class T>
class Returner;

/// A date and a time of day in the Gregorian calendar, which is taken to hold for all years. The
/// year before 1 is 0.
struct GregorianDate {
    GregorianDate() = default;
    /// What an absolute time is in the default time zone.
    explicit GregorianDate(double absoluteTime) { setAbsoluteTime(absoluteTime); }
    /// The same for a date; null counts as 0.0.
    explicit GregorianDate(const Date* date);
    void setAbsoluteTime(double absoluteTime);
    /// The absolute time that this is in the default time zone; see `getAbsoluteTimeInGMT`.
    double getAbsoluteTime() const;
    /// The date that this is in the default time zone; null for the start of the count.
    Returner<Date> getDate() const;

    /// The same for a time zone, of which null is the default one.
    static GregorianDate inZone(double absoluteTime, const TimeZone* zone);
    double getAbsoluteTimeInZone(const TimeZone* zone) const;

    /// What an absolute time is in GMT. Times of years that do not fit are moved to the nearest
    /// year that does; what is not a number counts as 0.0.
    static GregorianDate inGMT(double absoluteTime);

    /// The absolute time that this is in GMT. Fields outside their ranges count on: hour 24 is the
    /// next day's midnight, month 13 the next January, day 0 the last of the month before.
    double getAbsoluteTimeInGMT() const;

    std::int32_t year = 0;
    std::int8_t month = 0;  ///< 1 to 12
    std::int8_t day = 0;    ///< 1 to 31
    std::int8_t hour = 0;
    std::int8_t minute = 0;
    double second = 0;
};

}  // namespace Foundation
