#include "Foundation/RuntimeDirectory.h"

#include "Support/EnvVar.h"
#include "Support/TempDir.h"

#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

using namespace Foundation;
using Support::EnvVar;
using Support::TempDir;

namespace {

mode_t modeOf(const std::string& path) {
    struct stat status;
    return lstat(path.c_str(), &status) == 0 ? status.st_mode & 07777 : 0;
}

class RuntimeDirectoryTest : public testing::Test {
 protected:
    const std::string fallback = "/tmp/orvane-" + std::to_string(geteuid());
    TempDir temp;
    std::string error;
};

}  // namespace

TEST_F(RuntimeDirectoryTest, TrustsTheUsersOwnAsItStands) {
    const std::string own = temp.makeDirectory("own");
    const EnvVar variable("XDG_RUNTIME_DIR", own.c_str());
    EXPECT_EQ(RuntimeDirectory::getBase(error), own);
    EXPECT_EQ(RuntimeDirectory::getPath(error), own + "/Orvane");
    EXPECT_EQ(modeOf(own + "/Orvane"), 0700u);
    EXPECT_EQ(RuntimeDirectory::getPath(error), own + "/Orvane");
}

TEST_F(RuntimeDirectoryTest, IgnoresOneThatOthersCanEnter) {
    const std::string open = temp.makeDirectory("open");
    chmod(open.c_str(), 0755);
    const EnvVar variable("XDG_RUNTIME_DIR", open.c_str());
    EXPECT_EQ(RuntimeDirectory::getBase(error), fallback);
    EXPECT_EQ(modeOf(fallback), 0700u);
}

TEST_F(RuntimeDirectoryTest, IgnoresRelativeAndMissingOnes) {
    for (const char* value : {".", "relative", "", "/nowhere/at/all"}) {
        const EnvVar variable("XDG_RUNTIME_DIR", value);
        EXPECT_EQ(RuntimeDirectory::getBase(error), fallback) << value;
    }
    const EnvVar variable("XDG_RUNTIME_DIR", nullptr);
    EXPECT_EQ(RuntimeDirectory::getBase(error), fallback);
}

TEST_F(RuntimeDirectoryTest, MakesItPrivateWhateverTheMaskIs) {
    const mode_t mask = umask(0277);
    EXPECT_TRUE(RuntimeDirectory::makePrivate(temp / "new", error)) << error;
    umask(mask);
    EXPECT_EQ(modeOf(temp / "new"), 0700u);
}

TEST_F(RuntimeDirectoryTest, RefusesWhatIsNotTheUsersAlone) {
    const std::string open = temp.makeDirectory("open");
    chmod(open.c_str(), 0750);
    EXPECT_FALSE(RuntimeDirectory::makePrivate(open, error));
    EXPECT_EQ(error, open + " is no directory that belongs to the user alone");
    EXPECT_EQ(modeOf(open), 0750u) << "it is not for us to change";
}

TEST_F(RuntimeDirectoryTest, RefusesLinksAndFiles) {
    temp.makeDirectory("target");
    const std::string link = temp / "link";
    ASSERT_EQ(symlink((temp / "target").c_str(), link.c_str()), 0);
    EXPECT_FALSE(RuntimeDirectory::makePrivate(link, error));
    EXPECT_EQ(error, link + " is no directory that belongs to the user alone");
    EXPECT_FALSE(RuntimeDirectory::makePrivate(temp.writeFile("file", ""), error));
    EXPECT_FALSE(RuntimeDirectory::makePrivate(temp / "missing/below", error));
    EXPECT_TRUE(error.ends_with("/missing/below: No such file or directory")) << error;
}

TEST_F(RuntimeDirectoryTest, RefusesThatOfAnotherUser) {
    // Only root can give a directory away; for all others, root's own is one.
    std::string others = "/root";
    if (geteuid() == 0) {
        others = temp.makeDirectory("others");
        ASSERT_EQ(chown(others.c_str(), 12345, 12345), 0);
    }
    EXPECT_FALSE(RuntimeDirectory::makePrivate(others, error));
    EXPECT_FALSE(RuntimeDirectory::isTrusted(others));
}
