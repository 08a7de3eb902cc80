#include "Utilities/FileIcons.h"

#include "Foundation/String.h"
#include "Foundation/URL.h"
#include "Utilities/FileSystem.h"
#include "Utilities/Files.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <fstream>

using namespace Foundation;
using Compatibility::FileSystem;
using Orvane::FileIcons;
namespace fs = std::filesystem;

namespace {

/// The user's own icon theme, which is looked at before those of the machine.
class FileIconsTest : public testing::Test {
 protected:
    ~FileIconsTest() override { fs::remove_all(mIcons); }

    std::string addIcon(const char* name) const {
        const fs::path path = mIcons / "Adwaita/48x48/mimetypes" / name;
        fs::create_directories(path.parent_path());
        std::ofstream(path).put('x');
        return path.string();
    }

    const fs::path mIcons = fs::path(std::getenv("XDG_DATA_HOME")) / "icons";
    Files mFiles;
};

}  // namespace

TEST_F(FileIconsTest, FindTheIconOfAMIMEType) {
    const std::string icon = addIcon("application-x-made-up-here.png");
    EXPECT_EQ(FileIcons::find("application/x-made-up-here", ""), icon);
    EXPECT_EQ(FileIcons::find("x-made-up/elsewhere", ""), "");
}

TEST_F(FileIconsTest, GiveURLs) {
    const std::string icon = addIcon("application-x-made-up-here.png");
    const Ref<String> type = String::string("application/x-made-up-here");
    const Ref<String> otherType = String::string("x-made-up/elsewhere");
    const Ref<URL> url = FileSystem::getFileIconURL(type, nullptr);
    ASSERT_NE(url.get(), nullptr);
    EXPECT_EQ(url->getFileSystemRepresentation(), icon);
    EXPECT_EQ(Ref<URL>(FileSystem::getFileIconURL(otherType, nullptr)).get(), nullptr);
    EXPECT_EQ(Ref<URL>(FileSystem::getLocalFileIconURL(nullptr)).get(), nullptr);
}

TEST_F(FileIconsTest, FallBackOnTheName) {
    // Without the desktop's table of types every name has the unknown one.
    const std::string unknown = addIcon("application-octet-stream.svg");
    const std::string text = addIcon("text-plain.png");
    for (const char* name : {"txt", "a.txt"}) {
        const std::string found = FileIcons::find("application/octet-stream", name);
        EXPECT_TRUE(found == text || found == unknown) << found;
    }
    const Ref<URL> url = FileSystem::getLocalFileIconURL(mFiles.url("a.txt"));
    ASSERT_NE(url.get(), nullptr);
    EXPECT_EQ(url->getFileSystemRepresentation(), FileIcons::find("", "a.txt"));
}
