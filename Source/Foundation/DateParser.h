#pragma once

#include "Foundation/Date.h"
#include "Foundation/GregorianDate.h"
#include "Foundation/Ref.h"
#include "Foundation/TimeZone.h"

#include <cstddef>
#include <cstdint>

namespace Foundation {

/// The bits of a mask that tells which parts of a date a text gave.
enum DatePartMask : std::uint32_t {
    kDatePartYear = 1,
    kDatePartMonth = 2,
    kDatePartDay = 4,
    kDatePartHour = 8,
    kDatePartMinute = 16,
    kDatePartSecond = 32,
};

/// Reads a date as people write them: RFC 822, ISO 8601 and local customs, with or without weekday,
/// year and zone.
///
/// 1 if a format fits the whole text, otherwise 0. Only the parts whose bits are in `mask` were in
/// the text; the others are 0. `hour` may be 24, since "12 PM" is read as 12 hours after 12.
/// `zoneName` gets the last name of a zone in the text, cut to `zoneNameSize` bytes with their
/// final zero and filled up with zeros; `offset` the seconds east of GMT, -1 for none.
///
/// Never throws and takes nothing from the heap. A text of more than 32768 bytes is none.
int parsedatelite(const char* text, GregorianDate& date, std::uint32_t& mask, char* zoneName,
                  std::size_t zoneNameSize, std::int32_t& offset) noexcept;

/// Reads a date as `parsedatelite` does, fills what the text left out from the current time, with
/// midnight for the time of day, and replaces both holders. False, with both null, if the text is
/// no date. The start of the count is one, but is null as a `Date`.
///
/// `timeZone` becomes the text's zone. It is null for a name that nobody knows, and then the date
/// is read in the default zone. A text with a month and an hour but no zone is in GMT; one with
/// neither zone nor hour leaves the holder's zone as it was, and is read in that.
bool parseDateText(const char* text, Ref<Date>& date, Ref<TimeZone>& timeZone);

}  // namespace Foundation
