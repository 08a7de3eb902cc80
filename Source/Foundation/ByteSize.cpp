#include "Foundation/ByteSize.h"

#include "Foundation/Bundle.h"
#include "Foundation/CurrentLocale.h"
#include "Foundation/String.h"

#include <cmath>
#include <span>

namespace Foundation {

namespace {

/// The unit's keys for numbers with one whole digit, with two and with three.
struct Unit {
    const char* ones;
    const char* tens;
    const char* hundreds;
};

constexpr Unit kUnits[] = {
    {"%.1f KB (1.0)", "%.1f KB (10.0)", "%.0f KB"},
    {"%.1f MB (1.0)", "%.1f MB (10.0)", "%.0f MB"},
    {"%.1f GB (1.0)", "%.1f GB (10.0)", "%.0f GB"},
};
constexpr double kUnit = 1024;

/// `format` with `number`, whose decimal sign is the locale's.
std::string formatNumber(std::string_view format, double number) {
    const OVFormatArgument arguments[] = {number};
    const std::size_t start = format.find('%');
    if (start == std::string_view::npos) return std::string(format);
    const std::size_t end = OVFormatChecks::readConversion(format, start).end;
    std::string digits = OVFormatV(format.substr(start, end - start), arguments);
    if (const std::size_t sign = digits.find('.'); sign != std::string::npos) {
        digits.replace(sign, 1, currentDecimalSign());
    }
    return std::string(format.substr(0, start)) + digits + OVFormatV(format.substr(end), {});
}

}  // namespace

// The limits are where a number would round up to one more digit than its format has room for.
ByteSize ByteSize::of(long long count) {
    const double bytes = std::fabs(static_cast<double>(count));
    if (bytes == 0) return {"0 bytes", 0};
    if (bytes == 1) return {"1 byte", 1};
    if (bytes < 100) return {"%.0f bytes", bytes};
    double number = bytes / kUnit;
    if (bytes < 1000) return {"%.1f KB (0.1)", number};
    for (const Unit& unit : kUnits) {
        if (number < 9.95) return {unit.ones, number};
        if (number < 99.95) return {unit.tens, number};
        if (number < 999.5) return {unit.hundreds, number};
        number /= kUnit;
    }
    return {kUnits[2].hundreds, number * kUnit};
}

StringReturner String::representationForBytes(long long count) {
    const ByteSize size = ByteSize::of(count);
    return string(formatNumber(localizedText(size.key), size.number));
}

}  // namespace Foundation
