#pragma once

#include "Foundation/RefCounted.h"
#include "Foundation/Returner.h"

#include <memory>
#include <string>

namespace Foundation {

class TimeZone;

/// Makes texts of dates by a pattern of ICU, in the Gregorian calendar for all years unless the
/// locale has another one.
class DateFormatter : public RefCounted {
 public:
    /// A format that is the same for everybody: in the locale "en_US_POSIX".
    static Returner<DateFormatter> fixed(const std::string& pattern);
    /// The same, in GMT.
    static Returner<DateFormatter> fixedInGMT(const std::string& pattern);
    /// A pattern for people: in `locale`, ICU's name of it.
    static Returner<DateFormatter> localized(const std::string& pattern, const std::string& locale);
    /// A locale's own short date and long time.
    static Returner<DateFormatter> shortDateLongTime(const std::string& locale);
    ~DateFormatter() override;

    /// The text of a time, in UTF-8, in the default time zone unless the formatter has one.
    std::string format(double absoluteTime);

 private:
    struct Format;

    DateFormatter(std::unique_ptr<Format> format, bool isInDefaultZone);
    static Returner<DateFormatter> make(const std::string& pattern, const std::string& locale,
                                        bool isInDefaultZone);

    std::unique_ptr<Format> mFormat;
};

}  // namespace Foundation
