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

TEST(Help, ListsTheVerbsAndTheExitStatuses) {
    const ChildResult result = runOrvane({"--help"});
    EXPECT_EQ(result.status, 0);
    EXPECT_THAT(result.out, HasSubstr("inspect"));
    EXPECT_THAT(result.out, HasSubstr("2 wrong usage"));
    EXPECT_EQ(result.err, "");
    EXPECT_EQ(runOrvane({"-h"}).out, result.out);
}

TEST(Help, TellsTheOptionsOfAVerb) {
    const ChildResult result = runOrvane({"inspect", "--help"});
    EXPECT_EQ(result.status, 0);
    for (const char* option : {"--json", "--base URL", "--tidied", "FILE"}) {
        EXPECT_THAT(result.out, HasSubstr(option));
    }
}

}  // namespace
