#include "Foundation/TimeZone.h"

#include "Foundation/Data.h"
#include "Foundation/ICUTime.h"
#include "Foundation/Ref.h"
#include "Foundation/String.h"
#include "Foundation/TimeZoneNames.h"

#include <unicode/basictz.h>
#include <unicode/timezone.h>

#include <algorithm>
#include <array>
#include <functional>
#include <iterator>
#include <map>

namespace Foundation {

namespace {

// The length of the longest identifier of the zone database is below half of this.
constexpr std::size_t kMaxNameLength = 64;

std::string idOf(const icu::TimeZone& zone) {
    icu::UnicodeString id;
    std::string utf8;
    return zone.getID(id).toUTF8String(utf8);
}

/// Whether the identifier stands for GMT itself.
bool isGMT(std::string_view id) {
    if (id.starts_with("Etc/")) id.remove_prefix(4);
    constexpr std::string_view kNames[] = {"GMT", "GMT0", "GMT+0",     "GMT-0", "Greenwich",
                                           "UCT", "UTC",  "Universal", "Zulu"};
    return std::find(std::begin(kNames), std::end(kNames), id) != std::end(kNames);
}

/// The process's default zone; null until it is asked for.
Ref<TimeZone>& heldDefaultZone() {
    static Ref<TimeZone> sDefaultZone;
    return sDefaultZone;
}

}  // namespace

struct TimeZone::Rules {
    std::unique_ptr<icu::TimeZone> zone;

    std::int32_t secondsAt(double absoluteTime) const;
    std::int32_t secondsAtLocal(double localTime) const;
};

std::int32_t TimeZone::Rules::secondsAt(double absoluteTime) const {
    std::int32_t raw = 0;
    std::int32_t daylight = 0;
    UErrorCode status = U_ZERO_ERROR;
    zone->getOffset(toICUTime(absoluteTime), false, raw, daylight, status);
    return U_SUCCESS(status) ? (raw + daylight) / 1000 : 0;
}

std::int32_t TimeZone::Rules::secondsAtLocal(double localTime) const {
    std::int32_t raw = 0;
    std::int32_t daylight = 0;
    UErrorCode status = U_ZERO_ERROR;
    // Every zone that ICU makes is a basic one.
    static_cast<const icu::BasicTimeZone&>(*zone).getOffsetFromLocal(
        toICUTime(localTime), UCAL_TZ_LOCAL_FORMER, UCAL_TZ_LOCAL_FORMER, raw, daylight, status);
    return U_SUCCESS(status) ? (raw + daylight) / 1000 : 0;
}

TimeZone::TimeZone(std::int32_t secondsFromGMT)
    : mName(nameOfGMTOffset(secondsFromGMT)), mSecondsFromGMT(secondsFromGMT) {}

TimeZone::TimeZone(std::string name, std::unique_ptr<const Rules> rules)
    : mName(std::move(name)), mRules(std::move(rules)) {}

TimeZone::~TimeZone() = default;

TimeZoneReturner TimeZone::fixedZone(std::int32_t secondsFromGMT) {
    // The distances that people use are quarters of an hour, and come again and again. Others come
    // from feeds as they like, and are not kept.
    constexpr std::int32_t kStep = 900;
    constexpr std::int32_t kMostSteps = 18 * 4;
    const std::int32_t steps = secondsFromGMT / kStep;
    if (secondsFromGMT % kStep != 0 || steps < -kMostSteps || steps > kMostSteps) {
        return TimeZoneReturner(new TimeZone(secondsFromGMT));
    }
    // Never destroyed, as what ends with the process may still use them.
    static auto& sZones = *new std::array<Ref<TimeZone>, 2 * kMostSteps + 1>;
    const std::int32_t place = steps + kMostSteps;
    Ref<TimeZone>& zone = sZones[static_cast<std::size_t>(place)];
    if (!zone) zone = TimeZoneReturner(new TimeZone(secondsFromGMT));
    return TimeZoneReturner(zone);
}

TimeZoneReturner TimeZone::timeZone(std::string_view name) {
    if (const auto offset = readGMTOffset(name)) return fixedZone(*offset);
    if (const auto offset = findZoneAbbreviation(name)) return fixedZone(*offset);
    const std::string_view placeOfRules = findZoneOfRules(name);
    return place(placeOfRules.empty() ? name : placeOfRules);
}

TimeZoneReturner TimeZone::timeZone(const String* name) {
    return name ? timeZone(name->view()) : nullptr;
}

TimeZoneReturner TimeZone::timeZoneWithData(const Data* data) {
    return data ? timeZoneWithData(data->view()) : nullptr;
}

TimeZoneReturner TimeZone::timeZoneWithData(std::string_view data) {
    // No abbreviations: a default zone may be called "CET" and have that place's rules.
    if (const auto offset = readGMTOffset(data)) return fixedZone(*offset);
    return place(data);
}

DataReturner TimeZone::getData() const {
    return Data::adopt(mName);
}

TimeZoneReturner TimeZone::place(std::string_view name) {
    // Whatever begins so and reads as a distance was one before; ICU's own idea of the rest is not
    // wanted.
    if (name.empty() || name.size() > kMaxNameLength || name.starts_with("GMT")) return nullptr;
    if (isGMT(name)) return fixedZone(0);
    static std::map<std::string, Ref<TimeZone>, std::less<>> sPlaces;
    if (const auto known = sPlaces.find(name); known != sPlaces.end()) {
        return TimeZoneReturner(known->second);
    }
    const auto length = static_cast<std::int32_t>(name.size());
    auto rules = std::make_unique<Rules>();
    rules->zone.reset(
        icu::TimeZone::createTimeZone(icu::UnicodeString::fromUTF8({name.data(), length})));
    // For what it does not know ICU gives a zone of another identifier.
    if (!rules->zone || idOf(*rules->zone) != name || name == UCAL_UNKNOWN_ZONE_ID) return nullptr;
    const Ref<TimeZone> zone = TimeZoneReturner(new TimeZone(std::string(name), std::move(rules)));
    sPlaces.emplace(name, zone);
    return TimeZoneReturner(zone);
}

TimeZoneReturner TimeZone::readDefaultZone() {
    auto rules = std::make_unique<Rules>();
    rules->zone.reset(icu::TimeZone::createDefault());
    if (!rules->zone) return fixedZone(0);
    std::string id = idOf(*rules->zone);
    if (isGMT(id) || id == UCAL_UNKNOWN_ZONE_ID) return fixedZone(0);
    if (const auto offset = readGMTOffset(id)) return fixedZone(*offset);
    return TimeZoneReturner(new TimeZone(std::move(id), std::move(rules)));
}

TimeZone* TimeZone::defaultZone() {
    Ref<TimeZone>& zone = heldDefaultZone();
    if (!zone) zone = readDefaultZone();
    return zone;
}

void TimeZone::resetDefaultZone() {
    icu::TimeZone::adoptDefault(icu::TimeZone::detectHostTimeZone());
    heldDefaultZone() = TimeZoneReturner();
}

std::int32_t TimeZone::getSecondsFromGMT(double absoluteTime) const {
    return mRules ? mRules->secondsAt(absoluteTime) : mSecondsFromGMT;
}

double TimeZone::getAbsoluteTime(double localTime) const {
    return localTime - (mRules ? mRules->secondsAtLocal(localTime) : mSecondsFromGMT);
}

std::size_t TimeZone::getHash() const {
    return std::hash<std::string>()(mName);
}

bool TimeZone::isEqual(const PFRefCounted* other) const {
    const auto* zone = dynamic_cast<const TimeZone*>(other);
    return zone && zone->mName == mName;
}

StringReturner TimeZone::toString() const {
    return String::string(mName);
}

}  // namespace Foundation
