#include "CommandLine/Program.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using Support::ChildResult;
using testing::HasSubstr;

TEST(Usage, IsToldAboutOnStandardErrorWithStatus2) {
    for (const std::vector<std::string>& arguments : std::vector<std::vector<std::string>>{
             {},
             {"inspekt"},
             {"--no-such"},
             {"inspect"},
             {"inspect", "--no-such", "x"},
             {"inspect", "--base"},
         }) {
        const ChildResult result = runOrvane(arguments);
        EXPECT_EQ(result.status, 2) << result.err;
        EXPECT_EQ(result.out, "");
        EXPECT_THAT(result.err, HasSubstr("orvane"));
        EXPECT_THAT(result.err, HasSubstr("--help"));
    }
}

TEST(Usage, NamesTheVerbWhoseArgumentsAreWrong) {
    EXPECT_THAT(runOrvane({"inspect"}).err, HasSubstr("orvane inspect: FILE"));
    EXPECT_THAT(runOrvane({"inspect"}).err, HasSubstr("\"orvane inspect --help\""));
}

TEST(Usage, RefusesABaseThatIsNoAbsoluteURL) {
    const ChildResult result = runOrvane({"inspect", "--base", "a/b", "/dev/null"});
    EXPECT_EQ(result.status, 2);
    EXPECT_THAT(result.err, HasSubstr("Not an absolute URL: a/b"));
}

TEST(Usage, SaysWhatWasProbablyMeant) {
    EXPECT_THAT(runOrvane({"inspekt"}).err, HasSubstr("did you mean \"inspect\"?"));
    EXPECT_THAT(runOrvane({"inspect", "--jsn", "x"}).err, HasSubstr("did you mean --json?"));
}

TEST(Help, ListsTheVerbs) {
    const ChildResult result = runOrvane({"-h"});
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "");
    for (const char* verb : {"add", "rm", "set", "feeds", "entries", "show", "mark", "flag",
                             "unflag", "refresh", "status", "inspect", "version", "help"}) {
        EXPECT_THAT(result.out, HasSubstr(std::string("\n  ") + verb + ' '));
    }
}

TEST(Help, TellsTheExitStatusesInTheManual) {
    const ChildResult result = runOrvane({"--help"});
    EXPECT_EQ(result.status, 0);
    EXPECT_THAT(result.out, HasSubstr("2  wrong usage"));
    EXPECT_THAT(result.out, HasSubstr("8  database not usable"));
    EXPECT_THAT(result.out, HasSubstr("NO_COLOR"));
    EXPECT_EQ(runOrvane({"help"}).out, result.out);
}

TEST(Help, TellsTheOptionsOfAVerb) {
    const ChildResult result = runOrvane({"inspect", "-h"});
    EXPECT_EQ(result.status, 0);
    for (const char* option : {"--json", "--base URL", "--tidied", "FILE|URL..."}) {
        EXPECT_THAT(result.out, HasSubstr(option));
    }
    const ChildResult manual = runOrvane({"inspect", "--help"});
    EXPECT_THAT(manual.out, HasSubstr("orvane inspect feed.xml"));
    EXPECT_EQ(runOrvane({"help", "inspect"}).out, manual.out);
    EXPECT_EQ(runOrvane({"help", "inspekt"}).status, 2);
}

TEST(Version, IsTold) {
    const ChildResult result = runOrvane({"version"});
    EXPECT_EQ(result.status, 0);
    EXPECT_THAT(result.out, testing::MatchesRegex("orvane [0-9.]+\n"));
    EXPECT_EQ(runOrvane({"--version"}).out, result.out);
    EXPECT_THAT(runOrvane({"version", "--json"}).out, HasSubstr("\"schema\": 1"));
}

}  // namespace
