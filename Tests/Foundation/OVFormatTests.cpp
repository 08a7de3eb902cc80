#include "Foundation/FormatObjects.h"
#include "Foundation/String.h"

#include <Orvane/OVFormat.h>
#include <gtest/gtest.h>

#include <climits>

using namespace Foundation;

TEST(OVFormat, FollowsPrintf) {
    EXPECT_EQ(OVFormat("%d %i %u", -1, 2L, 3u), "-1 2 3");
    EXPECT_EQ(OVFormat("%5d|%-5d|%05d|%+d", 42, 42, 42, 42), "   42|42   |00042|+42");
    EXPECT_EQ(OVFormat("%x %X %#x %o", 255, 255, 255, 8), "ff FF 0xff 10");
    EXPECT_EQ(OVFormat("%02x", 7), "07");
    EXPECT_EQ(OVFormat("%.3f %g %.2e", 1.5, 0.5, 12345.678), "1.500 0.5 1.23e+04");
    EXPECT_EQ(OVFormat("%s|%6s|%-6s|%.2s", "abc", "abc", "abc", "abc"), "abc|   abc|abc   |ab");
    EXPECT_EQ(OVFormat("%*d|%.*f", 5, 42, 1, 2.25), "   42|2.2");
    EXPECT_EQ(OVFormat("%*d|%.*f", -5, 42, -1, 2.25), "42   |2.250000");
    EXPECT_EQ(OVFormat("%c%%", 'x'), "x%");
    EXPECT_EQ(OVFormat("nothing"), "nothing");
}

TEST(OVFormat, TakesTheSizeOfANumberFromItsType) {
    EXPECT_EQ(OVFormat("%d", LLONG_MIN), "-9223372036854775808");
    EXPECT_EQ(OVFormat("%u", ULLONG_MAX), "18446744073709551615");
    EXPECT_EQ(OVFormat("%lld %qd %hhd %zu", 1, 2, 3, std::size_t{4}), "1 2 3 4");
    EXPECT_EQ(OVFormat("%d", ULLONG_MAX), "18446744073709551615");
}

TEST(OVFormat, PrintsObjectsByTheirDescription) {
    const Ref<String> text = String::string("words");
    String* null = nullptr;
    EXPECT_EQ(OVFormat("<%@> <%@>", text, text.get()), "<words> <words>");
    EXPECT_EQ(OVFormat("%@ %s %@", null, static_cast<const char*>(nullptr), nullptr),
              "(null) (null) (null)");
}

TEST(OVFormat, PrintsAddressesOfAnything) {
    int value = 0;
    const Ref<String> text = String::string("words");
    EXPECT_EQ(OVFormat("%p", reinterpret_cast<void*>(0x1000)), "0x1000");
    EXPECT_EQ(OVFormat("%p", &value).substr(0, 2), "0x");
    EXPECT_EQ(OVFormat("%p", text.get()), OVFormat("%p", static_cast<void*>(text.get())));
}

TEST(OVFormat, LeavesWhatDoesNotFitAtRunTimeAsItStands) {
    const OVFormatArgument number[] = {42};
    EXPECT_EQ(OVFormatV("%s %d", number), "%s 42");
    EXPECT_EQ(OVFormatV("%d %d", number), "42 %d");
    EXPECT_EQ(OVFormatV("%@ of %d", number), "%@ of 42");
    EXPECT_EQ(OVFormatV("%", number), "%");
    EXPECT_EQ(OVFormatV("%-", number), "%-");
    EXPECT_EQ(OVFormatV("%n%d", number), "%n42");
}
