#include "Foundation/Logger.h"

#include "Support/EnvVar.h"
#include "Support/LogCapture.h"

#include <gtest/gtest.h>

#include <optional>
#include <stdexcept>

using namespace Foundation;
using Support::EnvVar;
using Support::LogCapture;
using Support::LoggingOn;
using Lines = std::vector<std::string>;

namespace {

struct Facility {
    Logger atStart;
    const char* name;
    int defaultMode;
};

// Copied before any test runs, and so before the first use of any of them.
const Facility kFacilities[] = {
    {gLog, nullptr, 1},
    {gWarn, "WARNING", 7},
    {gLogMsg, "Msg", 0},
    {SQLite::gLogSQL, "SQL", 0},
    {SQLite::gLogPersist, "Persist", 0},
    {SQLite::gLogTruth, "Truth", 1},
    {Orvane::gLogParser, "Parser", 0},
    {Orvane::gLogParserVerbose, "ParserVerbose", 0},
    {Orvane::gLogParserDates, "ParserDates", 1},
    {Orvane::Lua::gLogLua, "Lua", 0},
    {Orvane::gLogDownload, "Download", 1},
    {Orvane::gLogSub, "Sub", 0},
    {Orvane::gLogFeed, "Feed", 0},
    {Orvane::gLogSocket, "Socket", 0},
    {Orvane::gLogSCGI, "SCGI", 0},
    {Orvane::gLogSCGIVerbose, "SCGIVerbose", 0},
    {Orvane::gLogAPI, "API", 1},
    {Orvane::gLogAPIVerbose, "API.Verbose", 0},
    {Orvane::gLogAgent, "Agent", 1},
    {Orvane::gLogAgentVerbose, "Agent.Verbose", 0},
    {Orvane::gLogRender, "Render", 1},
    {Orvane::gLogRenderOut, "RenderOut", 0},
    {Orvane::gLogHTTP, "HTTP", 0},
    {Orvane::gLogQueue, "Queue", 0},
    {gLogTidier, "Tidier", 0},
    {gLogTidierVerbose, "TidierVerbose", 0},
    {Orvane::gLogIPC, "IPC", 1},
    {gLogSync, "Sync", 0},
    {gLogSyncVerbose, "SyncVerbose", 0},
};

/// Takes lines as a test says.
class SinkOf : public LogSink {
 public:
    explicit SinkOf(std::function<void(std::string_view)> write)
        : mWrite(std::move(write)), mPrevious(setLogSink(this)) {}
    ~SinkOf() override { setLogSink(mPrevious); }

    void write(const Logger&, std::string_view text) override { mWrite(text); }

 private:
    std::function<void(std::string_view)> mWrite;
    LogSink* mPrevious;
};

/// An object that logs while it is described.
struct Talkative {
    int value = 0;
};
std::string describeForFormat(const Talkative*) {
    gWarn.log("inner, %d deep", insideLogCall());
    return "talkative";
}

TEST(Logger, MovesItsLinesInByFourBlanksAStep) {
    Support::LogCapture log;
    Logger logger{"Test", 2};
    logger.indent();
    logger.log("a");
    logger.indent();
    logger.log("b");
    logger.outdent();
    logger.log("c");
    logger.indent();
    logger.resetIndentation();
    logger.log("d");
    logger.outdent();
    logger.log("e");
    EXPECT_EQ(log.lines(), (std::vector<std::string>{"[Test]     a", "[Test]         b",
                                                     "[Test]     c", "[Test] d", "[Test] e"}));
}

}  // namespace

TEST(Logger, HasEachFacilityWithItsNameAndDefaultMode) {
    for (const Facility& facility : kFacilities) {
        const char* name = facility.name ? facility.name : "(general)";
        EXPECT_STREQ(facility.atStart.mName, facility.name);
        EXPECT_EQ(facility.atStart.mState, facility.defaultMode) << name;
        EXPECT_EQ(facility.atStart.mLineCount, 0u) << name;
    }
}

TEST(Logger, SettlesAtTheFirstUse) {
    Logger logger{"Test", 0};
    logger.mLineCount = 7;
    EXPECT_FALSE(logger.willLog());
    EXPECT_EQ(logger.mState, -1);
    EXPECT_TRUE(logger.mDisabled);
    EXPECT_FALSE(logger.mAlways);
    EXPECT_EQ(logger.mLineCount, 0u);
}

TEST(Logger, SettlesOnce) {
    Logger logger{"Test", 2};
    logger._init();
    logger.mLineCount = 7;
    logger.mDisabled = true;
    logger._init();
    EXPECT_EQ(logger.mLineCount, 7u);
    EXPECT_TRUE(logger.mDisabled);
}

TEST(Logger, AlwaysLogsInTheModesFromTwoOn) {
    for (const int mode : {2, 3, 7}) {
        Logger logger{"Test", mode};
        EXPECT_TRUE(logger.willLog()) << mode;
        EXPECT_TRUE(logger.mAlways) << mode;
        EXPECT_FALSE(logger.mDisabled) << mode;
        EXPECT_EQ(logger.mState, -1) << mode;
    }
    for (const int mode : {0, 1}) {
        Logger logger{"Test", mode};
        EXPECT_FALSE(logger.willLog()) << mode;
    }
}

TEST(Logger, IsNotEnabledByItsOwnPreferenceAlone) {
    const EnvVar sql("OVLogSQL", "1");
    Logger logger{"SQL", 0};
    EXPECT_FALSE(logger.willLog());
}

TEST(Logger, LogsOnlyWhileTheGeneralLogIsOnToo) {
    Logger logger{"Test", 0};
    logger.setEnabled(true);
    EXPECT_FALSE(logger.mDisabled);
    EXPECT_FALSE(logger.willLog());
    {
        const LoggingOn general({});
        EXPECT_TRUE(logger.willLog());
        logger.setEnabled(false);
        EXPECT_FALSE(logger.willLog());
    }
    EXPECT_FALSE(logger.willLog());
}

TEST(Logger, LogsWithoutTheGeneralLogIfItIsAlwaysOn) {
    Logger logger{"Test", 7};
    EXPECT_TRUE(logger.willLog());
    logger.setEnabled(false);
    EXPECT_FALSE(logger.willLog());
    logger.setEnabled(true);
    EXPECT_TRUE(logger.willLog());
}

TEST(Logger, WritesAndCountsLinesOnlyIfItWillLog) {
    const LogCapture log;
    Logger logger{"Test", 0};
    logger.log("not written");
    EXPECT_EQ(logger.mLineCount, 0u);
    const LoggingOn on({&logger});
    logger.log("%d of %s", 1, "2");
    logger.log("100%%");
    EXPECT_EQ(logger.mLineCount, 2u);
    EXPECT_EQ(log.lines(), Lines({"[Test] 1 of 2", "[Test] 100%"}));
}

TEST(Logger, WritesALineWhetherOrNotItIsOn) {
    const LogCapture log;
    Logger logger{nullptr, 0};
    logger.alwaysLogV("text", {});
    EXPECT_EQ(log.lines(), Lines({"text"}));
    EXPECT_EQ(logger.mLineCount, 1u);
    EXPECT_FALSE(logger.willLog());
}

TEST(Logger, CountsHowDeepItIsInLogCalls) {
    std::vector<int> depths;
    const SinkOf sink([&](std::string_view) { depths.push_back(insideLogCall()); });
    EXPECT_EQ(insideLogCall(), 0);
    gWarn.log("text");
    {
        const InsideLogCall inside;
        gWarn.log("text");
    }
    EXPECT_EQ(depths, std::vector<int>({1, 2}));
    EXPECT_EQ(insideLogCall(), 0);
}

TEST(Logger, MayBeUsedByWhatItPrints) {
    const LogCapture log;
    const Talkative object;
    gWarn.log("%@", &object);
    EXPECT_EQ(log.lines(), Lines({"[WARNING] inner, 1 deep", "[WARNING] talkative"}));
}

TEST(Logger, DoesNotFailWithItsSink) {
    const SinkOf sink([](std::string_view) { throw std::runtime_error("disk full"); });
    testing::internal::CaptureStderr();
    EXPECT_NO_THROW(gWarn.log("text"));
    EXPECT_EQ(testing::internal::GetCapturedStderr(),
              "Orvane: a line of the log could not be written\n");
    EXPECT_EQ(insideLogCall(), 0);
}

TEST(Logger, ReportsAnExceptionByClassTextAndPlace) {
    const LogCapture log;
    const unsigned before = getExceptionHits();
    const std::out_of_range e("row 7");
    doWarnAboutException(&e, "void f()");
    doWarnAboutException(nullptr, "void g()");
    EXPECT_EQ(log.lines(), Lines({"[WARNING] std::out_of_range \"row 7\" caught in void f()",
                                  "[WARNING] Unknown exception caught in void g()"}));
    EXPECT_EQ(getExceptionHits(), before + 2);
}

TEST(Logger, CountsExceptionsEvenIfWarningsAreOff) {
    const LogCapture log;
    const unsigned before = getExceptionHits();
    gWarn.setEnabled(false);
    doWarnAboutException(nullptr, "void f()");
    gWarn.setEnabled(true);
    EXPECT_EQ(log.lines(), Lines());
    EXPECT_EQ(getExceptionHits(), before + 1);
}

TEST(Logger, ReportsTheExceptionInFlight) {
    const LogCapture log;
    try {
        throw std::runtime_error("text");
    } catch (...) {
        warnAboutCurrentException("void f()");
    }
    try {
        throw 42;
    } catch (...) {
        warnAboutCurrentException("void g()");
    }
    EXPECT_EQ(log.lines(), Lines({"[WARNING] std::runtime_error \"text\" caught in void f()",
                                  "[WARNING] Unknown exception caught in void g()"}));
}
