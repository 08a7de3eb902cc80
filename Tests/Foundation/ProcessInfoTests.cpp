#include "Foundation/ProcessInfo.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/RunningApplications.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

using namespace Foundation;
using Support::LogCapture;

namespace {

/// A session that the test makes up, which counts what it is asked.
class FakeApplications : public RunningApplications {
 public:
    FakeApplications() { setCurrent(this); }
    ~FakeApplications() override { setCurrent(nullptr); }

    std::int32_t getSeed() override { return seed; }
    bool isRunning(const std::string& lowerCasedIdentifier) override {
        asked.push_back(lowerCasedIdentifier);
        return lowerCasedIdentifier == running;
    }

    std::int32_t seed = 0;
    std::string running;
    std::vector<std::string> asked;
};

using Asked = std::vector<std::string>;

class ProcessInfoTest : public testing::Test {
 protected:
    static Ref<String> text(const char* utf8) { return String::string(utf8); }

    FakeApplications session;
    ProcessInfo info{text("org.example.Reader").get()};
};

}  // namespace

TEST_F(ProcessInfoTest, AsksForTheIdentifierInLowerCase) {
    EXPECT_FALSE(info.isRunning());
    EXPECT_EQ(session.asked, Asked({"org.example.reader"}));
}

TEST_F(ProcessInfoTest, AsksOnceForEachSeed) {
    session.running = "org.example.reader";
    EXPECT_TRUE(info.isRunning());
    session.running = "";
    EXPECT_TRUE(info.isRunning());
    EXPECT_EQ(session.asked.size(), 1u);
    session.seed = 1;
    EXPECT_FALSE(info.isRunning());
    EXPECT_FALSE(info.isRunning());
    EXPECT_EQ(session.asked.size(), 2u);
}

TEST_F(ProcessInfoTest, AnotherIdentifierIsAskedForAnew) {
    session.running = "org.example.other";
    EXPECT_FALSE(info.isRunning());
    info.setBundleID(text("org.example.Other").get());
    EXPECT_TRUE(info.isRunning());
    EXPECT_EQ(session.asked, Asked({"org.example.reader", "org.example.other"}));
}

TEST_F(ProcessInfoTest, TheSameIdentifierIsNotAskedForAnew) {
    info.isRunning();
    info.setBundleID(text("org.example.Reader").get());
    info.isRunning();
    EXPECT_EQ(session.asked.size(), 1u);
}

TEST_F(ProcessInfoTest, NeedsAnIdentifier) {
    LogCapture log;
    ProcessInfo none;
    try {
        none.isRunning();
        FAIL() << "no assertion failed";
    } catch (const AssertionFailure& e) {
        EXPECT_STREQ(e.what(), "mBundleID");
    }
    info.setBundleID(nullptr);
    EXPECT_THROW(info.isRunning(), AssertionFailure);
    EXPECT_TRUE(session.asked.empty());
}

TEST_F(ProcessInfoTest, LogsEachAnswerOfTheSession) {
    LogCapture log;
    Support::LoggingOn on({});
    session.running = "org.example.reader";
    info.isRunning();
    info.isRunning();
    session.running = "";
    ++session.seed;
    info.isRunning();
    EXPECT_EQ(log.lines(),
              std::vector<std::string>({"ProcessInfo::isRunning(\"org.example.Reader\") = 1",
                                        "ProcessInfo::isRunning(\"org.example.Reader\") = 0"}));
}
