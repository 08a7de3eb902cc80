#include "Foundation/DateParser.h"
#include "Fuzz/FuzzTarget.h"
#include "Support/ManualClock.h"

#include <string>

using namespace Foundation;

namespace {

/// What holds for every date that was read. Of the other parts nothing does: a number that passes
/// 32 bits may wrap to one below 0, which only the month and the year refuse.
void checkParts(const GregorianDate& date, std::uint32_t mask, const char* zone) {
    require(mask < 64);
    require(!(mask & kDatePartMonth) || (date.month >= 1 && date.month <= 12));
    require(!(mask & kDatePartYear) || (date.year >= 0 && date.year <= 2200));
    require(zone[255] == '\0');
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const unsigned char* bytes, std::size_t size) {
    static Support::ManualClock sClock;  // so that an input always does the same
    const std::string text(reinterpret_cast<const char*>(bytes), size);

    GregorianDate date;
    std::uint32_t mask = 0;
    char zoneName[256];
    std::int32_t offset = 0;
    const int result = parsedatelite(text.c_str(), date, mask, zoneName, sizeof zoneName, offset);
    if (result) checkParts(date, mask, zoneName);

    Ref<Date> parsed;
    Ref<TimeZone> zone;
    require(parseDateText(text.c_str(), parsed, zone) == (result == 1));
    require(result == 1 || (!parsed && !zone));
    return 0;
}
