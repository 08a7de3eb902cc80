#include "Foundation/Logger.h"
#include "Support/EnvVar.h"
#include "Support/ManualClock.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <ctime>

using namespace Foundation;

namespace {

constexpr double kDate = 794293567.0;  // 2026-03-04 05:06:07 GMT

/// What the sink writes at the given time, without the process ID.
std::string written(double date, const Logger& logger, std::string_view text) {
    const Support::ManualClock clock(date);
    testing::internal::CaptureStderr();
    standardErrorSink().write(logger, text);
    std::string line = testing::internal::GetCapturedStderr();
    const std::string pid = ": " + std::to_string(getpid()) + " ";
    const std::size_t at = line.find(pid);
    EXPECT_NE(at, std::string::npos) << line;
    return at == std::string::npos ? line : line.replace(at, pid.size(), ": PID ");
}

}  // namespace

TEST(StandardErrorSink, WritesTimeProcessFacilityAndText) {
    EXPECT_EQ(written(kDate + 0.5, Orvane::gLogFeed, "text"),
              "03/04/26 05:06:07.500: PID [Feed] text\n");
    EXPECT_EQ(written(kDate, gWarn, "text"), "03/04/26 05:06:07.000: PID [WARNING] text\n");
}

TEST(StandardErrorSink, WritesNoNameForTheGeneralLog) {
    EXPECT_EQ(written(kDate, gLog, "[text]"), "03/04/26 05:06:07.000: PID [text]\n");
}

TEST(StandardErrorSink, WritesTheTextAsItStands) {
    EXPECT_EQ(written(kDate, gLog, "100%s\n\ttwo lines"),
              "03/04/26 05:06:07.000: PID 100%s\n\ttwo lines\n");
    EXPECT_EQ(written(kDate, gLog, ""), "03/04/26 05:06:07.000: PID \n");
}

TEST(StandardErrorSink, ShowsEveryMillisecond) {
    for (int i = 0; i < 1000; ++i) {
        char expected[32];
        std::snprintf(expected, sizeof expected, "03/04/26 05:06:07.%03d: ", i);
        ASSERT_EQ(written(kDate + i / 1000.0, gLog, "").substr(0, 23), expected);
    }
    EXPECT_EQ(written(kDate + 0.9996, gLog, ""), "03/04/26 05:06:07.999: PID \n");
}

TEST(StandardErrorSink, ShowsLocalTimeAndTwoDigitsOfTheYear) {
    {
        const Support::EnvVar zone("TZ", "EST5");
        tzset();
        EXPECT_EQ(written(kDate, gLog, ""), "03/04/26 00:06:07.000: PID \n");
    }
    tzset();
    EXPECT_EQ(written(-kDate, gLog, "").substr(0, 8), "10/31/75");
}
