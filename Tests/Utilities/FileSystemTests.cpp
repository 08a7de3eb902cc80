#include "Utilities/FileSystem.h"

#include "Support/EnvVar.h"
#include "Utilities/Files.h"

#include <gtest/gtest.h>

using namespace Foundation;
using Compatibility::FileSystem;

namespace {

std::string path(URLReturner url) {
    const Ref<URL> held(std::move(url));
    return held->getFileSystemRepresentation() + (held->hasDirectoryPath() ? "/" : "");
}

/// The storage tree in a directory of the test's own.
class FileSystemTest : public testing::Test {
 protected:
    FileSystemTest() { FileSystem::setStorageBaseURL(mFiles.url("", true)); }
    ~FileSystemTest() override { FileSystem::setStorageBaseURL(nullptr); }

    Files mFiles;
};

struct Places {
    const char* xdgDataHome;
    const char* home;
    const char* accountHome;
    const char* found;
};
class DataDirectory : public testing::TestWithParam<Places> {};

}  // namespace

TEST_F(FileSystemTest, LaysTheTreeOutUnderTheBase) {
    const std::pair<URLReturner (*)(), const char*> places[] = {
        {FileSystem::getStorageBaseURL, ""},
        {FileSystem::getStorageURL, "Orvane/"},
        {FileSystem::getStorageDatabaseURL, "Orvane/Database/"},
        {FileSystem::getStorageDatabaseFile, "Orvane/Database/Database.sqlite3"},
        {FileSystem::getClientPListURL, "Orvane/Clients.plist"},
        {FileSystem::getStorageTruthURL, "Orvane/Feeds/"},
        {FileSystem::getStorageEnclosuresURL, "Orvane/Downloads/"},
        {FileSystem::getStorageIncompleteEnclosuresURL, "Orvane/Downloads/Incomplete/"},
    };
    for (const auto& [accessor, wanted] : places) {
        EXPECT_EQ(path(accessor()), mFiles.path().string() + "/" + wanted);
    }
    EXPECT_TRUE(mFiles.names().empty());
}

TEST_F(FileSystemTest, KeepsTheURLsThatAreAskedForMost) {
    for (URLReturner (*accessor)() : {FileSystem::getStorageBaseURL, FileSystem::getStorageURL,
                                      FileSystem::getStorageTruthURL}) {
        EXPECT_EQ(Ref<URL>(accessor()).get(), Ref<URL>(accessor()).get());
    }
}

TEST_F(FileSystemTest, MovesWithTheBase) {
    EXPECT_EQ(path(FileSystem::getStorageTruthURL()), mFiles / "Orvane/Feeds/");
    FileSystem::setStorageBaseURL(mFiles.url("other", true));
    EXPECT_EQ(path(FileSystem::getStorageTruthURL()), mFiles / "other/Orvane/Feeds/");
    const Support::EnvVar home("XDG_DATA_HOME", "/home/data");
    FileSystem::setStorageBaseURL(nullptr);
    EXPECT_EQ(path(FileSystem::getStorageURL()), "/home/data/Orvane/");
}

TEST_F(FileSystemTest, LooksTheBaseUpOnce) {
    FileSystem::setStorageBaseURL(nullptr);
    const Support::EnvVar first("XDG_DATA_HOME", "/first");
    EXPECT_EQ(path(FileSystem::getStorageBaseURL()), "/first/");
    const Support::EnvVar second("XDG_DATA_HOME", "/second");
    EXPECT_EQ(path(FileSystem::getStorageBaseURL()), "/first/");
}

TEST(FileSystem, TakesTheLibrarysResourcesForAProgramWithoutItsOwn) {
    EXPECT_EQ(FileSystem::getFrameworkBundle(), Bundle::frameworkBundle());
    EXPECT_EQ(FileSystem::getClientBundle(), Bundle::frameworkBundle());
    const Ref<Bundle> own = Bundle::bundle("/somewhere", "program");
    FileSystem::setClientBundle(own);
    EXPECT_EQ(FileSystem::getClientBundle(), own.get());
    EXPECT_EQ(FileSystem::getFrameworkBundle(), Bundle::frameworkBundle());
    FileSystem::setClientBundle(nullptr);
    EXPECT_EQ(FileSystem::getClientBundle(), Bundle::frameworkBundle());
}

TEST(FileSystem, HasATemporaryDirectory) {
    EXPECT_EQ(path(FileSystem::getTempURL()), "/tmp/");
}

TEST_P(DataDirectory, IsTheFirstAbsoluteOne) {
    const Places& places = GetParam();
    EXPECT_EQ(FileSystem::findDataDirectory(places.xdgDataHome, places.home, places.accountHome),
              places.found);
}
INSTANTIATE_TEST_SUITE_P(
    All, DataDirectory,
    testing::Values(Places{"/data", "/home/a", "/home/b", "/data"},
                    Places{nullptr, "/home/a", "/home/b", "/home/a/.local/share"},
                    Places{"", "/home/a", "/home/b", "/home/a/.local/share"},
                    Places{"data", "/home/a", "/home/b", "/home/a/.local/share"},
                    Places{"../data", nullptr, "/home/b", "/home/b/.local/share"},
                    Places{nullptr, "home", "/home/b", "/home/b/.local/share"},
                    Places{nullptr, "", "/home/b", "/home/b/.local/share"},
                    Places{nullptr, nullptr, nullptr, ""}, Places{"a", "b", "", ""}));
