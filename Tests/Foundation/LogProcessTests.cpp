#include "Support/ChildProcess.h"
#include "Support/EnvVar.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

using Support::ChildResult;
using Support::ChildStderr;
using Support::EnvVar;
using testing::HasSubstr;
using testing::Not;

// What the log decides once for a process needs a process for each case: see LogHelper.cpp.

namespace {

ChildResult runHelper(std::vector<std::string> words, ChildStderr kind = ChildStderr::File) {
    words.insert(words.begin(), LOG_HELPER);
    return Support::runChild(words, kind);
}

/// What `on` gives for each facility in turn, as "101".
std::string areOn(const std::vector<std::string>& facilities) {
    std::vector<std::string> words;
    for (const std::string& name : facilities) {
        words.insert(words.end(), {"on", name});
    }
    std::string result;
    for (const char c : runHelper(words).out) {
        if (c != '\n') result += c;
    }
    return result;
}

std::string linePrefix(const ChildResult& result) {
    return "03/04/26 05:06:07.089: " + std::to_string(result.pid) + " ";
}

/// The line of a stack that stands at `index`, the first being 0; empty if there is none.
std::string stackLine(const ChildResult& result, int index) {
    std::size_t start = result.err.find("\n\t") + 1;
    if (result.err.starts_with('\t')) start = 0;
    for (int i = 0; i < index; ++i) {
        start = result.err.find('\n', start) + 1;
    }
    return result.err.substr(start, result.err.find('\n', start) - start);
}

int countStackLines(const ChildResult& result) {
    return static_cast<int>(std::count(result.err.begin(), result.err.end(), '\t'));
}

class LogProcess : public testing::Test {
 protected:
    EnvVar mSystemLog{"OVUseSystemLog", nullptr};
};
using LoggerSettings = LogProcess;
using LogSinkChoice = LogProcess;
using JournalSink = LogProcess;
using CallStack = LogProcess;

#define SKIP_WITHOUT_NAMESPACE(result) \
    if ((result).status == 77) GTEST_SKIP() << (result).out

}  // namespace

TEST_F(LoggerSettings, TurnNothingOnByAFacilitysPreferenceAlone) {
    const EnvVar sql("OVLogSQL", "1");
    EXPECT_EQ(areOn({"SQL", "", "Truth", "WARNING"}), "0001");
}

TEST_F(LoggerSettings, TurnTheGeneralLogOnAndNoFacility) {
    const EnvVar all("OVLog", "1");
    // SQL has the default mode 0 and Truth 1: both ask their own preference.
    EXPECT_EQ(areOn({"", "SQL", "Truth", "WARNING"}), "1001");
}

TEST_F(LoggerSettings, TurnAFacilityOnByBothPreferences) {
    const EnvVar all("OVLog", "1");
    const EnvVar sql("OVLogSQL", "1");
    const EnvVar truth("OVLogTruth", "1");
    EXPECT_EQ(areOn({"SQL", "Truth", "Feed"}), "110");
}

TEST_F(LoggerSettings, LeaveWarningsOn) {
    const EnvVar all("OVLog", "0");
    const EnvVar warning("OVLogWARNING", "0");
    EXPECT_EQ(areOn({"WARNING", ""}), "10");
}

TEST_F(LoggerSettings, AreReadOnce) {
    const EnvVar sql("OVLogSQL", "1");
    EXPECT_EQ(runHelper({"OVLog=1", "on", "", "OVLog=0", "on", "SQL"}).out, "1\n1\n");
    EXPECT_EQ(runHelper({"OVLog=0", "on", "", "OVLog=1", "on", "SQL"}).out, "0\n0\n");
    EXPECT_EQ(runHelper({"OVLog=1", "on", "SQL", "OVLogSQL=0", "on", "SQL"}).out, "1\n1\n");
}

TEST_F(LoggerSettings, CutTheNameOfAPreferenceTo100Bytes) {
    const EnvVar all("OVLog", "1");
    const std::string fits(94, 'x');
    const EnvVar key(("OVLog" + fits).c_str(), "1");  // 99 bytes and the final zero
    EXPECT_EQ(areOn({fits, fits + "y", fits.substr(1)}), "110");
}

TEST_F(LogSinkChoice, TakesStandardErrorIfItIsATerminal) {
    const ChildResult result = runHelper({"write", "WARNING", "text"}, ChildStderr::Terminal);
    EXPECT_EQ(result.err, linePrefix(result) + "[WARNING] text\r\n");
}

TEST_F(LogSinkChoice, TakesTheSystemLogOtherwise) {
    const ChildResult result = runHelper({"--journal", "write", "WARNING", "text"});
    SKIP_WITHOUT_NAMESPACE(result);
    EXPECT_EQ(result.err, "");
    EXPECT_THAT(result.out, HasSubstr("MESSAGE=text\n"));
}

TEST_F(LogSinkChoice, DoesAsTheEnvironmentSays) {
    const ChildResult file = runHelper({"OVUseSystemLog=no", "write", "WARNING", "text"});
    EXPECT_EQ(file.err, linePrefix(file) + "[WARNING] text\n");
    const ChildResult terminal = runHelper(
        {"--journal", "OVUseSystemLog=1", "write", "WARNING", "text"}, ChildStderr::Terminal);
    SKIP_WITHOUT_NAMESPACE(terminal);
    EXPECT_EQ(terminal.err, "");
    EXPECT_THAT(terminal.out, HasSubstr("MESSAGE=text\n"));
}

TEST_F(LogSinkChoice, IsMadeOnce) {
    const ChildResult result = runHelper({"--journal", "OVUseSystemLog=0", "write", "WARNING", "1",
                                          "OVUseSystemLog=1", "write", "WARNING", "2"});
    SKIP_WITHOUT_NAMESPACE(result);
    EXPECT_EQ(result.out, "");
    EXPECT_THAT(result.err, HasSubstr("[WARNING] 2\n"));
}

TEST_F(JournalSink, SendsFacilityLevelAndText) {
    const EnvVar all("OVLog", "1");
    const EnvVar feed("OVLogFeed", "1");
    const ChildResult result = runHelper({"--journal", "write", "WARNING", "trouble", "write",
                                          "Feed", "two\nlines", "write", "", "general"});
    SKIP_WITHOUT_NAMESPACE(result);
    const std::string common = "SYSLOG_FACILITY=1\nSYSLOG_IDENTIFIER=orvane\n\n";
    EXPECT_EQ(result.out, "MESSAGE=trouble\nORVANE_FACILITY=Orvane-WARNING\nPRIORITY=4\n" + common +
                              "MESSAGE=two\nlines\nORVANE_FACILITY=Orvane-Feed\nPRIORITY=5\n" +
                              common + "MESSAGE=general\nORVANE_FACILITY=Orvane\nPRIORITY=5\n" +
                              common);
}

TEST_F(JournalSink, SendsWhatThePublicFunctionsWrite) {
    const ChildResult result = runHelper({"--journal", "public", "text"});
    SKIP_WITHOUT_NAMESPACE(result);
    EXPECT_THAT(result.out, HasSubstr("MESSAGE=WARNING: text\nORVANE_FACILITY=Orvane\n"));
}

TEST_F(JournalSink, WritesToStandardErrorWhereThereIsNoJournal) {
    if (access("/run/systemd/journal/socket", F_OK) == 0) GTEST_SKIP() << "there is a journal";
    const ChildResult result = runHelper({"write", "WARNING", "text"});
    EXPECT_EQ(result.err, linePrefix(result) + "[WARNING] text\n");
}

TEST_F(CallStack, IsPrintedOnlyIfAskedFor) {
    EXPECT_EQ(runHelper({"stack", "0", "3"}).err, "end\n");
    const EnvVar off("OVPrintStack", "NO");
    EXPECT_EQ(runHelper({"stack", "0", "3"}).err, "end\n");
}

TEST_F(CallStack, BeginsBehindTheSkippedFramesAndSaysThatThereIsMore) {
    const EnvVar on("OVPrintStack", "1");
    const ChildResult result = runHelper({"stack", "0", "3"});
    EXPECT_EQ(countStackLines(result), 4);
    EXPECT_THAT(stackLine(result, 0), HasSubstr("(functionThatPrints+"));
    EXPECT_THAT(stackLine(result, 1), HasSubstr("(functionThatGoesDeeper+"));
    EXPECT_EQ(stackLine(result, 3), "\t...more...");
    EXPECT_THAT(stackLine(runHelper({"stack", "1", "3"}), 0), HasSubstr("GoesDeeper"));
}

TEST_F(CallStack, EndsWithTheLastFrame) {
    const EnvVar on("OVPrintStack", "1");
    const ChildResult all = runHelper({"stack", "0", "100"});
    EXPECT_GT(countStackLines(all), 22);
    EXPECT_THAT(all.err, Not(HasSubstr("more")));
    const std::string count = std::to_string(countStackLines(all));
    EXPECT_EQ(runHelper({"stack", "0", count}).err.find("more"), std::string::npos);
    EXPECT_EQ(countStackLines(runHelper({"stack", "100", "5"})), 0);
}

TEST_F(CallStack, OfAnAssertionBeginsWhereItFailed) {
    const EnvVar on("OVPrintStack", "1");
    const EnvVar log("OVLog", "1");
    const ChildResult plain = runHelper({"fail"});
    EXPECT_EQ(plain.out, "x > 0\n");
    EXPECT_THAT(stackLine(plain, 0), HasSubstr("(functionThatFails+"));
    const ChildResult message = runHelper({"fail-with"});
    EXPECT_EQ(message.out, "x is 3\n");
    EXPECT_THAT(stackLine(message, 0), HasSubstr("(functionThatFailsWithAMessage+"));
    EXPECT_LE(countStackLines(message), 11);
}

TEST_F(CallStack, OfAnAssertionIsLeftOutWhileTheLogIsOff) {
    const EnvVar on("OVPrintStack", "1");
    EXPECT_EQ(countStackLines(runHelper({"fail"})), 0);
}
