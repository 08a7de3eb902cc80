#include <Orvane/OVError.h>
#include <Orvane/OVFormat.h>
#include <gtest/gtest.h>

TEST(OVError, HoldsADomainAndACodeAndNoTextsAtFirst) {
    const OVError error(OVPOSIXErrorDomain, 2);
    EXPECT_EQ(error.domain(), "POSIX");
    EXPECT_EQ(error.code(), 2);
    EXPECT_EQ(error.description(), "");
    EXPECT_EQ(error.failureReason(), "");
    EXPECT_EQ(error.recoverySuggestion(), "");
    EXPECT_EQ(error.URL(), "");
}

TEST(OVError, HoldsItsTexts) {
    OVError error(OVErrorDomain, OVNotAFeedError);
    error.setDescription("what");
    error.setFailureReason("why");
    error.setRecoverySuggestion("what now");
    error.setURL("http://example.org/");
    EXPECT_EQ(error.description(), "what");
    EXPECT_EQ(error.failureReason(), "why");
    EXPECT_EQ(error.recoverySuggestion(), "what now");
    EXPECT_EQ(error.URL(), "http://example.org/");
}

TEST(OVError, IsEqualIfAllOfItIs) {
    const OVError error("URL", -1001);
    OVError other("URL", -1001);
    EXPECT_EQ(error, other);
    other.setURL("http://example.org/");
    EXPECT_NE(error, other);
    EXPECT_NE(error, OVError("URL", -1002));
    EXPECT_NE(error, OVError("POSIX", -1001));
}

TEST(OVError, PrintsForLogs) {
    OVError error("URL", -1001);
    EXPECT_EQ(error.toString(), "URL error -1001");
    error.setDescription("Too slow.");
    EXPECT_EQ(error.toString(), "Too slow. (URL,-1001)");
    EXPECT_EQ(OVFormat("%@", &error), "Too slow. (URL,-1001)");
    EXPECT_EQ(OVFormat("%@", static_cast<const OVError*>(nullptr)), "(null)");
}
