#include "Foundation/AtomicFile.h"

#include "Support/FileAccess.h"
#include "Support/TempDir.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <cerrno>
#include <filesystem>

using namespace Foundation;
namespace fs = std::filesystem;

namespace {

class AtomicFileTest : public testing::Test {
 protected:
    /// The permissions of a file in the directory, in octal digits.
    unsigned mode(const std::string& name) const {
        struct stat info = {};
        EXPECT_EQ(stat((mDir / name).c_str(), &info), 0);
        return info.st_mode & 0777;
    }
    /// How many names the directory holds.
    long entries() const {
        return std::distance(fs::directory_iterator(mDir.path()), fs::directory_iterator());
    }

    Support::TempDir mDir;
};

}  // namespace

TEST_F(AtomicFileTest, MakesANewFileThatOnlyItsUserReads) {
    EXPECT_EQ(AtomicFile::write(mDir / "a", std::string_view("one\0two", 7)), 0);
    EXPECT_EQ(mDir.readFile("a"), std::string("one\0two", 7));
    EXPECT_EQ(mode("a"), 0600u);
    EXPECT_EQ(entries(), 1);
}

TEST_F(AtomicFileTest, ReplacesAFileAndKeepsItsPermissions) {
    const std::string path = mDir.writeFile("a", "a longer text than the next");
    chmod(path.c_str(), 0640);
    struct stat before = {};
    stat(path.c_str(), &before);
    EXPECT_EQ(AtomicFile::write(path, "new"), 0);
    EXPECT_EQ(mDir.readFile("a"), "new");
    EXPECT_EQ(mode("a"), 0640u);
    EXPECT_EQ(entries(), 1);
    struct stat after = {};
    stat(path.c_str(), &after);
    EXPECT_NE(before.st_ino, after.st_ino) << "the file was written in place";
}

TEST_F(AtomicFileTest, WritesWhatASymbolicLinkLeadsTo) {
    mDir.makeDirectory("real");
    mDir.writeFile("real/file", "old");
    fs::create_symlink("real/file", mDir.path() / "inner");
    fs::create_symlink(mDir.path() / "inner", mDir.path() / "outer");
    EXPECT_EQ(AtomicFile::write(mDir / "outer", "new"), 0);
    EXPECT_EQ(mDir.readFile("real/file"), "new");
    EXPECT_TRUE(fs::is_symlink(mDir.path() / "outer"));
    EXPECT_TRUE(fs::is_symlink(mDir.path() / "inner"));
}

TEST_F(AtomicFileTest, MakesTheFileThatADanglingLinkNames) {
    fs::create_symlink("missing", mDir.path() / "link");
    EXPECT_EQ(AtomicFile::write(mDir / "link", "new"), 0);
    EXPECT_EQ(mDir.readFile("missing"), "new");
    EXPECT_TRUE(fs::is_symlink(mDir.path() / "link"));
}

TEST_F(AtomicFileTest, GivesUpOnLinksThatRunInACircle) {
    fs::create_symlink("b", mDir.path() / "a");
    fs::create_symlink("a", mDir.path() / "b");
    EXPECT_EQ(AtomicFile::write(mDir / "a", "new"), ELOOP);
}

TEST_F(AtomicFileTest, LeavesTheOldFileAndNothingElseWhenTheDiskIsFull) {
    mDir.writeFile("a", "old");
    const std::string big(100000, 'x');
    {
        const Support::FileSizeLimit limit(4096);
        EXPECT_EQ(AtomicFile::write(mDir / "a", big), EFBIG);
        EXPECT_EQ(AtomicFile::write(mDir / "b", big), EFBIG);
    }
    EXPECT_EQ(mDir.readFile("a"), "old");
    EXPECT_EQ(entries(), 1);
}

TEST_F(AtomicFileTest, FailsWhereTheDirectoryCannotBeWritten) {
    const std::string directory = mDir.makeDirectory("closed");
    mDir.writeFile("closed/a", "old");
    chmod(directory.c_str(), 0555);
    chmod(mDir.path().c_str(), 0755);
    {
        const Support::OrdinaryFileAccess access;
        EXPECT_EQ(AtomicFile::write(directory + "/a", "new"), EACCES);
        EXPECT_EQ(AtomicFile::write(directory + "/b", "new"), EACCES);
    }
    chmod(directory.c_str(), 0755);
    EXPECT_EQ(mDir.readFile("closed/a"), "old");
    EXPECT_FALSE(fs::exists(directory + "/b"));
}

TEST_F(AtomicFileTest, RefusesWhatCannotBeAFile) {
    EXPECT_EQ(AtomicFile::write(mDir / "missing/a", "new"), ENOENT);
    mDir.writeFile("file", "");
    EXPECT_EQ(AtomicFile::write(mDir / "file/a", "new"), ENOTDIR);
    EXPECT_EQ(AtomicFile::write(mDir.makeDirectory("directory"), "new"), EISDIR);
    mkfifo((mDir / "pipe").c_str(), 0600);
    EXPECT_EQ(AtomicFile::write(mDir / "pipe", "new"), EINVAL);
    EXPECT_EQ(AtomicFile::write("", "new"), ENOENT);
    EXPECT_EQ(entries(), 3);
}
