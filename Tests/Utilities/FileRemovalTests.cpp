#include "Utilities/FileRemoval.h"

#include "Support/FileAccess.h"
#include "Utilities/Files.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <cerrno>

using namespace Orvane;
namespace fs = std::filesystem;

namespace {

class FileRemovalTest : public testing::Test {
 protected:
    Files mFiles;
    std::size_t mRemoved = 99;
};

}  // namespace

TEST_F(FileRemovalTest, RemovesADirectoryWithAllItHolds) {
    mFiles.makeDirectory("a/b/c");
    mFiles.writeFile("a/one", "");
    mFiles.writeFile("a/.two", "");
    mFiles.writeFile("a/b/c/three", "");
    mFiles.writeFile("kept", "");
    EXPECT_EQ(FileRemoval::removeDirectory(mFiles / "a", mRemoved), 0);
    EXPECT_EQ(mRemoved, 6u);
    EXPECT_EQ(mFiles.names(), std::set<std::string>{"kept"});
}

TEST_F(FileRemovalTest, RemovesSymbolicLinksAndNotWhatTheyLeadTo) {
    mFiles.makeDirectory("kept");
    mFiles.writeFile("kept/file", "");
    mFiles.makeDirectory("a");
    fs::create_symlink("../kept", mFiles.path() / "a/directory");
    fs::create_symlink("../kept/file", mFiles.path() / "a/file");
    fs::create_symlink("nowhere", mFiles.path() / "a/dangling");
    EXPECT_EQ(FileRemoval::removeDirectory(mFiles / "a", mRemoved), 0);
    EXPECT_EQ(mRemoved, 4u);
    EXPECT_EQ(mFiles.names(), (std::set<std::string>{"kept", "kept/file"}));
}

TEST_F(FileRemovalTest, DoesNotTakeALinkForADirectory) {
    mFiles.makeDirectory("kept");
    fs::create_symlink("kept", mFiles.path() / "link");
    EXPECT_EQ(FileRemoval::removeDirectory(mFiles / "link", mRemoved), ENOTDIR);
    EXPECT_EQ(mRemoved, 0u);
    EXPECT_FALSE(FileRemoval::isDirectory(mFiles / "link"));
    EXPECT_TRUE(FileRemoval::isDirectory(mFiles / "kept"));
    EXPECT_EQ(FileRemoval::removeFile(mFiles / "link"), 0);
    EXPECT_EQ(mFiles.names(), std::set<std::string>{"kept"});
}

TEST_F(FileRemovalTest, StopsAtTheFirstFailure) {
    const std::string closed = mFiles.makeDirectory("a/closed");
    mFiles.writeFile("a/closed/file", "");
    mFiles.writeFile("a/file", "");
    for (const fs::path& path : {mFiles.path(), mFiles.path() / "a", fs::path(closed)}) {
        chmod(path.c_str(), 0777);
    }
    chmod(closed.c_str(), 0555);
    {
        const Support::OrdinaryFileAccess access;
        EXPECT_EQ(FileRemoval::removeDirectory(mFiles / "a", mRemoved), EACCES);
    }
    EXPECT_LE(mRemoved, 1u);
    EXPECT_TRUE(mFiles.has("a/closed/file"));
    chmod(closed.c_str(), 0755);
}

TEST_F(FileRemovalTest, TellsWhatIsMissing) {
    mFiles.writeFile("file", "");
    EXPECT_EQ(FileRemoval::removeDirectory(mFiles / "missing", mRemoved), ENOENT);
    EXPECT_EQ(FileRemoval::removeDirectory(mFiles / "file", mRemoved), ENOTDIR);
    EXPECT_EQ(FileRemoval::removeDirectory("", mRemoved), ENOENT);
    EXPECT_EQ(FileRemoval::removeFile(mFiles / "missing"), ENOENT);
    EXPECT_EQ(FileRemoval::removeFile(mFiles.makeDirectory("directory")), EISDIR);
    EXPECT_TRUE(mFiles.has("file"));
}
