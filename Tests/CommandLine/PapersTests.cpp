// What the program writes of itself: manual pages, and scripts for shells.

#include "CommandLine/Program.h"
#include "Support/TempDir.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <sstream>

namespace {

using Support::ChildResult;
using testing::HasSubstr;

/// The verbs, as the help lists them.
std::vector<std::string> verbs() {
    std::vector<std::string> all;
    std::istringstream lines(runOrvane({"-h"}).out);
    for (std::string line; std::getline(lines, line);) {
        if (line.starts_with("  ")) all.push_back(line.substr(2, line.find(' ', 2) - 2));
    }
    return all;
}

/// What a program says of a file with this text; empty if it is content.
std::string complaint(const std::string& check, const std::string& text) {
    const Support::TempDir dir;
    return runInShell(check + " '" + dir.writeFile("file", text) + "' 2>&1").out;
}

/// What is wrong with a manual page, but that those it refers to are not installed.
std::string lint(const std::string& file) {
    return runInShell("mandoc -T lint -W style '" + file +
                      "' 2> /dev/null | grep -v 'referenced manual not found'")
        .out;
}

}  // namespace

TEST(ManualPages, AreCleanForEachVerb) {
    const Support::TempDir dir;
    EXPECT_EQ(runInShell("command -v mandoc > /dev/null").status, 0);
    EXPECT_EQ(lint(dir.writeFile("orvane.1", runOrvane({"help", "--mdoc"}).out)), "");
    ASSERT_GT(verbs().size(), 15U);
    for (const std::string& verb : verbs()) {
        const ChildResult page = runOrvane({"help", "--mdoc", verb});
        EXPECT_THAT(page.out, HasSubstr(".Nm orvane-" + verb + "\n"));
        EXPECT_EQ(lint(dir.writeFile("orvane-" + verb + ".1", page.out)), "") << page.out;
    }
}

TEST(ManualPages, AreMadeForEachVerbAndTheAgent) {
    for (const std::string& verb : verbs()) {
        EXPECT_TRUE(std::filesystem::exists(ORVANE_MANUAL "/orvane-" + verb + ".1")) << verb;
    }
    EXPECT_EQ(lint(ORVANE_MANUAL "/orvane-agent.1"), "");
}

TEST(Completions, AreUnderstoodByTheirShells) {
    EXPECT_EQ(complaint("bash -n", runOrvane({"completion", "bash"}).out), "");
    EXPECT_EQ(complaint("zsh -n", runOrvane({"completion", "zsh"}).out), "");
    EXPECT_EQ(complaint("fish -n", runOrvane({"completion", "fish"}).out), "");
    EXPECT_EQ(runOrvane({"completion", "tcsh"}).status, 2);
}

TEST(Completions, KnowVerbsAndOptions) {
    const Support::TempDir dir;
    const auto complete = [&](const std::string& words, int last) {
        return runInShell(
                   "\"$0\" completion bash > \"$1/script\"; bash -c '. \"$1/script\"; "
                   "COMP_WORDS=(" +
                       words + "); COMP_CWORD=" + std::to_string(last) +
                       "; _orvane; echo \"${COMPREPLY[*]}\"' x \"$1\"",
                   {dir.path().string()})
            .out;
    };
    EXPECT_EQ(complete("orvane ent", 1), "entries\n");
    EXPECT_EQ(complete("orvane entries --sor", 2), "--sort\n");
    EXPECT_EQ(complete("orvane entries --sort pub", 3), "published\n");
    EXPECT_EQ(complete("orvane completion z", 2), "zsh\n");
    EXPECT_EQ(complete("orvane mark un", 2), "unread\n");
    // Nothing is started where there is no database.
    EXPECT_EQ(complete("orvane rm a", 2), "\n");
}
