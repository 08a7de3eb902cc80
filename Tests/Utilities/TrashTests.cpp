#include "Utilities/Trash.h"

#include "Foundation/Logger.h"
#include "Support/LogCapture.h"
#include "Utilities/Files.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <cstdlib>
#include <fstream>

using namespace Orvane;
namespace fs = std::filesystem;

namespace {

/// A directory on the file system of the user's trash, which is this test's own.
class TrashTest : public testing::Test {
 protected:
    TrashTest() { fs::remove_all(mTrash); }
    ~TrashTest() override { fs::remove_all(mTrash); }

    std::string makeDirectory() {
        mFiles.makeDirectory("Database");
        mFiles.writeFile("Database/file", "content");
        return mFiles / "Database";
    }
    void breakTrash() const { std::ofstream(mTrash).put('x'); }

    Files mFiles;
    const fs::path mTrash = fs::path(std::getenv("XDG_DATA_HOME")) / "Trash";
};

}  // namespace

TEST_F(TrashTest, TakesADirectoryWithAllItHolds) {
    EXPECT_EQ(Trash::moveAway(makeDirectory()), 0);
    EXPECT_TRUE(mFiles.names().empty());
    EXPECT_TRUE(fs::exists(mTrash / "files/Database/file"));
    EXPECT_TRUE(fs::exists(mTrash / "info/Database.trashinfo"));
}

TEST_F(TrashTest, KeepsWhatItHasUnderOtherNames) {
    EXPECT_EQ(Trash::moveAway(makeDirectory()), 0);
    EXPECT_EQ(Trash::moveAway(makeDirectory()), 0);
    EXPECT_EQ(std::distance(fs::directory_iterator(mTrash / "files"), fs::directory_iterator()), 2);
}

TEST_F(TrashTest, LeavesWhatItCannotTakeBesideItsPlace) {
    breakTrash();
    Support::LogCapture log;
    const Support::LoggingOn on({});
    EXPECT_EQ(Trash::moveAway(makeDirectory()), 0);
    EXPECT_EQ(mFiles.names(), (std::set<std::string>{"Database.aside.1", "Database.aside.1/file"}));
    EXPECT_EQ(log.count("The trash did not take <" + mFiles / "Database" + ">"), 1);
    EXPECT_EQ(Trash::moveAway(makeDirectory()), 0);
    EXPECT_TRUE(mFiles.has("Database.aside.1/file"));
    EXPECT_TRUE(mFiles.has("Database.aside.2/file"));
    EXPECT_FALSE(mFiles.has("Database"));
    EXPECT_EQ(mFiles.readFile("Database.aside.2/file"), "content");
}

TEST_F(TrashTest, TellsWhatIsMissing) {
    EXPECT_EQ(Trash::moveAway(mFiles / "missing"), ENOENT);
}
