#include <Orvane/OVError.h>
#include <Orvane/OVException.h>
#include <Orvane/OVLog.h>
#include <gtest/gtest.h>

TEST(SharedLibrary, ThrowsExceptionsThatAnApplicationCatches) {
    testing::internal::CaptureStderr();
    EXPECT_THROW(_OVAssertFailed("f", true, nullptr, "x"), OVException);
    EXPECT_THROW(_OVAssertFailed("f", true, nullptr, "x"), std::runtime_error);
    testing::internal::GetCapturedStderr();
}

TEST(SharedLibrary, DescribesErrors) {
    const OVError error(OVURLErrorDomain, OVURLErrorTimedOut);
    EXPECT_EQ(error.toString(), "URL error -1001");
    EXPECT_EQ(OVFormat("%@", &error), "URL error -1001");
}

TEST(SharedLibrary, LogsForApplications) {
    testing::internal::CaptureStderr();
    AlwaysWarn("%d", 42);
    _OVLog("not written");
    EXPECT_FALSE(WillLog(nullptr));
    const std::string line = testing::internal::GetCapturedStderr();
    EXPECT_TRUE(line.ends_with(" WARNING: 42\n")) << line;
}
