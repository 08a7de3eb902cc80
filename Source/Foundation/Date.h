#pragma once

#include "Foundation/PFRefCounted.h"
#include "Foundation/Returner.h"

namespace Foundation {

class Date;
class DateFormatter;
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

    /// The date that a text says, see `parseDateText`, whatever zone it is in. Null, with a
    /// warning, if it says none.
    static DateReturner parseDate(const String* text);

    /// The text by a formatter; null for none. In that of `getAtomFormat`, and of no other, the
    /// zone gets the colon that RFC 3339 asks for.
    StringReturner toStringUsingFormat(DateFormatter* formatter) const;
    /// "2005-10-21T00:12:34.000+0000", in the default time zone.
    static DateFormatter* getAtomFormat();
    /// "Fri, 21 Oct 2005 24:12:34 GMT": hours count from 1 to 24.
    static DateFormatter* getHTTPFormat();
    /// The short date and the long time in the current locale; null for null.
    static StringReturner dateToString(const Date* date);
    /// A text for people, which says no more of the day than is needed: the nearer, the shorter.
    /// The days before today count within the year only, so that on 1 January the day before is
    /// one of another year. A day to come is one of this year or another.
    StringReturner getLocalizedRelativeString() const;

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
