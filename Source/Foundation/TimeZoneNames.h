#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace Foundation {

/// The distance from GMT, in seconds, that an abbreviation of a zone in upper case stands for.
std::optional<std::int32_t> findZoneAbbreviation(std::string_view name) noexcept;

/// The place whose rules an abbreviation with two names stands for ("EST5EDT"); empty if none.
std::string_view findZoneOfRules(std::string_view name) noexcept;

/// Reads "GMT", and "GMT" with a distance: "GMT+1", "GMT+0130", "GMT-01:30", "GMT+01:30:15".
std::optional<std::int32_t> readGMTOffset(std::string_view name) noexcept;
/// The name that `readGMTOffset` reads: "GMT", "GMT+01:30", "GMT-01:30:15".
std::string nameOfGMTOffset(std::int32_t secondsFromGMT);

}  // namespace Foundation
