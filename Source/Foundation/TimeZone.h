#pragma once

#include "Foundation/PFRefCounted.h"
#include "Foundation/Returner.h"

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

namespace Foundation {

class TimeZone;
using TimeZoneReturner = Returner<TimeZone>;

/// A time zone: a fixed distance from GMT, or the rules of a place. Immutable.
///
/// Where clocks are put forward, a local time that is skipped counts as if they had not been yet,
/// so 02:30 is 03:30 of the new time. Where they are put back, a local time that comes twice is the
/// earlier one.
class TimeZone : public PFRefCounted {
 public:
    ~TimeZone() override;

    /// The zone of a name: an abbreviation ("EST", which is the same all year), a distance
    /// ("GMT+01:00") or a place of the zone database ("Europe/Berlin"). Null if nobody knows it.
    static TimeZoneReturner timeZone(std::string_view name);
    static TimeZoneReturner timeZone(const String* name);
    /// The zone that `getData` made the data of; null for null, and if it is not one of this
    /// machine.
    static TimeZoneReturner timeZoneWithData(const Data* data);
    static TimeZoneReturner timeZoneWithData(std::string_view data);
    /// The zone that is always `secondsFromGMT` ahead of GMT.
    static TimeZoneReturner fixedZone(std::int32_t secondsFromGMT);

    /// The zone of the process: that of the variable TZ, or else of the machine. It is looked up
    /// once.
    static TimeZone* defaultZone();
    /// Looks the default zone up anew, as after TZ or the machine's setting has changed. ICU keeps
    /// a default of its own, which this renews as well.
    static void resetDefaultZone();

    /// The zone's name, which `timeZone` understands.
    const std::string& getName() const { return mName; }
    /// The name's bytes, for stores.
    DataReturner getData() const;
    /// How far the zone is ahead of GMT at a time, in seconds.
    std::int32_t getSecondsFromGMT(double absoluteTime) const;
    /// The absolute time at which clocks in the zone show `localTime`, which counts seconds from
    /// their 2001-01-01 00:00:00.
    double getAbsoluteTime(double localTime) const;
    bool isFixed() const { return !mRules; }

    std::size_t getHash() const override;
    /// By name, or by distance for fixed zones.
    bool isEqual(const PFRefCounted* other) const override;
    /// The name.
    StringReturner toString() const override;

 private:
    struct Rules;

    explicit TimeZone(std::int32_t secondsFromGMT);
    TimeZone(std::string name, std::unique_ptr<const Rules> rules);

    static TimeZoneReturner place(std::string_view name);
    static TimeZoneReturner readDefaultZone();

    std::string mName;
    std::int32_t mSecondsFromGMT = 0;
    std::unique_ptr<const Rules> mRules;  ///< null for a fixed zone
};

}  // namespace Foundation
