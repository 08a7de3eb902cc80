// What is in the files after the agent was killed at any moment.

#include "Foundation/DictionaryOf.h"
#include "Model/ClientsPlist.h"
#include "Model/OldSchema.h"
#include "Model/Truth.h"
#include "Support/ChildProcess.h"
#include "Support/EnvVar.h"
#include "Support/PipedChild.h"

#include <gmock/gmock.h>

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <map>
#include <optional>
#include <random>

using namespace Foundation;
using namespace Orvane;
namespace fs = std::filesystem;
using Strings = std::vector<std::string>;

namespace {

class MinistryKill : public TruthTest {
 protected:
    using Clock = std::chrono::steady_clock;

    MinistryKill() {
        std::printf("seed %u\n", seed);
        random.seed(seed);
    }

    int kills() const { return std::getenv("ORVANE_SLOW_TESTS") ? 200 : 20; }
    int between(int least, int most) {
        return std::uniform_int_distribution<int>(least, most)(random);
    }
    /// Kills the worker that many microseconds after it has begun. Whether it was done before.
    bool openAndKillAfter(int microseconds) const {
        Support::PipedChild child({MINISTRY_WORKER, "open", base.path()});
        EXPECT_EQ(child.readLine(), "ready");
        const auto end = Clock::now() + std::chrono::microseconds(microseconds);
        while (Clock::now() < end) {
        }
        child.kill();
        const bool isDone = child.readLine() == "done";
        child.wait();
        return isDone;
    }
    /// How many microseconds the worker needs if nobody kills it.
    int timeToOpen() const {
        Support::PipedChild child({MINISTRY_WORKER, "open", base.path()});
        EXPECT_EQ(child.readLine(), "ready");
        const auto start = Clock::now();
        EXPECT_EQ(child.readLine(), "done");
        const auto time = Clock::now() - start;
        EXPECT_EQ(child.wait(), 0);
        return static_cast<int>(
            std::chrono::duration_cast<std::chrono::microseconds>(time).count());
    }
    std::string file() const { return storage() / "Database/Database.sqlite3"; }
    void makeOld(const std::string& path, int version) {
        fs::create_directories(fs::path(path).parent_path());
        db().open(path.c_str(), true);
        OldSchema::make(version);
        db().close(true);
    }
    /// All columns, indexes and triggers of a file.
    static std::string schemaOf(const std::string& path) {
        SQLite::Database other;
        other.open(path.c_str(), true);
        const SQLite::Cursor cursor(
            &other,
            "select (select group_concat(m.name || ' ' || c.name || ' ' || lower(c.type)) "
            "        from sqlite_master as m, pragma_table_info(m.name) as c "
            "        where m.type='table') || "
            "       (select group_concat(name) from (select name from sqlite_master "
            "        where sql not null order by name))");
        return cursor.cStringColumn(0);
    }
    static int versionOf(const std::string& path) {
        SQLite::Database other;
        other.open(path.c_str(), true);
        return other.getUserVersion();
    }
    /// Opens the database as the next start does.
    void start() const {
        ministry().openDatabase();
        db().integrityCheck();
        EXPECT_EQ(db().getUserVersion(), 10022);
        EXPECT_EQ(db().execScalar("PRAGMA auto_vacuum"), 2);
    }

    const unsigned seed = std::random_device()();
    std::mt19937 random;
};

}  // namespace

TEST_F(MinistryKill, OfAMigrationLeavesAVersionWithItsColumnsAndIsTakenUpAgain) {
    std::map<int, std::string> schemas;
    for (int version = OldSchema::kOldest; version <= OldSchema::kNewest; ++version) {
        const std::string path = base / ("reference/" + std::to_string(version));
        makeOld(path, version);
        schemas[version] = schemaOf(path);
    }
    makeOld(file(), 10005);
    const int time = timeToOpen();
    for (int i = 0; i < kills(); ++i) {
        fs::remove_all(storage());
        makeOld(file(), 10005);
        openAndKillAfter(between(0, time));
        const int version = versionOf(file());
        ASSERT_EQ(schemaOf(file()), schemas[version]) << version;
        start();
        EXPECT_EQ(rows("select rowID, identifier, title, localDateCreated from Entries"),
                  (Strings{"11|e1|First|100.0", "12|e2|Second|300.0", "13|e3|Third|200.0"}));
        EXPECT_EQ(rows("select rowID, localDateCreatedOfNewestEntry from Feeds"),
                  (Strings{"5|300.0", "6|200.0"}));
        ASSERT_EQ(schemaOf(file()), schemas[10022]);
        db().close(false);
    }
}

TEST_F(MinistryKill, OfARebuildLosesNothingMore) {
    constexpr int kFeeds = 40;
    const Strings entries = makeTruth(kFeeds);
    const std::string plist = readFile("Clients.plist");
    breakDatabase();
    const int time = timeToOpen();
    for (int i = 0; i < kills(); ++i) {
        breakDatabase();
        writeFile("Downloads/file", "x");
        // The restarts may be killed too. That it met a document is not the document's fault.
        bool isDone = false;
        do {
            isDone = openAndKillAfter(between(0, time));
            fs::remove(storage() / "Feeds/.parsing");
        } while (!isDone && between(0, 1) == 0);
        start();
        for (const char* table : {"Feeds", "Subscriptions"}) {
            ASSERT_EQ(count(table), kFeeds) << table;
        }
        askForEntries(kFeeds);
        ASSERT_EQ(rows(kEntries), entries);
        EXPECT_FALSE(has("Downloads"));
        ASSERT_EQ(readFile("Clients.plist"), plist);
        db().close(false);
    }
}

TEST_F(MinistryKill, OfASaveLosesNoAcknowledgedSubscription) {
    int committed = 0, saved = 0;
    for (int i = 0; i < kills(); ++i) {
        {
            Support::PipedChild child({MINISTRY_WORKER, "subscribe", base.path()});
            const int lines = between(1, 12);
            std::string line = child.readLine();
            const auto note = [&] {
                std::sscanf(line.c_str(), "committed %d", &committed);
                std::sscanf(line.c_str(), "saved %d", &saved);
            };
            for (int n = 0; n < lines; ++n) {
                line = child.readLine();
                note();
            }
            const auto end = Clock::now() + std::chrono::microseconds(between(0, 3000));
            while (Clock::now() < end) {
            }
            child.kill();
            while (!(line = child.readLine()).empty())
                note();
            ASSERT_EQ(child.wait(), -1) << "it ended by itself";
        }
        start();
        const int stored = count("Subscriptions");
        ASSERT_TRUE(stored == committed || stored == committed + 1) << stored << ' ' << committed;
        if (saved > 0) {
            const Ref<Dictionary> root = ClientsPlist::read(urlOf("Clients.plist"));
            ASSERT_TRUE(root);
            const auto count = static_cast<int>(root->getAs<Dictionary>("Subscriptions")->count());
            ASSERT_GE(count, saved);
            ASSERT_LE(count, stored);
            EXPECT_EQ(root->getAs<Dictionary>("Feeds")->count(), static_cast<std::size_t>(count));
        }
        committed = stored;
        db().close(false);
    }
}

TEST_F(MinistryKill, IsNotNeededWhereTheAgentIsToQuitAfterARebuild) {
    makeTruth(2);
    breakDatabase();
    std::optional<Support::EnvVar> quit(std::in_place, "OVAgentQuitAfterRecovery", "1");
    const auto result = Support::runChild({MINISTRY_WORKER, "open", base.path()});
    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.out, "ready\n");
    EXPECT_THAT(result.err, testing::HasSubstr("Agent exiting (OVAgentQuitAfterRecovery is set)"));
    // It is whole, and so it does not quit the next time.
    const auto next = Support::runChild({MINISTRY_WORKER, "open", base.path()});
    EXPECT_EQ(next.out, "ready\ndone\n");
    quit.reset();
    start();
    EXPECT_EQ(count("Subscriptions"), 2);
    EXPECT_EQ(count("Entries"), 2 * kCurrentEntries);
}
