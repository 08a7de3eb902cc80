#include "Foundation/Utils.h"

#include "Support/EnvVar.h"

#include <gtest/gtest.h>

#include <climits>

using Compatibility::Utils;
using Support::EnvVar;

TEST(Utils, CopiesAnEnvironmentVariable) {
    const EnvVar variable("OVTest", "value");
    char buffer[8] = "before";
    EXPECT_TRUE(Utils::copyenv(buffer, sizeof buffer, "OVTest"));
    EXPECT_STREQ(buffer, "value");
    EXPECT_FALSE(Utils::copyenv(buffer, sizeof buffer, "OVTestUnset"));
    EXPECT_STREQ(buffer, "value");
}

TEST(Utils, CutsAnEnvironmentVariableToTheBuffer) {
    const EnvVar variable("OVTest", "value");
    char buffer[8] = "1234567";
    EXPECT_TRUE(Utils::copyenv(buffer, 4, "OVTest"));
    EXPECT_STREQ(buffer, "val");
    EXPECT_EQ(buffer[4], '5');
    const EnvVar empty("OVTest", "");
    EXPECT_TRUE(Utils::copyenv(buffer, sizeof buffer, "OVTest"));
    EXPECT_STREQ(buffer, "");
}

TEST(Utils, ReadsNumbers) {
    EXPECT_EQ(Utils::str2int("42", false), 42);
    EXPECT_EQ(Utils::str2int(" -7 apples", false), -7);
    EXPECT_EQ(Utils::str2int("ff", false), 0);
    EXPECT_EQ(Utils::str2int("", false), 0);
    EXPECT_EQ(Utils::str2int(nullptr, false), 0);
    EXPECT_EQ(Utils::str2int("ff", true), 255);
    EXPECT_EQ(Utils::str2int("20AC;", true), 0x20ac);
    EXPECT_EQ(Utils::str2int("0x1F", true), 31);
}

TEST(Utils, ReadsNumbersThatDoNotFitAsTheNearest) {
    EXPECT_EQ(Utils::str2int("4294967297", false), INT_MAX);
    EXPECT_EQ(Utils::str2int("-4294967297", false), INT_MIN);
    EXPECT_EQ(Utils::str2int("fffffffffffffffff", true), INT_MAX);
    EXPECT_EQ(Utils::str2longlong("9223372036854775808"), INT64_MAX);
}

TEST(Utils, ReadsLongNumbers) {
    EXPECT_EQ(Utils::str2longlong("9223372036854775807"), INT64_MAX);
    EXPECT_EQ(Utils::str2longlong("-9223372036854775808"), INT64_MIN);
    EXPECT_EQ(Utils::str2longlong("x"), 0);
    EXPECT_EQ(Utils::str2longlong(nullptr), 0);
}
