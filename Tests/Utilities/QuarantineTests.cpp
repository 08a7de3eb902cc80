#include "Utilities/Quarantine.h"

#include "Utilities/Files.h"

#include <gtest/gtest.h>
#include <sys/xattr.h>

#include <cerrno>

using namespace Orvane;

namespace {

class QuarantineTest : public testing::Test {
 protected:
    void SetUp() override {
        if (setxattr(mPath.c_str(), "user.test", "", 0, 0) != 0) {
            GTEST_SKIP() << "no extended attributes in " << mFiles.path();
        }
    }
    std::string attribute(const char* name) const {
        char value[4096];
        const ssize_t length = getxattr(mPath.c_str(), name, value, sizeof value);
        return length < 0 ? "(none)" : std::string(value, static_cast<std::size_t>(length));
    }

    Files mFiles;
    const std::string mPath = mFiles.writeFile("file", "");
};

}  // namespace

TEST_F(QuarantineTest, SetsTheAttributesAndRemovesThoseWithoutAValue) {
    EXPECT_EQ(Quarantine::mark(mPath, {"http://a/", "http://b/", "gr\xc3\xbc\xc3\x9f", "me"}), 0);
    EXPECT_EQ(attribute("user.xdg.origin.url"), "http://a/");
    EXPECT_EQ(attribute("user.xdg.referrer.url"), "http://b/");
    EXPECT_EQ(attribute("user.xdg.publisher"), "gr\xc3\xbc\xc3\x9f");
    EXPECT_EQ(attribute("user.xdg.creator"), "me");
    EXPECT_EQ(Quarantine::mark(mPath, {"http://c/", "", "", ""}), 0);
    EXPECT_EQ(attribute("user.xdg.origin.url"), "http://c/");
    EXPECT_EQ(attribute("user.xdg.referrer.url"), "(none)");
    EXPECT_EQ(attribute("user.xdg.publisher"), "(none)");
    EXPECT_EQ(attribute("user.xdg.creator"), "(none)");
}

TEST_F(QuarantineTest, GoesOnAfterAFailureAndTellsTheFirst) {
    // Beyond what the kernel takes for one value.
    EXPECT_EQ(Quarantine::mark(mPath, {std::string(70000, 'x'), "http://b/", "", ""}), E2BIG);
    EXPECT_EQ(attribute("user.xdg.referrer.url"), "http://b/");
    EXPECT_EQ(Quarantine::mark(mFiles / "missing", {"http://a/", "", "", ""}), ENOENT);
}

TEST(Quarantine, IsSilentWhereTheFileSystemHasNoAttributes) {
    EXPECT_EQ(Quarantine::mark("/proc/self/status", {"http://a/", "", "", ""}), 0);
}
