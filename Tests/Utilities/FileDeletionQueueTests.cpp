#include "Utilities/FileDeletionQueue.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/NetError.h"
#include "Support/LogCapture.h"
#include "Utilities/FileUtils.h"
#include "Utilities/Files.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <cstdlib>
#include <fstream>
#include <optional>

using namespace Foundation;
using Orvane::FileDeletionQueue;
using Orvane::FileUtils;
namespace fs = std::filesystem;

namespace {

class FileDeletionQueueTest : public testing::Test {
 protected:
    ~FileDeletionQueueTest() override { FileDeletionQueue::shared().waitUntilIdle(); }

    static void wait() { FileDeletionQueue::shared().waitUntilIdle(); }
    static bool isBusy() { return FileUtils::isDeletingFilesAsynchronously(); }

    Files mFiles;
    Support::LogCapture mLog;
};

/// The names of this process's threads.
std::set<std::string> threadNames() {
    std::set<std::string> names;
    for (const auto& task : fs::directory_iterator("/proc/self/task")) {
        std::ifstream in(task.path() / "comm");
        std::string name;
        if (std::getline(in, name)) names.insert(name);
    }
    return names;
}

}  // namespace

TEST_F(FileDeletionQueueTest, DeletesFiles) {
    mFiles.writeFile("a", "");
    mFiles.writeFile("b", "");
    mFiles.writeFile("c", "");
    const Ref<FileUtils::ArrayOfURLs> urls =
        FileUtils::ArrayOfURLs::array({mFiles.url("a"), nullptr, mFiles.url("c")});
    FileUtils::asyncDeleteFiles(urls);
    wait();
    EXPECT_FALSE(isBusy());
    EXPECT_EQ(mFiles.names(), std::set<std::string>{"b"});
    EXPECT_TRUE(mLog.lines().empty());
}

TEST_F(FileDeletionQueueTest, DeletesADirectoryWithAllItHolds) {
    mFiles.makeDirectory("a/b");
    mFiles.writeFile("a/b/c", "");
    FileUtils::asyncDeleteDirectory(mFiles.url("a", true));
    wait();
    EXPECT_TRUE(mFiles.names().empty());
}

TEST_F(FileDeletionQueueTest, DeletesPlainlyWhatIsNoDirectory) {
    mFiles.makeDirectory("kept");
    mFiles.writeFile("file", "");
    fs::create_symlink("kept", mFiles.path() / "link");
    FileUtils::asyncDeleteDirectory(mFiles.url("file", true));
    FileUtils::asyncDeleteDirectory(mFiles.url("link", true));
    wait();
    EXPECT_EQ(mFiles.names(), std::set<std::string>{"kept"});
    EXPECT_TRUE(mLog.lines().empty());
}

TEST_F(FileDeletionQueueTest, DeletesNoDirectoryAsAFile) {
    mFiles.makeDirectory("a");
    URL* const url = mFiles.url("a", true);
    const Ref<FileUtils::ArrayOfURLs> urls = FileUtils::ArrayOfURLs::array({url});
    FileUtils::asyncDeleteFiles(urls);
    wait();
    EXPECT_TRUE(mFiles.has("a"));
    EXPECT_EQ(mLog.lines(), std::vector<std::string>{OVFormat("[WARNING] Deleting <%@> got %@", url,
                                                              NetError(1, EISDIR))});
}

TEST_F(FileDeletionQueueTest, AcceptsNull) {
    FileUtils::asyncDeleteFiles(nullptr);
    FileUtils::asyncDeleteDirectory(nullptr);
    EXPECT_FALSE(isBusy());
}

TEST_F(FileDeletionQueueTest, IsBusyUntilItsJobsAreDone) {
    std::optional<AutoreleasePool> pool;
    pool.emplace();
    URL* const missing = mFiles.url("missing");
    mFiles.writeFile("file", "");
    const Ref<FileUtils::ArrayOfURLs> first = FileUtils::ArrayOfURLs::array({missing});
    const Ref<FileUtils::ArrayOfURLs> second = FileUtils::ArrayOfURLs::array({mFiles.url("file")});
    EXPECT_FALSE(isBusy());
    // The warning needs a pool, which it cannot have while this thread has one: the first job
    // cannot end, and the second one waits its turn.
    FileUtils::asyncDeleteFiles(first);
    FileUtils::asyncDeleteFiles(second);
    EXPECT_TRUE(isBusy());
    EXPECT_TRUE(mFiles.has("file"));
    EXPECT_TRUE(mLog.lines().empty());
    EXPECT_TRUE(threadNames().contains("OV.FileDeletion"));
    pool.reset();
    wait();
    EXPECT_FALSE(isBusy());
    EXPECT_FALSE(mFiles.has("file"));
    EXPECT_EQ(mLog.lines(), std::vector<std::string>{OVFormat("[WARNING] Deleting <%@> got %@",
                                                              missing, NetError(15, -12))});
}

TEST_F(FileDeletionQueueTest, NeedsNoPoolButForItsWarning) {
    mFiles.makeDirectory("a");
    std::optional<AutoreleasePool> pool;
    pool.emplace();
    FileUtils::asyncDeleteDirectory(mFiles.url("a", true));
    wait();
    EXPECT_TRUE(mFiles.names().empty());
}

TEST_F(FileDeletionQueueTest, StartsAThreadAgainAfterItsThreadHasEnded) {
    FileDeletionQueue queue;
    for (int i = 0; i < 50; ++i) {
        queue.add({{mFiles.writeFile("a", ""), "a"}}, false);
        queue.waitUntilIdle();
        EXPECT_FALSE(mFiles.has("a"));
    }
}

TEST_F(FileDeletionQueueTest, FinishesWhatIsPendingAtItsEnd) {
    std::optional<FileDeletionQueue> queue;
    queue.emplace();
    for (int i = 0; i < 100; ++i) {
        const std::string path = mFiles.writeFile(std::to_string(i), "");
        queue->add({{path, path}}, false);
    }
    queue->add({{mFiles / "missing", "url"}}, false);
    queue.reset();
    EXPECT_TRUE(mFiles.names().empty());
    EXPECT_EQ(mLog.count("Deleting <url> got "), 1);
}

namespace {

/// Exits with jobs pending, of which one warns.
void exitWithJobs(Files& files, bool insidePool) {
    std::optional<AutoreleasePool> pool;
    if (insidePool) pool.emplace();
    Foundation::setLogSink(nullptr);
    setenv("OVUseSystemLog", "0", 1);
    const Ref<FileUtils::ArrayOfURLs> urls =
        FileUtils::ArrayOfURLs::array({files.url("a"), files.url("missing"), files.url("b")});
    FileUtils::asyncDeleteFiles(urls);
    std::exit(0);
}

}  // namespace

TEST_F(FileDeletionQueueTest, FinishesWhatIsPendingAtExit) {
    mFiles.writeFile("a", "");
    mFiles.writeFile("b", "");
    EXPECT_EXIT(exitWithJobs(mFiles, false), testing::ExitedWithCode(0),
                "Deleting <file:.*missing");
    EXPECT_TRUE(mFiles.names().empty());
}

TEST_F(FileDeletionQueueTest, NeverHoldsUpAnExitInsideAPool) {
    mFiles.writeFile("a", "");
    EXPECT_EXIT(exitWithJobs(mFiles, true), testing::ExitedWithCode(0), "");
}
