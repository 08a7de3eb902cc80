#include "Foundation/RunningProcesses.h"

#include "Support/TempDir.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <filesystem>

using namespace Foundation;
using Support::TempDir;

namespace {

using Names = std::set<std::string>;

/// A folder that looks like the kernel's, with processes that the test makes up.
class RunningProcessesTest : public testing::Test {
 protected:
    void addProcess(const std::string& pid, const std::string& executable,
                    const std::string& shortName, const std::string& environment = "") {
        proc.makeDirectory(pid);
        if (!executable.empty()) {
            std::filesystem::create_symlink(executable, proc / (pid + "/exe"));
        }
        proc.writeFile(pid + "/comm", shortName + "\n");
        proc.writeFile(pid + "/environ", environment);
    }
    Names applications() { return RunningProcesses::getApplications(proc.path().string()); }

    TempDir proc;
};

/// The environment of a process that a desktop launched.
std::string launched(const std::string& file, const std::string& pid) {
    using namespace std::string_literals;
    return "HOME=/home/a\0GIO_LAUNCHED_DESKTOP_FILE="s + file +
           "\0GIO_LAUNCHED_DESKTOP_FILE_PID="s + pid + "\0LANG=C\0"s;
}

}  // namespace

TEST_F(RunningProcessesTest, NamesTheProgramsInLowerCase) {
    addProcess("12", "/usr/bin/Reader", "Reader");
    addProcess("13", "/opt/other", "other");
    EXPECT_EQ(applications(), Names({"reader", "other"}));
}

TEST_F(RunningProcessesTest, NamesAScriptBesideItsInterpreter) {
    addProcess("12", "/usr/bin/python3", "newsreader");
    EXPECT_EQ(applications(), Names({"python3", "newsreader"}));
}

TEST_F(RunningProcessesTest, NamesTheDesktopFileThatLaunchedAProcess) {
    addProcess("12", "/usr/bin/reader", "reader",
               launched("/usr/share/applications/org.example.Reader.desktop", "12"));
    EXPECT_EQ(applications(), Names({"reader", "org.example.reader"}));
}

TEST_F(RunningProcessesTest, AnInheritedDesktopFileCountsForNothing) {
    addProcess("13", "/bin/sh", "sh", launched("/a/org.example.Terminal.desktop", "12"));
    EXPECT_EQ(applications(), Names({"sh"}));
}

TEST_F(RunningProcessesTest, AVariableThatOnlyBeginsAlikeIsAnother) {
    using namespace std::string_literals;
    addProcess("12", "/bin/a", "a",
               "GIO_LAUNCHED_DESKTOP_FILES=/x/b.desktop\0GIO_LAUNCHED_DESKTOP_FILE_PID=12"s);
    EXPECT_EQ(applications(), Names({"a"}));
}

TEST_F(RunningProcessesTest, TheLastWordOfAnIdentifierIsNoName) {
    addProcess("12", "/usr/bin/reader", "reader");
    EXPECT_EQ(applications().count("org.example.reader"), 0u);
}

TEST_F(RunningProcessesTest, AProgramThatWasUpdatedKeepsItsName) {
    addProcess("12", "/usr/bin/reader (deleted)", "reader");
    EXPECT_EQ(applications(), Names({"reader"}));
}

TEST_F(RunningProcessesTest, WhatHasEndedAndWhatIsTheKernelsHasNoProgram) {
    addProcess("12", "", "kworker");
    EXPECT_EQ(applications(), Names());
}

TEST_F(RunningProcessesTest, WhatIsNoProcessIsPassedOver) {
    addProcess("self", "/usr/bin/reader", "reader");
    proc.writeFile("uptime", "1.0");
    proc.makeDirectory("14");
    EXPECT_EQ(applications(), Names());
}

TEST_F(RunningProcessesTest, ProcessesOfOtherUsersDoNotCount) {
    if (getuid() != 0) GTEST_SKIP() << "only root can give files away";
    addProcess("12", "/usr/bin/reader", "reader");
    ASSERT_EQ(chown((proc / "12").c_str(), 1234, 1234), 0);
    EXPECT_EQ(applications(), Names());
}

TEST_F(RunningProcessesTest, WithoutTheKernelsFolderThereIsNothing) {
    EXPECT_EQ(RunningProcesses::getApplications(proc / "none"), Names());
}

TEST(RunningProcesses, FindsTheProcessThatAsks) {
    std::string own = std::filesystem::read_symlink("/proc/self/exe").filename().string();
    EXPECT_EQ(RunningProcesses::getApplications().count(own), 1u);
}
