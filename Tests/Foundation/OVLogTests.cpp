#include <Orvane/OVException.h>
#include <Orvane/OVLog.h>

#include "Foundation/AutoreleasePool.h"
#include "Foundation/String.h"
#include "Support/EnvVar.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

using namespace Foundation;
using Support::EnvVar;
using Support::LogCapture;
using Lines = std::vector<std::string>;

namespace {

const char* const kFunction = "int f(int)";
const char* const kContinuing = "Continuing without raising an exception...\n";

/// What `fail`, an assertion that does not raise, logs.
template <class Function>
std::string loggedBy(Function&& fail) {
    const LogCapture log;
    testing::internal::CaptureStderr();
    fail();
    EXPECT_EQ(testing::internal::GetCapturedStderr(), kContinuing);
    EXPECT_EQ(log.lines().size(), 1u);
    return log.lines().empty() ? "" : log.lines().front();
}

/// An object that cannot tell what it is.
struct Speechless {
    int value = 0;
};
std::string describeForFormat(const Speechless*) {
    throw std::runtime_error("no words");
}

}  // namespace

TEST(OVLog, AsksForTheLogAndForTheFacility) {
    const EnvVar feed("OVLogFeed", "1");
    EXPECT_FALSE(WillLog(nullptr));
    EXPECT_FALSE(WillLog("Feed"));
    const EnvVar all("OVLog", "1");
    EXPECT_TRUE(WillLog(nullptr));
    EXPECT_TRUE(WillLog(""));
    EXPECT_TRUE(WillLog("Feed"));
    EXPECT_FALSE(WillLog("Msg"));
}

TEST(OVLog, WritesNothingWhileTheLogIsOff) {
    const LogCapture log;
    const EnvVar feed("OVLogFeed", "1");
    _OVLog("text");
    _OVLog("[Feed] text");
    EXPECT_EQ(log.lines(), Lines());
}

TEST(OVLog, WritesWhatNamesNoFacilityOrOneThatIsOn) {
    const LogCapture log;
    const EnvVar all("OVLog", "1");
    const EnvVar feed("OVLogFeed", "1");
    const EnvVar msg("OVLogMsg", "0");
    const Ref<String> object = String::string("object");
    _OVLog("text %d %@", 1, object);
    _OVLog("[Feed] text %s", "[Msg]");
    _OVLog("[Msg] not written");
    _OVLog("[API] not written");
    _OVLog("[Msg without an end");
    _OVLog(" [Msg] not at the start");
    EXPECT_EQ(log.lines(), Lines({"text 1 object", "[Feed] text [Msg]", "[Msg without an end",
                                  " [Msg] not at the start"}));
}

TEST(OVLog, TakesTheFacilityFromTheFormatAndNotFromTheText) {
    const LogCapture log;
    const EnvVar all("OVLog", "1");
    _OVLog("%s text", "[Msg]");
    EXPECT_EQ(log.lines(), Lines({"[Msg] text"}));
}

TEST(OVLog, AlwaysWarns) {
    const LogCapture log;
    AlwaysWarn("%s is %d", "answer", 42);
    AlwaysWarn("[Feed] text");
    EXPECT_EQ(log.lines(), Lines({"WARNING: answer is 42", "WARNING: [Feed] text"}));
}

TEST(OVLog, TakesFormatsThatAreKnownOnlyAtRunTime) {
    const LogCapture log;
    const EnvVar all("OVLog", "1");
    const OVFormatArgument number[] = {42};
    _OVLogV("%d %s", number);
    AlwaysWarnV("%d", number);
    _OVLogV(nullptr, number);
    AlwaysWarnV(nullptr, number);
    testing::internal::CaptureStderr();
    _OVAssertFailedV(kFunction, false, {nullptr, nullptr}, nullptr, {});
    EXPECT_EQ(testing::internal::GetCapturedStderr(), kContinuing);
    EXPECT_EQ(log.lines(),
              Lines({"42 %s", "WARNING: 42", "WARNING: ASSERTION FAILED:  int f(int) ...NOT!!"}));
}

TEST(OVLog, FormatsNothingTwice) {
    const LogCapture log;
    AlwaysWarn("%s", "100%s");
    EXPECT_EQ(log.lines(), Lines({"WARNING: 100%s"}));
}

TEST(OVLog, ReportsAFailedAssertionAndGoesOn) {
    EXPECT_EQ(loggedBy([&] { _OVAssertFailed(kFunction, false, nullptr, "x is %d", 3); }),
              "WARNING: ASSERTION FAILED: x is 3");
}

TEST(OVLog, NamesTheFunctionOfAnAssertionWithoutAMessage) {
    EXPECT_EQ(loggedBy([&] { _OVAssertFailed(kFunction, false, nullptr, ""); }),
              "WARNING: ASSERTION FAILED:  int f(int) ...NOT!!");
}

TEST(OVLog, NamesTheObjectOfAnAssertion) {
    const AutoreleasePool pool;
    String* const object = String::string("feed %@");
    EXPECT_EQ(loggedBy([&] { _OVAssertFailed(kFunction, false, object, "x is %d", 3); }),
              "WARNING: ASSERTION FAILED: x is 3 (self = feed %@)");
    EXPECT_EQ(loggedBy([&] { _OVAssertFailed(kFunction, false, object, ""); }),
              "WARNING: ASSERTION FAILED:  int f(int) ...NOT!! (self = feed %@)");
    EXPECT_EQ(
        loggedBy([&] { _OVAssertFailed(kFunction, false, static_cast<String*>(nullptr), "x"); }),
        "WARNING: ASSERTION FAILED: x");
}

TEST(OVLog, RaisesWhatAnAssertionReportsIfAsked) {
    const LogCapture log;
    testing::internal::CaptureStderr();
    try {
        _OVAssertFailed(kFunction, true, nullptr, "x is %d", 3);
        ADD_FAILURE() << "nothing was raised";
    } catch (const OVException& e) {
        EXPECT_STREQ(e.what(), "WARNING: ASSERTION FAILED: x is 3");
    }
    EXPECT_EQ(testing::internal::GetCapturedStderr(), "");
    EXPECT_EQ(log.lines(), Lines({"WARNING: ASSERTION FAILED: x is 3"}));
}

TEST(OVLog, DoesNotFailForAnObjectThatCannotBeDescribed) {
    const Speechless object;
    EXPECT_EQ(loggedBy([&] { _OVAssertFailed(kFunction, false, &object, "x"); }),
              "WARNING: ASSERTION FAILED: x (self = %@)");
    const LogCapture log;
    const EnvVar all("OVLog", "1");
    testing::internal::CaptureStderr();
    EXPECT_NO_THROW(_OVLog("%@", &object));
    EXPECT_NO_THROW(AlwaysWarn("%@", &object));
    EXPECT_NE(testing::internal::GetCapturedStderr(), "");
}
