#include "Foundation/PropertyListScalars.h"

#include "Foundation/FormatObjects.h"
#include "Foundation/GregorianDate.h"
#include "Foundation/PropertyListError.h"

#include <Orvane/OVFormat.h>

#include <fmt/format.h>
#include <charconv>
#include <cmath>

namespace Foundation {

namespace {

[[noreturn]] void refuse(const char* what, std::string_view text) {
    throw PropertyListError(OVFormat("not %s: \"%s\"", what, text.substr(0, 50)));
}

/// Reads all of `text` as a number; what `from_chars` takes between text and number is `options`.
template <class T, class... Options>
bool readAll(std::string_view text, T& value, Options... options) {
    const char* end = text.data() + text.size();
    const auto result = std::from_chars(text.data(), end, value, options...);
    return result.ec == std::errc() && result.ptr == end;
}

/// `from_chars` takes no "+".
std::string_view withoutPlus(std::string_view text) {
    const bool isMinusNext = text.size() > 1 && text[1] == '-';
    return text.starts_with('+') && !isMinusNext ? text.substr(1) : text;
}

/// The number of the digits at `start` of a date.
template <class T>
bool readField(std::string_view text, std::size_t start, std::size_t length, T& field, int least,
               int most) {
    unsigned value = 0;
    if (!readAll(text.substr(start, length), value)) return false;
    field = static_cast<T>(value);
    return static_cast<int>(value) >= least && static_cast<int>(value) <= most;
}

bool hasDateShape(std::string_view text) {
    constexpr std::string_view kShape = "0000-00-00T00:00:00Z";
    if (text.size() != kShape.size()) return false;
    for (std::size_t i = 0; i < text.size(); ++i) {
        if (kShape[i] != '0' && kShape[i] != text[i]) return false;
    }
    return true;
}

}  // namespace

std::string_view PropertyListScalars::trim(std::string_view text) {
    constexpr std::string_view kSpace = " \t\r\n";
    const std::size_t start = text.find_first_not_of(kSpace);
    if (start == std::string_view::npos) return {};
    return text.substr(start, text.find_last_not_of(kSpace) - start + 1);
}

std::int64_t PropertyListScalars::readInteger(std::string_view text) {
    std::string digits(withoutPlus(trim(text)));
    const std::size_t sign = digits.starts_with('-') ? 1 : 0;
    const bool isHexadecimal =
        digits.compare(sign, 2, "0x") == 0 || digits.compare(sign, 2, "0X") == 0;
    if (isHexadecimal) digits.erase(sign, 2);
    std::int64_t value = 0;
    const bool isDoublySigned = digits.compare(sign, 1, "-") == 0;
    if (isDoublySigned || !readAll(digits, value, isHexadecimal ? 16 : 10)) {
        refuse("an integer of 64 bits", text);
    }
    return value;
}

double PropertyListScalars::readReal(std::string_view text) {
    double value = 0;
    if (!readAll(withoutPlus(trim(text)), value)) refuse("a real number", text);
    return value;
}

DateReturner PropertyListScalars::readDate(std::string_view text) {
    const std::string_view fields = trim(text);
    GregorianDate date;
    const bool isDate = hasDateShape(fields) && readField(fields, 0, 4, date.year, 1, 9999) &&
                        readField(fields, 5, 2, date.month, 1, 12) &&
                        readField(fields, 8, 2, date.day, 1, 31) &&
                        readField(fields, 11, 2, date.hour, 0, 23) &&
                        readField(fields, 14, 2, date.minute, 0, 59) &&
                        readField(fields, 17, 2, date.second, 0, 60);
    if (!isDate) refuse("a date", text);
    return Date::date(date.getAbsoluteTimeInGMT());
}

std::string PropertyListScalars::writeReal(double value) {
    if (std::isnan(value)) return "nan";
    if (std::isinf(value)) return value < 0 ? "-infinity" : "+infinity";
    return fmt::format("{}", value);
}

std::string PropertyListScalars::writeDate(const Date& date) {
    const GregorianDate d = GregorianDate::inGMT(date.getAbsoluteTime());
    if (d.year < 1 || d.year > 9999) {
        throw PropertyListError(OVFormat("the date %@ is out of range", &date));
    }
    return OVFormat("%04d-%02d-%02dT%02d:%02d:%02dZ", d.year, d.month, d.day, d.hour, d.minute,
                    static_cast<int>(d.second));
}

}  // namespace Foundation
