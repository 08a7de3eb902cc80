#include "Foundation/InstalledTree.h"

#include <gtest/gtest.h>

#include <filesystem>

using Foundation::InstalledTree;

namespace {

/// Where this program is, which holds the library.
std::filesystem::path here() {
    return std::filesystem::canonical("/proc/self/exe").parent_path();
}

}  // namespace

TEST(InstalledTree, IsWhereTheLibraryIs) {
    const std::string found =
        InstalledTree::findDirectory("../" + here().filename().string(), "/built/for");
    EXPECT_EQ(found, here().string());
    EXPECT_EQ(InstalledTree::findDirectory("..", "/built/for"),
              here().parent_path().string() + "/");
}

TEST(InstalledTree, IsWhereItWasBuiltForIfThereIsNoneBesideTheLibrary) {
    EXPECT_EQ(InstalledTree::findDirectory("../no/such/directory", "/built/for"), "/built/for");
    const std::string program = std::filesystem::read_symlink("/proc/self/exe").filename();
    EXPECT_EQ(InstalledTree::findDirectory(program, "/built/for"), "/built/for") << "a file";
}
