// What is in the file after the process that writes it was killed.

#include "Support/PipedChild.h"
#include "Support/TempDir.h"

#include <gtest/gtest.h>
#include <sqlite3.h>

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <random>
#include <string>

namespace {

/// In two modes: with the write-ahead log, and with the roll-back journal.
class Kill : public testing::TestWithParam<const char*> {
 protected:
    /// Lets the writer run, and kills it at some moment of some commit. Gives the last number that
    /// it has acknowledged.
    int killAtRandom() {
        Support::PipedChild child({STORE_COMMITTER, path, GetParam()});
        int last = 0;
        const int commits = std::uniform_int_distribution<int>(1, 12)(random);
        for (int i = 0; i < commits; ++i) {
            last = std::atoi(child.readLine().c_str());
        }
        const std::chrono::microseconds more{std::uniform_int_distribution<int>(0, 3000)(random)};
        const auto end = std::chrono::steady_clock::now() + more;
        while (std::chrono::steady_clock::now() < end) {
        }
        child.kill();
        for (std::string line; !(line = child.readLine()).empty();) {
            last = std::atoi(line.c_str());
        }
        EXPECT_EQ(child.wait(), -1) << "it ended by itself";
        return last;
    }
    /// Column 0 of the first row, as a connection reads it that finds what the killed one left.
    std::string read(const char* sql) const {
        sqlite3* file = nullptr;
        sqlite3_stmt* statement = nullptr;
        std::string text = "nothing";
        if (sqlite3_open(path.c_str(), &file) == SQLITE_OK &&
            sqlite3_prepare_v2(file, sql, -1, &statement, nullptr) == SQLITE_OK &&
            sqlite3_step(statement) == SQLITE_ROW) {
            text = reinterpret_cast<const char*>(sqlite3_column_text(statement, 0));
        }
        sqlite3_finalize(statement);
        sqlite3_close(file);
        return text;
    }

    Support::TempDir directory;
    const std::string path = directory / "Database.sqlite3";
    std::mt19937 random;
};

}  // namespace

TEST_P(Kill, LosesNoAcknowledgedCommitAndLeavesNoHalfOne) {
    const unsigned seed = std::random_device()();
    std::printf("seed %u\n", seed);
    random.seed(seed);
    const int kills = std::getenv("ORVANE_SLOW_TESTS") ? 200 : 20;
    int before = 0;
    for (int i = 0; i < kills; ++i) {
        const int last = killAtRandom();
        ASSERT_GT(last, before);
        ASSERT_EQ(read("pragma integrity_check"), "ok");
        const int count = std::atoi(read("select count(*) from Items").c_str());
        // One commit may have been done and not been acknowledged any more.
        ASSERT_TRUE(count == last || count == last + 1) << count << " of " << last;
        const std::string number = std::to_string(count);
        ASSERT_EQ(read("select max(cast(title as integer)) from Items"), number);
        ASSERT_EQ(read("select number from Items where rowID = 1"), number);
        ASSERT_EQ(read("select count(*) from Groups"), number);
        ASSERT_EQ(read("select max(cast(name as integer)) from Groups"), number);
        before = last;
    }
}

INSTANTIATE_TEST_SUITE_P(Modes, Kill, testing::Values("wal", "rollback"),
                         [](const auto& mode) { return mode.param; });
