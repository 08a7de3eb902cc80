#include "CommandLine/DateText.h"

#include "CommandLine/Failure.h"
#include "Support/EnvVar.h"

#include <gtest/gtest.h>

#include <ctime>

namespace Dates = Commands::DateText;
using Commands::Failure;

namespace {

OVDate at(const char* text) {
    return Dates::parse(text, OVDate(0));
}

class DateText : public testing::Test {
 protected:
    DateText() { tzset(); }
    ~DateText() override { tzset(); }

    Support::EnvVar mZone{"TZ", "UTC"};
    OVDate now = at("2026-11-21T12:00:00Z");
};

}  // namespace

TEST_F(DateText, IsISO8601ForPrograms) {
    EXPECT_EQ(Dates::iso8601(OVDate(0)), "2001-01-01T00:00:00Z");
    EXPECT_EQ(Dates::iso8601(OVDate(59.9)), "2001-01-01T00:00:59Z");
    EXPECT_EQ(Dates::iso8601(now), "2026-11-21T12:00:00Z");
}

TEST_F(DateText, IsRelativeForPeople) {
    const auto ago = [&](double seconds) {
        return Dates::relative(now.addingSeconds(-seconds), now);
    };
    EXPECT_EQ(ago(0), "just now");
    EXPECT_EQ(ago(59), "just now");
    EXPECT_EQ(ago(60), "1 min ago");
    EXPECT_EQ(ago(3599), "59 min ago");
    EXPECT_EQ(ago(3600), "1 h ago");
    EXPECT_EQ(ago(86399), "23 h ago");
    EXPECT_EQ(ago(86400), "yesterday");
    EXPECT_EQ(ago(2 * 86400), "2 days ago");
    EXPECT_EQ(ago(7 * 86400), "2026-11-14");
    EXPECT_EQ(ago(-30), "in a moment");
    EXPECT_EQ(ago(-1800), "in 30 min");
    EXPECT_EQ(ago(-86400), "in 1 day");
}

TEST_F(DateText, ReadsDaysTimesAndLengths) {
    const auto parsed = [&](const char* text) { return Dates::iso8601(Dates::parse(text, now)); };
    EXPECT_EQ(parsed("2026-11-20"), "2026-11-20T00:00:00Z");
    EXPECT_EQ(parsed("2026-11-20T08:30"), "2026-11-20T08:30:00Z");
    EXPECT_EQ(parsed("2026-11-20 08:30:15"), "2026-11-20T08:30:15Z");
    EXPECT_EQ(parsed("now"), "2026-11-21T12:00:00Z");
    EXPECT_EQ(parsed("today"), "2026-11-21T00:00:00Z");
    EXPECT_EQ(parsed("yesterday"), "2026-11-20T00:00:00Z");
    EXPECT_EQ(parsed("90min"), "2026-11-21T10:30:00Z");
    EXPECT_EQ(parsed("12h"), "2026-11-21T00:00:00Z");
    EXPECT_EQ(parsed("3 days ago"), "2026-11-18T12:00:00Z");
    EXPECT_EQ(parsed("2w"), "2026-11-07T12:00:00Z");
    EXPECT_EQ(parsed("1 week"), "2026-11-14T12:00:00Z");
    for (const char* text : {"", "soon", "12", "3 fortnights", "-3d", "2026-13-40x"}) {
        EXPECT_THROW(Dates::parse(text, now), Failure) << text;
    }
}

TEST_F(DateText, CountsDaysInTheLocalZone) {
    const Support::EnvVar zone("TZ", "Europe/Berlin");
    tzset();
    EXPECT_EQ(Dates::iso8601(Dates::parse("2026-11-20", now)), "2026-11-19T23:00:00Z");
    EXPECT_EQ(Dates::iso8601(Dates::parse("2026-11-20T08:30:00Z", now)), "2026-11-20T08:30:00Z");
    EXPECT_EQ(Dates::iso8601(Dates::parse("today", now)), "2026-11-20T23:00:00Z");
}

TEST_F(DateText, TellsLengthsInTheLargestUnit) {
    EXPECT_EQ(Dates::duration(1800), "30 minutes");
    EXPECT_EQ(Dates::duration(3600), "1 hour");
    EXPECT_EQ(Dates::duration(14 * 86400), "2 weeks");
    EXPECT_EQ(Dates::duration(30 * 86400), "30 days");
    EXPECT_EQ(Dates::duration(5400), "90 minutes");
    EXPECT_EQ(Dates::duration(61), "61 seconds");
    EXPECT_EQ(Dates::duration(-1), "never");
    EXPECT_EQ(Dates::parseDuration("90"), 90);
    EXPECT_EQ(Dates::parseDuration("1h"), 3600);
    EXPECT_EQ(Dates::parseDuration("2 weeks"), 14 * 86400);
    EXPECT_THROW(Dates::parseDuration("x"), Failure);
    EXPECT_THROW(Dates::parseDuration(""), Failure);
}
