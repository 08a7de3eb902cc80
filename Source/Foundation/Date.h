#pragma once

#include "Foundation/PFRefCounted.h"
#include "Foundation/Returner.h"

namespace Foundation {

class Date;
using DateReturner = Returner<Date>;

/// A point in time: seconds since 2001-01-01 00:00:00 GMT. Immutable. That start itself is not a
/// date: 0.0 is how "none" is stored.
class Date : public PFRefCounted {
 public:
    /// The date of an absolute time. Null for 0.0, and for what is not a number.
    static DateReturner date(double absoluteTime);
    /// The time of the process's clock.
    static DateReturner now();
    /// `seconds` after now, before it if negative.
    static DateReturner nowPlus(double seconds);
    /// `seconds` after this date; null if that is the start of the count.
    DateReturner addTime(double seconds) const;

    /// Seconds from the date to now, negative for one to come. Null counts as 0.0, the start of the
    /// count.
    static double getTimeAgo(const Date* date);
    double getTimeAgo() const { return getTimeAgo(this); }

    double getAbsoluteTime() const { return mAbsoluteTime; }
    /// The same for a date that may be null, which is stored as 0.0.
    static double getAbsoluteTime(const Date* date) { return date ? date->mAbsoluteTime : 0.0; }

    /// -1, 0 or 1 as this date is before, at or after the other.
    int compare(const Date& other) const;

    std::size_t getHash() const override;
    bool isEqual(const PFRefCounted* other) const override;
    /// "2005-10-21 00:12:34 +0000", always in GMT.
    StringReturner toString() const override;

 private:
    explicit Date(double absoluteTime) : mAbsoluteTime(absoluteTime) {}

    double mAbsoluteTime;
};

}  // namespace Foundation
