#pragma once

#include "Foundation/GregorianDate.h"

namespace Support {

/// The absolute time of a date and a time of day in GMT.
inline double inGMT(int year, int month, int day, int hour = 0, int minute = 0, double second = 0) {
    Foundation::GregorianDate d;
    d.year = year;
    d.month = static_cast<std::int8_t>(month);
    d.day = static_cast<std::int8_t>(day);
    d.hour = static_cast<std::int8_t>(hour);
    d.minute = static_cast<std::int8_t>(minute);
    d.second = second;
    return d.getAbsoluteTimeInGMT();
}

}  // namespace Support
