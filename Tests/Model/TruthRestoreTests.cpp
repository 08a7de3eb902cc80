#include "Model/TruthRestore.h"

#include "Model/Truth.h"

#include <gmock/gmock.h>

#include <fcntl.h>
#include <sys/stat.h>

#include <map>
#include <stdexcept>

using namespace Foundation;
using namespace Orvane;
namespace fs = std::filesystem;
using Strings = std::vector<std::string>;

namespace {

class TruthRestoreTest : public TruthTest {
 protected:
    /// The content of every file of the truth, without that of the marks.
    std::map<std::string, std::string> truth() const {
        std::map<std::string, std::string> result;
        for (const auto& entry : fs::recursive_directory_iterator(storage() / "Feeds")) {
            const std::string name = entry.path().lexically_relative(storage());
            if (!entry.is_regular_file() || name == "Feeds/.parsing") continue;
            result[name] = readFile(name);
        }
        return result;
    }
    static int scalar(const char* sql) { return db().execScalar("%s", sql); }
};

}  // namespace

TEST_F(TruthRestoreTest, BringsTheEntriesOfSavedDocumentsBack) {
    makeTruth(4);
    breakDatabase();
    ministry().openDatabase();
    EXPECT_EQ(count("Entries"), 4 * kCurrentEntries);
    EXPECT_EQ(rows("select rowID, title, recoverOldEntries from Feeds order by rowID"),
              (Strings{"10|Number 10|1", "20|Number 20|1", "30|Number 30|1", "40|Number 40|1"}));
    EXPECT_EQ(rows("select rowID, client, feed, refreshInterval from Subscriptions order by rowID"),
              (Strings{"11|3|10|300.0", "21|3|20|300.0", "31|3|30|300.0", "41|3|40|300.0"}));
    EXPECT_EQ(rows("select signature from Clients"), Strings{"com.example.reader"});
}

TEST_F(TruthRestoreTest, BringsOldEntriesBackWhenTheyAreFirstAskedFor) {
    const Strings before = makeTruth(4);
    ASSERT_EQ(before.size(), 4U * (kCurrentEntries + kOldEntries));
    breakDatabase();
    ministry().openDatabase();
    askForEntries(4);
    EXPECT_EQ(rows(kEntries), before);
    EXPECT_EQ(scalar("select count(*) from Feeds where recoverOldEntries=1"), 0);
}

TEST_F(TruthRestoreTest, LetsEverythingCountAsSeen) {
    makeTruth(2);
    breakDatabase();
    ministry().openDatabase();
    EXPECT_EQ(scalar("select count(*) from Entries where read=1"), 2 * kCurrentEntries);
    EXPECT_EQ(scalar("select count(*) from Subscriptions where unreadCount=0"), 2);
    EXPECT_GT(count("Enclosures"), 0);
    EXPECT_EQ(scalar("select count(*) from Enclosures where downloadAuditStatus=2"),
              count("Enclosures"));
    // Nobody finds an object that still says otherwise.
    const auto query = SQLite::TableOf<EntryCore>::instance()->allRows();
    for (SQLite::CursorOf<EntryCore> cursor(*query); cursor.hasRow(); cursor.nextRow()) {
        const Ref<EntryCore> entry = cursor.row();
        EXPECT_TRUE(entry->mRead);
    }
}

TEST_F(TruthRestoreTest, LeavesTheTruthAsItIs) {
    makeTruth(3);
    const auto before = truth();
    ASSERT_EQ(before.size(), 3U * (1 + kOldEntries));
    for (const auto& [name, content] : before) {
        fs::permissions(storage() / name, fs::perms::owner_read);
    }
    breakDatabase();
    bool wasRestoring = true;
    feeding.beforeMerge = [&](FeedCore&) {
        wasRestoring = wasRestoring && ministry().isRestoring() && db().isInTransaction();
    };
    ministry().openDatabase();
    EXPECT_TRUE(wasRestoring);
    EXPECT_FALSE(ministry().isRestoring());
    EXPECT_EQ(truth(), before);
}

TEST_F(TruthRestoreTest, GoesByTheOrderOfTheFeeds) {
    makeTruth(3);
    breakDatabase();
    Strings order;
    feeding.beforeMerge = [&](FeedCore& feed) { order.push_back(std::to_string(feed.getRowID())); };
    ministry().openDatabase();
    EXPECT_EQ(order, (Strings{"10", "20", "30"}));
}

TEST_F(TruthRestoreTest, KnowsWhenADocumentWasFetched) {
    makeTruth(1);
    for (const auto& entry : fs::directory_iterator(storage() / "Feeds")) {
        if (!entry.is_regular_file()) continue;
        timespec times[2] = {{1700000000, 0}, {1700000000, 0}};
        ASSERT_EQ(utimensat(AT_FDCWD, entry.path().c_str(), times, 0), 0);
    }
    breakDatabase();
    ministry().openDatabase();
    EXPECT_EQ(rows("select refreshLocalDate from Feeds"), Strings{"721692800.0"});
}

TEST_F(TruthRestoreTest, DoesWithoutDocuments) {
    makeTruth(2);
    fs::remove_all(storage() / "Feeds");
    breakDatabase();
    ministry().openDatabase();
    EXPECT_EQ(count("Feeds"), 2);
    EXPECT_EQ(count("Entries"), 0);
    askForEntries(2);
    EXPECT_EQ(count("Entries"), 0);
}

TEST_F(TruthRestoreTest, IsTakenUpAgainIfItFails) {
    const Strings before = makeTruth(3);
    breakDatabase();
    feeding.beforeMerge = [](FeedCore& feed) {
        if (feed.getRowID() == 20) throw std::runtime_error("no such luck");
    };
    EXPECT_THROW(ministry().openDatabase(), std::runtime_error);
    EXPECT_FALSE(ministry().isRestoring());
    EXPECT_EQ(count("sqlite_master"), 0);
    feeding.beforeMerge = nullptr;
    db().close(false);
    ministry().openDatabase();
    EXPECT_EQ(count("Subscriptions"), 3);
    askForEntries(3);
    EXPECT_EQ(rows(kEntries), before);
}

TEST_F(TruthRestoreTest, WorksWhileTheAgentRuns) {
    const Strings before = makeTruth(3);
    ministry().openDatabase();
    const Ref<FeedCore> held = feed(10);
    EXPECT_EQ(held->mTitle.getValue()->utf8(), "Number 10");
    ministry().recoverBrokenDatabase(nullptr);
    askForEntries(3);
    EXPECT_EQ(rows(kEntries), before);
    EXPECT_NE(feed(10), held.get());
}
