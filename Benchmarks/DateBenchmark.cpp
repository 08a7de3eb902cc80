#include "Benchmarks/Measure.h"
#include "Foundation/DateParser.h"
#include "Foundation/Ref.h"

#include <cstdio>
#include <ctime>
#include <iterator>

/// How fast dates are read, beside `strptime`, which is given the two commonest formats and has no
/// zones of its own.

using namespace Benchmarks;
using namespace Foundation;

namespace {

constexpr int kRounds = 20000;

// In the proportions of real feeds: RFC 822 and ISO 8601 rule.
constexpr const char* kCommon[] = {
    "Sat, 07 Sep 2002 00:00:01 GMT", "Thu, 29 Dec 2005 14:19:19 +0000", "2003-12-13T18:30:02Z",
    "2005-10-20T16:05:30+01:00",     "Fri, 30 Dec 2005 14:19:19 -0500", "2006-01-04T13:53:35Z",
};
constexpr const char* kOdd[] = {
    "January 2nd, 2004, 3:04 pm EST",
    "1/2/2004 3:04 pm",
    "2.1.2004 15:04",
    "Mon (a comment) 5 Jan 2004",
    "d B Y is no date",
    "3:04:05pm, 31/12/2004",
    "2003-12-13",
    "1 2 3 4 5 6 7 8 9",
};

template <std::size_t N>
void parseAll(const char* const (&texts)[N]) {
    for (int i = 0; i < kRounds; ++i) {
        for (const char* text : texts) {
            GregorianDate date;
            std::uint32_t mask;
            char zone[256];
            std::int32_t offset;
            keep(parsedatelite(text, date, mask, zone, sizeof zone, offset));
        }
    }
}

template <std::size_t N>
void scanAll(const char* const (&texts)[N]) {
    for (int i = 0; i < kRounds; ++i) {
        for (const char* text : texts) {
            std::tm time = {};
            const char* end = strptime(text, "%a, %d %b %Y %H:%M:%S", &time);
            if (!end) end = strptime(text, "%Y-%m-%dT%H:%M:%S", &time);
            keep(end);
        }
    }
}

template <std::size_t N>
void makeAll(const char* const (&texts)[N]) {
    Ref<Date> date;
    Ref<TimeZone> zone;
    for (int i = 0; i < kRounds; ++i) {
        for (const char* text : texts)
            keep(parseDateText(text, date, zone));
    }
}

}  // namespace

int main() {
    constexpr double kCommonCount = double{kRounds} * std::size(kCommon);
    constexpr double kOddCount = double{kRounds} * std::size(kOdd);
    const Comparison common = compare([] { parseAll(kCommon); }, [] { scanAll(kCommon); });
    report("read a common date", common, kCommonCount, "strptime, two formats");
    report("read a common date and make it a Date",
           compare([] { makeAll(kCommon); }, [] { scanAll(kCommon); }), kCommonCount,
           "strptime, two formats");
    report("read an odd date", compare([] { parseAll(kOdd); }, [] { scanAll(kOdd); }), kOddCount,
           "strptime, which reads none");
    std::printf("dates %.2f\n", common.ratio());
}
