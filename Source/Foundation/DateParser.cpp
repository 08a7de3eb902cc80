#include "Foundation/DateParser.h"

#include "Foundation/Clock.h"
#include "Foundation/DateFormats.h"

#include <cstring>
#include <string_view>

namespace Foundation {

namespace {

constexpr std::size_t kMaxTextLength = 32768;
constexpr std::size_t kZoneNameSize = 256;

// Tokens that no format takes, so that a text with one need not be tried.
constexpr std::uint32_t kUselessTokens = DateTokens::bit(DateTokenClass::Unknown) |
                                         DateTokens::bit(DateTokenClass::SecondsUnit) |
                                         DateTokens::bit(DateTokenClass::MonthsUnit);

bool matchFormats(const DateTokens& tokens, DateParts& parts) {
    if (!tokens.isComplete() || (tokens.classes() & kUselessTokens) != 0) return false;
    for (const DateFormat& format : dateFormats()) {
        if (format.match(tokens, parts)) return true;
    }
    return false;
}

template <class Field>
void give(std::int32_t part, Field& field, DatePartMask bit, std::uint32_t& mask) {
    if (part == -1) return;
    field = static_cast<Field>(part);
    mask |= bit;
}

void giveParts(const DateParts& parts, GregorianDate& date, std::uint32_t& mask,
               std::int32_t& offset) {
    give(parts.year, date.year, kDatePartYear, mask);
    give(parts.month, date.month, kDatePartMonth, mask);
    give(parts.day, date.day, kDatePartDay, mask);
    give(parts.hour, date.hour, kDatePartHour, mask);
    give(parts.minute, date.minute, kDatePartMinute, mask);
    give(parts.second, date.second, kDatePartSecond, mask);
    // 12 is no special case: "12 AM" is noon and "12 PM" the end of the day. Deliberate.
    if (parts.hour != -1 && parts.meridian != -1) {
        date.hour = static_cast<std::int8_t>(date.hour + parts.meridian);
    }
    if (parts.offsetMinutes != -1) {
        offset = static_cast<std::int32_t>(static_cast<std::uint32_t>(parts.offsetMinutes) * 60u);
    }
}

/// Sets the zone that a text was in, and leaves it alone if the text tells none.
void chooseZone(std::uint32_t mask, const char* zoneName, std::int32_t offset,
                Ref<TimeZone>& timeZone) {
    if (offset != -1) {
        timeZone = TimeZone::fixedZone(offset);
    } else if (zoneName[0] == 'Z' || zoneName[0] == 'z') {
        timeZone = TimeZone::timeZone("GMT");
    } else if (zoneName[0] != '\0') {
        timeZone = TimeZone::timeZone(zoneName);
    } else if ((mask & kDatePartMonth) && (mask & kDatePartHour)) {
        timeZone = TimeZone::fixedZone(0);
    }
}

void fillFromNow(GregorianDate& date, std::uint32_t mask, const TimeZone* timeZone) {
    constexpr std::uint32_t kDay = kDatePartYear | kDatePartMonth | kDatePartDay;
    if ((mask & kDay) == kDay) return;
    const GregorianDate now = GregorianDate::inZone(Clock::current().now(), timeZone);
    if (!(mask & kDatePartYear)) date.year = now.year;
    if (!(mask & kDatePartMonth)) date.month = now.month;
    if (!(mask & kDatePartDay)) date.day = now.day;
}

}  // namespace

int parsedatelite(const char* text, GregorianDate& date, std::uint32_t& mask, char* zoneName,
                  std::size_t zoneNameSize, std::int32_t& offset) noexcept {
    date = GregorianDate();
    mask = 0;
    offset = -1;
    if (zoneNameSize > 0) std::memset(zoneName, 0, zoneNameSize);
    const std::string_view view = text ? text : "";
    if (view.size() > kMaxTextLength) return 0;
    DateTokens tokens;
    if (!tokens.read(view, zoneName, zoneNameSize)) return 0;
    DateParts parts;
    if (!matchFormats(tokens, parts)) return 0;
    giveParts(parts, date, mask, offset);
    return 1;
}

bool parseDateText(const char* text, Ref<Date>& date, Ref<TimeZone>& timeZone) {
    GregorianDate read;
    std::uint32_t mask = 0;
    char zoneName[kZoneNameSize];
    std::int32_t offset = -1;
    if (!parsedatelite(text, read, mask, zoneName, sizeof zoneName, offset)) {
        date = DateReturner();
        timeZone = TimeZoneReturner();
        return false;
    }
    chooseZone(mask, zoneName, offset, timeZone);
    fillFromNow(read, mask, timeZone);
    date = Date::date(read.getAbsoluteTimeInZone(timeZone));
    return true;
}

}  // namespace Foundation
