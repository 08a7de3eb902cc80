#include "Foundation/DateFormatter.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/ICUTime.h"
#include "Foundation/Ref.h"
#include "Foundation/TimeZone.h"

#include <unicode/gregocal.h>
#include <unicode/smpdtfmt.h>

namespace Foundation {

namespace {

constexpr const char* kFixedLocale = "en_US_POSIX";

void require(bool condition, const std::string& pattern) {
    OV_ASSERT_MESSAGE(condition, "Bad date format '%s'", pattern);
}

/// ICU's calendar was the Julian one before 1582; feeds and stores know of no such thing.
void makeProleptic(icu::DateFormat& format) {
    const auto* shared = dynamic_cast<const icu::GregorianCalendar*>(format.getCalendar());
    if (!shared) return;
    std::unique_ptr<icu::GregorianCalendar> calendar(shared->clone());
    UErrorCode status = U_ZERO_ERROR;
    calendar->setGregorianChange(-8.64e15, status);
    if (U_SUCCESS(status)) format.adoptCalendar(calendar.release());
}

}  // namespace

struct DateFormatter::Format {
    std::unique_ptr<icu::DateFormat> format;
    bool isInDefaultZone = true;
    Ref<TimeZone> zone;  ///< the default zone that the format was last set to

    void followDefaultZone() {
        TimeZone* current = TimeZone::defaultZone();
        if (!isInDefaultZone || zone.get() == current) return;
        format->adoptTimeZone(icu::TimeZone::createDefault());
        zone = TimeZoneReturner::retained(current);
    }
};

DateFormatter::DateFormatter(std::unique_ptr<Format> format, bool isInDefaultZone)
    : mFormat(std::move(format)) {
    makeProleptic(*mFormat->format);
    mFormat->isInDefaultZone = isInDefaultZone;
    if (!isInDefaultZone) mFormat->format->setTimeZone(*icu::TimeZone::getGMT());
}

DateFormatter::~DateFormatter() = default;

Returner<DateFormatter> DateFormatter::make(const std::string& pattern, const std::string& locale,
                                            bool isInDefaultZone) {
    UErrorCode status = U_ZERO_ERROR;
    auto format = std::make_unique<Format>();
    format->format = std::make_unique<icu::SimpleDateFormat>(icu::UnicodeString::fromUTF8(pattern),
                                                             icu::Locale(locale.c_str()), status);
    require(U_SUCCESS(status), pattern);
    return Returner<DateFormatter>::adopted(new DateFormatter(std::move(format), isInDefaultZone));
}

Returner<DateFormatter> DateFormatter::fixed(const std::string& pattern) {
    return make(pattern, kFixedLocale, true);
}

Returner<DateFormatter> DateFormatter::fixedInGMT(const std::string& pattern) {
    return make(pattern, kFixedLocale, false);
}

Returner<DateFormatter> DateFormatter::localized(const std::string& pattern,
                                                 const std::string& locale) {
    return make(pattern, locale, true);
}

Returner<DateFormatter> DateFormatter::shortDateLongTime(const std::string& locale) {
    auto format = std::make_unique<Format>();
    format->format.reset(icu::DateFormat::createDateTimeInstance(
        icu::DateFormat::kShort, icu::DateFormat::kLong, icu::Locale(locale.c_str())));
    require(format->format != nullptr, locale);
    return Returner<DateFormatter>::adopted(new DateFormatter(std::move(format), true));
}

std::string DateFormatter::format(double absoluteTime) {
    mFormat->followDefaultZone();
    icu::UnicodeString text;
    std::string utf8;
    return mFormat->format->format(toICUTime(absoluteTime), text).toUTF8String(utf8);
}

}  // namespace Foundation
