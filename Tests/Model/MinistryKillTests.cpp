// What is in the files after the agent was killed at any moment.

#include "Foundation/DictionaryOf.h"
#include "Model/ClientsPlist.h"
#include "Model/OldSchema.h"
#include "Model/Truth.h"
#include "Support/ChildProcess.h"
#include "Support/EnvVar.h"
#include "Support/PipedChild.h"
#include "Support/TurnUntil.h"
#include "Utilities/FileUtils.h"

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
        waitFor(microseconds);
        child.kill();
        const bool isDone = child.readLine() == "done";
        child.wait();
        return isDone;
    }
    static void waitFor(int microseconds) {
        const auto end = Clock::now() + std::chrono::microseconds(microseconds);
        while (Clock::now() < end) {
        }
    }
    /// Kills a worker that works for ever, at some moment behind one of its first lines. Gives the
    /// lines that it has written.
    Strings workAndKill(const char* mode, int mostLines) {
        Support::PipedChild child({MINISTRY_WORKER, mode, base.path()});
        Strings lines;
        for (int left = between(1, mostLines); left > 0; --left) {
            lines.push_back(child.readLine());
        }
        waitFor(between(0, 3000));
        child.kill();
        for (std::string line; !(line = child.readLine()).empty();) {
            lines.push_back(line);
        }
        return lines;
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

    int subscriptionsInPlist() const {
        const Ref<Dictionary> root = ClientsPlist::read(urlOf("Clients.plist"));
        if (!root) return -1;
        const auto* subscriptions = root->getAs<Dictionary>("Subscriptions");
        EXPECT_EQ(root->getAs<Dictionary>("Feeds")->count(), subscriptions->count());
        return static_cast<int>(subscriptions->count());
    }
    /// How many files there are in directories, which are all of stored feeds.
    /// Makes the entries that have files what they are in life: gone from their feeds.
    static void archiveOldEntries() {
        ministry().openDatabase();
        db().execute("update Entries set current=0 where length(id) > 1");
        db().close(true);
    }
    int filesOfOldEntries() const {
        int files = 0;
        for (const auto& item : fs::directory_iterator(storage() / "Feeds")) {
            if (!item.is_directory()) continue;
            const std::string identifier = item.path().filename();
            EXPECT_EQ(db().execScalar("select count(*) from Feeds where identifier=%Q",
                                      identifier.c_str()),
                      1)
                << identifier;
            const fs::directory_iterator saved(item);
            files += static_cast<int>(std::distance(begin(saved), end(saved)));
        }
        return files;
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
        for (const std::string& line : workAndKill("subscribe", 12)) {
            std::sscanf(line.c_str(), "committed %d", &committed);
            std::sscanf(line.c_str(), "saved %d", &saved);
        }
        start();
        const int stored = count("Subscriptions");
        ASSERT_TRUE(stored == committed || stored == committed + 1) << stored << ' ' << committed;
        if (saved > 0) {
            const int count = subscriptionsInPlist();
            ASSERT_GE(count, saved);
            ASSERT_LE(count, stored);
        }
        committed = stored;
        db().close(false);
    }
}

TEST_F(MinistryKill, BeforeASaveThatIsDueLeavesItToTheNextStart) {
    int committed = 0;
    for (int i = 0; i < kills(); ++i) {
        for (const std::string& line : workAndKill("request", 12)) {
            std::sscanf(line.c_str(), "committed %d", &committed);
        }
        start();
        const int stored = count("Subscriptions");
        ASSERT_TRUE(stored == committed || stored == committed + 1) << stored << ' ' << committed;
        clock.advanceBy(MinistryOfTruth::kSaveDelaySeconds);
        ASSERT_GE(committed > 0 ? subscriptionsInPlist() : 0, committed);
        committed = stored;
        db().close(false);
    }
}

TEST_F(MinistryKill, OfADeletionTakesAFeedsOldEntriesWithItOrLeavesThemAll) {
    constexpr int kFeeds = 12;
    makeTruth(kFeeds);
    archiveOldEntries();
    const fs::path original = base / "original";
    fs::rename(storage(), original);
    for (int i = 0; i < kills(); ++i) {
        fs::remove_all(storage());
        fs::copy(original, storage(), fs::copy_options::recursive);
        int deleted = 0;
        for (const std::string& line : workAndKill("delete", kFeeds)) {
            if (line.starts_with("deleted ")) ++deleted;
        }
        start();
        const int left = count("Feeds");
        ASSERT_TRUE(left == kFeeds - deleted || left == kFeeds - deleted - 1)
            << left << ' ' << deleted;
        ASSERT_EQ(count("Subscriptions"), left);
        ASSERT_EQ(count("Entries"), left * (kCurrentEntries + kOldEntries));
        ASSERT_TRUE(Support::turnUntil([] { return !FileUtils::isDeletingFilesAsynchronously(); }));
        ASSERT_EQ(filesOfOldEntries(), left * kOldEntries);
        clock.advanceBy(MinistryOfTruth::kSaveDelaySeconds);
        ASSERT_EQ(subscriptionsInPlist(), left);
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
