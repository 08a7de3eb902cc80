#include "Model/LaunchManager.h"

#include "Foundation/UniqueFD.h"
#include "Model/ClientCore.h"
#include "Model/StorageTest.h"

#include <unistd.h>

#include <csignal>

using namespace Foundation;
using namespace Orvane;
namespace fs = std::filesystem;

namespace {

class LaunchManagerTest : public StorageTest {
 protected:
    LaunchManagerTest() {
        fs::create_directories(storage());
        writeFile("job.plist", "job");
    }

    /// Removes the job by a tool that is this script.
    void remove(const std::string& script) {
        const std::string tool = base.writeFile("tool", "#!/bin/sh\n" + script + "\n");
        fs::permissions(tool, fs::perms::owner_all);
        log.clear();
        LaunchManager::removeJob(urlOf("job.plist"), tool.c_str());
    }

    Support::LoggingOn logging{{}};
};

}  // namespace

TEST_F(LaunchManagerTest, UnloadsTheJobAndDeletesIt) {
    remove("echo \"$@\" >> '" + (base / "calls") + "'; test -f \"$2\"");
    EXPECT_EQ(base.readFile("calls"), "unload " + (storage() / "job.plist").string() + "\n");
    EXPECT_FALSE(has("job.plist"));
    EXPECT_EQ(log.lines(), (std::vector<std::string>{"Unregistering old svcd plist file",
                                                     "Deleting old svcd plist file"}));
}

TEST_F(LaunchManagerTest, DoesNothingWithoutAJob) {
    fs::remove(storage() / "job.plist");
    remove("touch '" + (base / "calls") + "'");
    EXPECT_FALSE(fs::exists(base / "calls"));
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(LaunchManagerTest, DeletesAJobThatTheToolDoesNotUnload) {
    remove("exit 3");
    EXPECT_EQ(log.count("LaunchManager: svcctl exited with status 3"), 1);
    EXPECT_FALSE(has("job.plist"));
}

TEST_F(LaunchManagerTest, SaysByWhichSignalTheToolEnded) {
    remove("kill -9 $$");
    EXPECT_EQ(log.count("LaunchManager: svcctl didn't exit (waitpid status = 9)"), 1);
    EXPECT_FALSE(has("job.plist"));
}

TEST_F(LaunchManagerTest, SaysThatItCouldNotWaitForTheTool) {
    // Nobody's children are waited for.
    const auto before = std::signal(SIGCHLD, SIG_IGN);
    remove("exit 0");
    std::signal(SIGCHLD, before);
    EXPECT_EQ(log.count("LaunchManager: waitpid itself returned err 10"), 1);
    EXPECT_FALSE(has("job.plist"));
}

TEST_F(LaunchManagerTest, TakesTheMissingToolsErrorForItsStatus) {
    LaunchManager::removeJob(urlOf("job.plist"), "/nonexistent/tool");
    EXPECT_EQ(log.count("LaunchManager: svcctl exited with status 2"), 1);
    EXPECT_FALSE(has("job.plist"));
}

TEST_F(LaunchManagerTest, HandsNoDescriptorOnToTheTool) {
    const UniqueFD ours(dup(STDIN_FILENO));
    ASSERT_TRUE(ours);
    const std::string name = "/proc/self/fd/" + std::to_string(ours.get());
    remove("test -e " + name + " && echo open >> '" + (base / "calls") + "'; exit 0");
    EXPECT_FALSE(fs::exists(base / "calls"));
    EXPECT_TRUE(fs::exists(name));
}

TEST_F(LaunchManagerTest, RemovesTheJobOfTheOldAgent) {
    const std::string job = "ServiceAgents/com.tarnwick.Orvane.Agent.plist";
    fs::create_directory(base.path() / "ServiceAgents");
    base.writeFile(job, "job");
    ClientCore::removeOldSvcdPlist();
    EXPECT_FALSE(fs::exists(base / job));
}
