#include "CommandLine/Arguments.h"

#include "CommandLine/Failure.h"

#include <gmock/gmock.h>

using Commands::Arguments;
using Commands::ExitStatus;
using Commands::Failure;
using Commands::VerbSpec;
using Commands::WordKind;
using testing::ElementsAre;
using testing::HasSubstr;

namespace {

const VerbSpec kSpec{
    .name = "verb",
    .summary = "does something",
    .operands = "THING...",
    .fewest = 1,
    .most = 3,
    .options = {{"json", 'j', "", "JSON"},
                {"quiet", 'q', "", "Quiet"},
                {"number", 'n', "N", "So many"},
                {"sort", 0, "ORDER", "How", WordKind::Choice, {"title", "feed"}}},
};

/// What is wrong with words; empty if nothing is.
std::string complaintOf(const std::vector<std::string>& words) {
    try {
        const Arguments arguments(kSpec, words);
        return {};
    } catch (const Failure& failure) {
        EXPECT_EQ(failure.getStatus(), ExitStatus::Usage);
        return failure.what();
    }
}

}  // namespace

TEST(Arguments, TakesOptionsInAllForms) {
    const Arguments arguments(kSpec, {"-jn5", "--sort=feed", "a", "--quiet", "b"});
    EXPECT_TRUE(arguments.has("json"));
    EXPECT_TRUE(arguments.has("quiet"));
    EXPECT_EQ(arguments.number("number"), 5U);
    EXPECT_EQ(arguments.value("sort"), "feed");
    EXPECT_THAT(arguments.operands(), ElementsAre("a", "b"));
    EXPECT_EQ(Arguments(kSpec, {"-n", "7", "a"}).number("number"), 7U);
    EXPECT_THAT(Arguments(kSpec, {"a", "-n1", "--number", "2"}).values("number"),
                ElementsAre("1", "2"));
    EXPECT_EQ(Arguments(kSpec, {"a"}).number("number"), std::nullopt);
}

TEST(Arguments, TakesAllBehindTwoDashesForOperands) {
    EXPECT_THAT(Arguments(kSpec, {"--", "-j", "--"}).operands(), ElementsAre("-j", "--"));
    EXPECT_THAT(Arguments(kSpec, {"-"}).operands(), ElementsAre("-"));
}

TEST(Arguments, WantsHelpWhateverElseIsWrong) {
    EXPECT_TRUE(Arguments(kSpec, {"-h"}).wantsShortHelp());
    EXPECT_TRUE(Arguments(kSpec, {"--help", "--nonsense"}).wantsManual());
    EXPECT_FALSE(Arguments(kSpec, {"a"}).wantsManual());
}

TEST(Arguments, RefusesWhatTheTableDoesNotAllow) {
    EXPECT_THAT(complaintOf({}), HasSubstr("THING... is missing"));
    EXPECT_THAT(complaintOf({"a", "b", "c", "d"}), HasSubstr("\"d\""));
    EXPECT_THAT(complaintOf({"a", "--jsn"}), HasSubstr("did you mean --json?"));
    EXPECT_THAT(complaintOf({"a", "-x"}), HasSubstr("-x"));
    EXPECT_THAT(complaintOf({"a", "--number"}), HasSubstr("needs N"));
    EXPECT_THAT(complaintOf({"a", "--json=1"}), HasSubstr("takes no value"));
    EXPECT_THAT(complaintOf({"a", "--sort", "tilte"}), HasSubstr("did you mean title?"));
    EXPECT_EQ(complaintOf({"a"}), "");
}

TEST(Arguments, RefusesNumbersThatAreNone) {
    for (const char* text : {"", "x", "-1", "5x", "99999999999999999999999"}) {
        EXPECT_THROW(Arguments(kSpec, {"a", "--number", text}).number("number"), Failure) << text;
    }
}
