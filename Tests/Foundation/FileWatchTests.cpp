#include "Foundation/FileWatch.h"

#include "Support/LogCapture.h"
#include "Support/TempDir.h"
#include "Support/TurnUntil.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <stdexcept>

using namespace Foundation;
using Support::LogCapture;
using Support::TempDir;
using Support::turnUntil;

namespace fs = std::filesystem;

namespace {

/// Looks at the content as a user of the watch does: in the handler, and never otherwise.
class FileWatchTest : public testing::Test {
 protected:
    void watch(const std::string& name) {
        mName = name;
        fileWatch = std::make_unique<FileWatch>(folder / name, [this] { look(); });
        look();
    }
    void look() { seen = fs::exists(folder / mName) ? folder.readFile(mName) : "(none)"; }
    bool sees(const std::string& content) {
        return turnUntil([&] { return seen == content; });
    }
    /// As careful programs write: a reader finds the old content or the new one.
    void replace(const std::string& name, const std::string& content) {
        folder.writeFile("temporary", content);
        fs::rename(folder / "temporary", folder / name);
    }
    void replaceLink(const std::string& name, const std::string& target) {
        fs::create_symlink(target, folder / "temporary");
        fs::rename(folder / "temporary", folder / name);
    }

    TempDir folder;
    std::string seen;
    std::unique_ptr<FileWatch> fileWatch;

 private:
    std::string mName;
};

}  // namespace

TEST_F(FileWatchTest, SeesAFileWrittenReplacedRemovedAndMadeAgain) {
    folder.writeFile("file", "one");
    watch("file");
    folder.writeFile("file", "two");
    EXPECT_TRUE(sees("two")) << seen;
    replace("file", "three");
    EXPECT_TRUE(sees("three")) << seen;
    fs::remove(folder / "file");
    EXPECT_TRUE(sees("(none)")) << seen;
    folder.writeFile("file", "four");
    EXPECT_TRUE(sees("four")) << seen;
}

TEST_F(FileWatchTest, SeesAFileThatDidNotExist) {
    watch("file");
    folder.writeFile("file", "one");
    EXPECT_TRUE(sees("one")) << seen;
}

TEST_F(FileWatchTest, SeesTheFileBehindALinkWrittenAndReplaced) {
    folder.makeDirectory("run");
    folder.writeFile("run/file", "one");
    fs::create_symlink("run/file", folder / "link");
    watch("link");
    folder.writeFile("run/file", "two");
    EXPECT_TRUE(sees("two")) << seen;
    replace("run/file", "three");
    EXPECT_TRUE(sees("three")) << seen;
}

TEST_F(FileWatchTest, SeesALinkReplacedAndThenItsNewFileWritten) {
    folder.makeDirectory("a");
    folder.makeDirectory("b");
    folder.writeFile("a/file", "one");
    folder.writeFile("b/file", "two");
    fs::create_symlink("a/file", folder / "link");
    watch("link");
    replaceLink("link", folder / "b/file");
    EXPECT_TRUE(sees("two")) << seen;
    folder.writeFile("b/file", "three");
    EXPECT_TRUE(sees("three")) << seen;
    replace("link", "no link any more");
    EXPECT_TRUE(sees("no link any more")) << seen;
}

TEST_F(FileWatchTest, SeesALinkInTheMiddleReplaced) {
    folder.writeFile("first", "one");
    folder.writeFile("second", "two");
    fs::create_symlink("first", folder / "middle");
    fs::create_symlink("middle", folder / "link");
    watch("link");
    replaceLink("middle", "second");
    EXPECT_TRUE(sees("two")) << seen;
}

TEST_F(FileWatchTest, ALinkToItselfIsNoFile) {
    fs::create_symlink("link", folder / "link");
    fileWatch = std::make_unique<FileWatch>(folder / "link", [this] { seen = "changed"; });
    fs::remove(folder / "link");
    EXPECT_TRUE(sees("changed"));
}

TEST_F(FileWatchTest, ReportsWhatTheHandlerThrows) {
    LogCapture log;
    fileWatch =
        std::make_unique<FileWatch>(folder / "file", [] { throw std::runtime_error("no good"); });
    folder.writeFile("file", "one");
    EXPECT_TRUE(turnUntil([&] {
        return log.contains("\"no good\" caught in void Foundation::FileWatch::fileChanged()");
    }));
}
