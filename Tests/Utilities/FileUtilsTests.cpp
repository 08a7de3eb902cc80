#include "Utilities/FileUtils.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Clock.h"
#include "Foundation/Data.h"
#include "Support/FileAccess.h"
#include "Support/LogCapture.h"
#include "Utilities/Files.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <sys/xattr.h>

#include <cerrno>
#include <cstdlib>
#include <ctime>

using namespace Foundation;
using Orvane::FileUtils;
namespace fs = std::filesystem;

namespace {

/// Files, with the log in view and every facility of it on.
class FileUtilsTest : public testing::Test {
 protected:
    std::string pathOf(URLReturner url) {
        const Ref<URL> held(std::move(url));
        return held ? held->getFileSystemRepresentation() : "(null)";
    }
    /// Lets every user into a directory, so that another's permissions on what is in it decide.
    void openToAll(const std::string& directory) const {
        chmod(mFiles.path().c_str(), 0755);
        chmod(directory.c_str(), 0777);
    }
    mode_t mode(std::string_view name) const {
        struct stat info = {};
        EXPECT_EQ(stat((mFiles / name).c_str(), &info), 0);
        return info.st_mode & 07777;
    }

    Files mFiles;
    URL* const mWeb = mFiles.other("http://a/b/");
    Support::LogCapture mLog;
    Support::LoggingOn mLoggingOn{{}};
    NetError mError{NetError::kPOSIX, 1};
};

}  // namespace

TEST_F(FileUtilsTest, TellsWhatExists) {
    mFiles.writeFile("file", "");
    fs::create_symlink("file", mFiles.path() / "link");
    fs::create_symlink("missing", mFiles.path() / "dangling");
    EXPECT_TRUE(FileUtils::exists(mFiles.url("file")));
    EXPECT_TRUE(FileUtils::exists(mFiles.url("link")));
    EXPECT_TRUE(FileUtils::exists(mFiles.url("", true)));
    EXPECT_FALSE(FileUtils::exists(mFiles.url("dangling")));
    EXPECT_FALSE(FileUtils::exists(mFiles.url("missing")));
    EXPECT_FALSE(FileUtils::exists(mFiles.url("file/below")));
    EXPECT_FALSE(FileUtils::exists(nullptr));
    EXPECT_TRUE(mLog.lines().empty());
}

TEST_F(FileUtilsTest, WarnsWhereItCannotTellWhatExists) {
    fs::create_symlink("circle", mFiles.path() / "circle");
    URL* const circle = mFiles.url("circle");
    EXPECT_FALSE(FileUtils::exists(circle));
    EXPECT_FALSE(FileUtils::exists(mWeb));
    EXPECT_EQ(
        mLog.lines(),
        (std::vector<std::string>{
            OVFormat("[WARNING] Checking for existence of %@ failed with error %d", circle, ELOOP),
            OVFormat("[WARNING] Checking for existence of http://a/b/ failed with error %d",
                     EINVAL)}));
}

TEST_F(FileUtilsTest, CreatesDirectoriesForTheirUserAlone) {
    umask(022);
    EXPECT_TRUE(FileUtils::createDirectory(mFiles.url("a/b/c", true), mError));
    EXPECT_EQ(mError, NetError::None);
    EXPECT_EQ(mFiles.names(), (std::set<std::string>{"a", "a/b", "a/b/c"}));
    EXPECT_EQ(mode("a"), 0700u);
    EXPECT_EQ(mode("a/b/c"), 0700u);
}

TEST_F(FileUtilsTest, TakesADirectoryThatIsThereAlready) {
    mFiles.makeDirectory("a");
    fs::create_symlink("a", mFiles.path() / "link");
    chmod((mFiles / "a").c_str(), 0750);
    EXPECT_TRUE(FileUtils::createDirectory(mFiles.url("a", true), mError));
    EXPECT_EQ(mError, NetError::None);
    EXPECT_TRUE(FileUtils::createDirectory(mFiles.url("link", true)));
    EXPECT_EQ(mode("a"), 0750u);
    EXPECT_TRUE(mLog.lines().empty());
}

TEST_F(FileUtilsTest, TellsWhyItCannotCreateADirectory) {
    mFiles.writeFile("file", "");
    EXPECT_FALSE(FileUtils::createDirectory(mFiles.url("file", true), mError));
    EXPECT_EQ(mError, NetError(15, -10));
    EXPECT_FALSE(FileUtils::createDirectory(mFiles.url("file/below", true), mError));
    EXPECT_EQ(mError, NetError(15, -12));
    EXPECT_FALSE(FileUtils::createDirectory(mWeb, mError));
    EXPECT_EQ(mError, NetError(15, -11));
    const std::string closed = mFiles.makeDirectory("closed");
    openToAll(closed);
    chmod(closed.c_str(), 0555);
    const Support::OrdinaryFileAccess access;
    EXPECT_FALSE(FileUtils::createDirectory(mFiles.url("closed/a", true), mError));
    EXPECT_EQ(mError, NetError(15, -13));
}

TEST_F(FileUtilsTest, WarnsWhereItCannotCreateADirectory) {
    mFiles.writeFile("file", "");
    URL* const url = mFiles.url("file", true);
    EXPECT_FALSE(FileUtils::createDirectory(url));
    EXPECT_EQ(mLog.lines(),
              std::vector<std::string>{OVFormat("[WARNING] Failed to create %@, with error %@", url,
                                                NetError(15, -10))});
}

TEST_F(FileUtilsTest, AssertsThatADirectoryIsToBeCreated) {
    const auto assertion = [&](URL* url) -> std::string {
        try {
            FileUtils::createDirectory(url, mError);
        } catch (const AssertionFailure& failure) {
            return failure.what();
        }
        return "none";
    };
    EXPECT_EQ(assertion(nullptr), "newDirURL");
    EXPECT_EQ(assertion(mFiles.url("a")), "newDirURL->hasDirectoryPath()");
    EXPECT_TRUE(mFiles.names().empty());
}

TEST_F(FileUtilsTest, MovesOverWhatIsThere) {
    mFiles.writeFile("a", "new");
    mFiles.writeFile("b", "old");
    EXPECT_TRUE(FileUtils::move(mFiles.url("a"), mFiles.url("b"), mError));
    EXPECT_EQ(mError, NetError::None);
    EXPECT_EQ(mFiles.readFile("b"), "new");
    EXPECT_TRUE(FileUtils::move(mFiles.url("b"), mFiles.url("c")));
    EXPECT_EQ(mFiles.names(), std::set<std::string>{"c"});
}

TEST_F(FileUtilsTest, TellsWhyItCannotMove) {
    mFiles.writeFile("a", "");
    mFiles.makeDirectory("directory");
    EXPECT_FALSE(FileUtils::move(mFiles.url("missing"), mFiles.url("b"), mError));
    EXPECT_EQ(mError, NetError(1, ENOENT));
    EXPECT_FALSE(FileUtils::move(mFiles.url("a"), mFiles.url("directory", true), mError));
    EXPECT_EQ(mError, NetError(1, EISDIR));
    EXPECT_FALSE(FileUtils::move(mFiles.url("a"), mWeb, mError));
    EXPECT_EQ(mError, NetError(1, EINVAL));
    EXPECT_FALSE(FileUtils::move(nullptr, mFiles.url("b")));
}

TEST_F(FileUtilsTest, MovesToTheTrash) {
    mFiles.makeDirectory("Database");
    EXPECT_TRUE(FileUtils::moveToTrash(mFiles.url("Database", true), mError));
    EXPECT_EQ(mError, NetError::None);
    EXPECT_FALSE(mFiles.has("Database"));
    fs::remove_all(fs::path(std::getenv("XDG_DATA_HOME")) / "Trash");
    EXPECT_FALSE(FileUtils::moveToTrash(mFiles.url("Database", true), mError));
    EXPECT_EQ(mError, NetError(1, ENOENT));
    EXPECT_FALSE(FileUtils::moveToTrash(nullptr, mError));
    EXPECT_EQ(mError, NetError(1, EINVAL));
}

TEST_F(FileUtilsTest, DeletesFiles) {
    mFiles.writeFile("a", "");
    mFiles.writeFile("b", "");
    EXPECT_TRUE(FileUtils::deleteFile(mFiles.url("a"), mError));
    EXPECT_EQ(mError, NetError::None);
    EXPECT_TRUE(FileUtils::deleteFile(mFiles.url("b")));
    EXPECT_TRUE(mFiles.names().empty());
    EXPECT_FALSE(FileUtils::deleteFile(mFiles.url("a"), mError));
    EXPECT_EQ(mError, NetError(15, -12));
    EXPECT_FALSE(FileUtils::deleteFile(mWeb, mError));
    EXPECT_EQ(mError, NetError(15, -11));
    mFiles.makeDirectory("directory");
    EXPECT_FALSE(FileUtils::deleteFile(mFiles.url("directory", true), mError));
    EXPECT_EQ(mError, NetError(1, EISDIR));
    EXPECT_FALSE(FileUtils::deleteFile(nullptr));
}

TEST_F(FileUtilsTest, DeletesADirectoryAndCountsItems) {
    mFiles.makeDirectory("a/b");
    mFiles.writeFile("a/one", "");
    mFiles.writeFile("a/b/two", "");
    EXPECT_EQ(FileUtils::deleteDirectory(mFiles.url("a", true), mError), 4u);
    EXPECT_EQ(mError, NetError::None);
    EXPECT_TRUE(mFiles.names().empty());
    mFiles.makeDirectory("empty");
    EXPECT_EQ(FileUtils::deleteDirectory(mFiles.url("empty", true), mError), 1u);
}

TEST_F(FileUtilsTest, CountsNothingWhereADirectoryStays) {
    EXPECT_EQ(FileUtils::deleteDirectory(mFiles.url("missing", true), mError), 0u);
    EXPECT_EQ(mError, NetError(15, -12));
    const std::string directory = mFiles.makeDirectory("outer/a");
    mFiles.writeFile("outer/a/one", "");
    openToAll(directory);
    const Support::OrdinaryFileAccess access;
    EXPECT_EQ(FileUtils::deleteDirectory(mFiles.url("outer/a", true), mError), 0u);
    EXPECT_EQ(mError, NetError(15, -13));
}

TEST_F(FileUtilsTest, FindsAFreeName) {
    mFiles.writeFile("name.ext", "");
    EXPECT_EQ(pathOf(FileUtils::pathWithUniqueFilenameForPath(mFiles.url("other.ext"))),
              mFiles / "other.ext");
    EXPECT_EQ(pathOf(FileUtils::pathWithUniqueFilenameForPath(mFiles.url("name.ext"))),
              mFiles / "name-1.ext");
    mFiles.writeFile("name-1.ext", "");
    EXPECT_EQ(pathOf(FileUtils::pathWithUniqueFilenameForPath(mFiles.url("name.ext"))),
              mFiles / "name-2.ext");
}

TEST_F(FileUtilsTest, SplitsANameAtItsFirstDot) {
    const std::string inner = mFiles.makeDirectory("d.d");
    const std::pair<const char*, const char*> cases[] = {
        {"d.d/a.tar.gz", "d.d/a-1.tar.gz"}, {"d.d/name", "d.d/name-1"},
        {"d.d/.hidden", "d.d/-1.hidden"},   {"d.d/end.", "d.d/end-1."},
        {"d.d/\xff.x", "d.d/\xff-1.x"},
    };
    for (const auto& [name, wanted] : cases) {
        mFiles.writeFile(name, "");
        EXPECT_EQ(pathOf(FileUtils::pathWithUniqueFilenameForPath(mFiles.url(name))),
                  mFiles / wanted);
    }
}

TEST_F(FileUtilsTest, KeepsTheDirectoryFlagOfAFreeName) {
    mFiles.makeDirectory("a.b");
    mFiles.makeDirectory("c");
    const Ref<URL> directory = FileUtils::pathWithUniqueFilenameForPath(mFiles.url("a.b", true));
    EXPECT_EQ(directory->getFileSystemRepresentation(), mFiles / "a-1.b");
    EXPECT_TRUE(directory->hasDirectoryPath());
    const Ref<URL> file = FileUtils::pathWithUniqueFilenameForPath(mFiles.url("c"));
    EXPECT_FALSE(file->hasDirectoryPath());
}

TEST_F(FileUtilsTest, TakesADanglingLinksNameAsTaken) {
    fs::create_symlink("missing", mFiles.path() / "link");
    EXPECT_EQ(pathOf(FileUtils::pathWithUniqueFilenameForPath(mFiles.url("link"))),
              mFiles / "link-1");
    EXPECT_EQ(pathOf(FileUtils::pathWithUniqueFilenameForPath(nullptr)), "(null)");
}

TEST_F(FileUtilsTest, TellsWhenAFileWasModified) {
    const std::string path = mFiles.writeFile("file", "");
    const timespec times[] = {{0, UTIME_OMIT}, {1767225600, 250000000}};
    ASSERT_EQ(utimensat(AT_FDCWD, path.c_str(), times, 0), 0);
    const Ref<Date> date = FileUtils::getFileModDate(mFiles.url("file"));
    ASSERT_NE(date.get(), nullptr);
    EXPECT_EQ(date->getAbsoluteTime(), 1767225600.25 - kUnixEpochOffset);
}

TEST_F(FileUtilsTest, TellsWhenAFileWasCreated) {
    const std::string path = mFiles.writeFile("file", "");
    struct statx info = {};
    ASSERT_EQ(statx(AT_FDCWD, path.c_str(), 0, STATX_BTIME, &info), 0);
    if (!(info.stx_mask & STATX_BTIME)) GTEST_SKIP() << "the file system does not keep it";
    const timespec times[] = {{0, UTIME_OMIT}, {1, 0}};
    ASSERT_EQ(utimensat(AT_FDCWD, path.c_str(), times, 0), 0);
    const Ref<Date> date = FileUtils::getFileCreationDate(mFiles.url("file"));
    ASSERT_NE(date.get(), nullptr);
    EXPECT_NEAR(date->getAbsoluteTime(),
                static_cast<double>(info.stx_btime.tv_sec) - kUnixEpochOffset, 1.0);
}

TEST_F(FileUtilsTest, TellsAFilesLength) {
    mFiles.writeFile("file", std::string(12345, 'x'));
    EXPECT_EQ(FileUtils::getFileLength(mFiles.url("file")), 12345);
    EXPECT_TRUE(mLog.lines().empty());
}

TEST_F(FileUtilsTest, LogsWhatItCannotTellOfAFile) {
    URL* const url = mFiles.url("missing");
    EXPECT_EQ(Ref<Date>(FileUtils::getFileModDate(url)).get(), nullptr);
    EXPECT_EQ(Ref<Date>(FileUtils::getFileCreationDate(url)).get(), nullptr);
    EXPECT_EQ(FileUtils::getFileLength(url), 0);
    EXPECT_EQ(FileUtils::getFileLength(nullptr), 0);
    EXPECT_EQ(mLog.lines(),
              (std::vector<std::string>{
                  OVFormat("FileUtils::getFileModDate(%@) failed with error %d", url, ENOENT),
                  OVFormat("FileUtils::getFileCreationDate(%@) failed with error %d", url, ENOENT),
                  OVFormat("FileUtils::getFileLength(%@) failed with error %d", url, ENOENT),
                  OVFormat("FileUtils::getFileLength((null)) failed with error %d", EINVAL)}));
}

TEST_F(FileUtilsTest, ListsADirectory) {
    mFiles.makeDirectory("a/c");
    mFiles.writeFile("a/b d", "");
    mFiles.writeFile("a/.e", "");
    mFiles.writeFile("a/f\xff", "");
    fs::create_symlink("c", mFiles.path() / "a/link");
    const Ref<FileUtils::ArrayOfURLs> urls =
        FileUtils::getDirectoryContents(mFiles.url("a", true), mError);
    ASSERT_NE(urls.get(), nullptr);
    EXPECT_EQ(mError, NetError::None);
    std::vector<std::string> found;
    for (const URL* url : *urls) {
        found.push_back(url->getFileSystemRepresentation() + (url->hasDirectoryPath() ? "/" : ""));
    }
    EXPECT_EQ(found, (std::vector<std::string>{mFiles / "a/.e", mFiles / "a/b d", mFiles / "a/c/",
                                               mFiles / "a/f\xff", mFiles / "a/link"}));
}

TEST_F(FileUtilsTest, LogsWhyItCannotListADirectory) {
    mFiles.makeDirectory("empty");
    URL* const url = mFiles.url("missing", true);
    const Ref<FileUtils::ArrayOfURLs> none = FileUtils::getDirectoryContents(url, mError);
    EXPECT_EQ(none.get(), nullptr);
    EXPECT_EQ(mError, NetError(15, -12));
    EXPECT_EQ(mLog.lines(),
              std::vector<std::string>{OVFormat(
                  "FileUtils::getDirectoryContents(%@) failed with error %@", url, mError)});
    const Ref<FileUtils::ArrayOfURLs> empty =
        FileUtils::getDirectoryContents(mFiles.url("empty", true), mError);
    ASSERT_NE(empty.get(), nullptr);
    EXPECT_TRUE(empty->isEmpty());
}

TEST_F(FileUtilsTest, MarksADownloadedFileWithoutCredentials) {
    const std::string path = mFiles.writeFile("file", "");
    if (setxattr(path.c_str(), "user.test", "", 0, 0) != 0) GTEST_SKIP() << "no attributes here";
    const auto attribute = [&](const char* name) {
        char value[256];
        const ssize_t length = getxattr(path.c_str(), name, value, sizeof value);
        return length < 0 ? "(none)" : std::string(value, static_cast<std::size_t>(length));
    };
    const Ref<String> title = String::string("Title");
    const Ref<String> name = String::string("Ann");
    const Ref<String> email = String::string("ann@a.b");
    FileUtils::markQuarantined(mFiles.url("file"), mFiles.other("http://u:secret@a/b"),
                               mFiles.other("https://u@c/d"), title, name, email);
    EXPECT_EQ(attribute("user.xdg.origin.url"), "http://a/b");
    EXPECT_EQ(attribute("user.xdg.referrer.url"), "https://c/d");
    EXPECT_EQ(attribute("user.xdg.publisher"), "Title");
    EXPECT_EQ(attribute("user.xdg.creator"), "Ann <ann@a.b>");
    FileUtils::markQuarantined(mFiles.url("file"), mFiles.other("http://a/c"), nullptr, nullptr,
                               nullptr, email);
    EXPECT_EQ(attribute("user.xdg.origin.url"), "http://a/c");
    EXPECT_EQ(attribute("user.xdg.referrer.url"), "(none)");
    EXPECT_EQ(attribute("user.xdg.publisher"), "(none)");
    EXPECT_EQ(attribute("user.xdg.creator"), "ann@a.b");
    EXPECT_TRUE(mLog.lines().empty());
}

TEST_F(FileUtilsTest, LogsWhatItCannotMark) {
    FileUtils::markQuarantined(mFiles.url("missing"), mWeb, nullptr, nullptr);
    FileUtils::markQuarantined(nullptr, mWeb, nullptr, nullptr);
    EXPECT_EQ(mLog.lines(),
              (std::vector<std::string>{
                  OVFormat("Got error %d from _PFSetFileQuarantineProperties", ENOENT),
                  OVFormat("Got error %d from _PFSetFileQuarantineProperties", EINVAL)}));
}
