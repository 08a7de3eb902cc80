// What a process that reads learns of the commits of one that writes.

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Bus.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/NotificationRecorder.h"
#include "Foundation/Number.h"
#include "SQLite/Database.h"
#include "SQLite/TestRows.h"
#include "Support/ChildProcess.h"
#include "Support/PrivateBus.h"
#include "Support/TempDir.h"
#include "Support/TurnUntil.h"

#include <gtest/gtest.h>

using namespace Foundation;
using namespace SQLite;
using Support::turnUntil;

namespace {

class StoreProcess : public testing::Test {
 protected:
    StoreProcess() {
        Database::initialize();
        write({"make", "first", "make", "second"});
        gDatabase->open(path.c_str(), false);
        observe();
    }
    ~StoreProcess() noexcept override {
        NotificationCenter::getLocal()->removeObserver(told);
        gDatabase->close(false);
    }

    /// Lets another process write, and wait until it has ended. Gives what it says.
    std::string write(std::vector<std::string> steps, const std::string& file = {}) {
        steps.insert(steps.begin(), {STORE_WRITER, file.empty() ? path : file});
        const Support::ChildResult result = Support::runChild(steps);
        EXPECT_EQ(result.status, 0) << result.err;
        return result.out;
    }
    /// Waits until this process has been told of changes in both tables.
    bool isTold() {
        const bool told2 = turnUntil([&] { return told.notes.size() >= 2; });
        return told2 && told.notes.size() == 2;
    }
    /// The announced action for a row of the table that was told last.
    std::int64_t action(const char* rowID) const {
        return Number::getInteger(told.lastInfo->getAs<Number>(rowID));
    }
    static TableOf<Group>* groups() { return TableOf<Group>::instance(); }
    static TableOf<Item>* items() { return TableOf<Item>::instance(); }

    AutoreleasePool pool;
    Support::PrivateBus bus;
    Support::TempDir directory;
    const std::string path = directory / "Database.sqlite3";
    NotificationRecorder told;

 private:
    void observe() {
        // Tables that nobody has used yet are told nothing.
        groups();
        items();
        NotificationCenter::getLocal()->addObserver(told, Table::kRowsChangedNotification, nullptr);
    }
};

}  // namespace

TEST_F(StoreProcess, AnUpdateUnloadsRowsThatStayTheSameObjects) {
    const Ref<Group> group = groups()->rowWithID(1);
    const Ref<Item> item = items()->rowWithID(1);
    EXPECT_EQ(group->mName.getValue()->utf8(), "first");
    EXPECT_EQ(item->mTitle.getValue()->utf8(), "first");
    write({"rename", "new"});
    EXPECT_EQ(item->mTitle.getValue()->utf8(), "first");
    ASSERT_TRUE(isTold());
    EXPECT_EQ(action("1"), 23);
    EXPECT_FALSE(group->isLoaded() || item->isLoaded());
    EXPECT_EQ(groups()->cachedRowWithID(1), group.get());
    EXPECT_EQ(items()->cachedRowWithID(1), item.get());
    EXPECT_EQ(group->mName.getValue()->utf8(), "new1");
    EXPECT_EQ(item->mTitle.getValue()->utf8(), "new1");
}

TEST_F(StoreProcess, ADeleteTakesRowsOutOfTheCaches) {
    const Ref<Group> group = groups()->rowWithID(1);
    const Ref<Group> other = groups()->rowWithID(2);
    const Ref<Item> item = items()->rowWithID(1);
    item->doLoad();
    write({"delete", "1"});
    ASSERT_TRUE(isTold());
    EXPECT_EQ(action("1"), 9);
    EXPECT_EQ(groups()->cachedRowWithID(1), nullptr);
    EXPECT_EQ(items()->cachedRowWithID(1), nullptr);
    EXPECT_FALSE(group->isCached() || group->isRetained() || item->isCached());
    EXPECT_EQ(item->mTitle.getValue()->utf8(), "first");
    EXPECT_EQ(groups()->cachedRowWithID(2), other.get());
}

TEST_F(StoreProcess, AnInsertChangesNothingThatIsCached) {
    const Ref<Item> item = items()->rowWithID(1);
    item->doLoad();
    write({"make", "third"});
    ASSERT_TRUE(isTold());
    EXPECT_EQ(action("3"), 18);
    EXPECT_TRUE(item->isLoaded());
    EXPECT_EQ(items()->cachedRowWithID(3), nullptr);
    EXPECT_EQ(Ref<Item>(items()->rowWithID(3))->mTitle.getValue()->utf8(), "third");
}

TEST_F(StoreProcess, ARowThatNobodyHoldsIsKeptOnlyByARetainingTable) {
    Group* group = nullptr;
    {
        const AutoreleasePool inner;
        group = groups()->rowWithID(1);
        (void)Ref<Item>(items()->rowWithID(1));
    }
    EXPECT_EQ(items()->cachedRowWithID(1), nullptr);
    write({"rename", "new"});
    ASSERT_TRUE(isTold());
    EXPECT_EQ(groups()->cachedRowWithID(1), group);
    EXPECT_EQ(group->mName.getValue()->utf8(), "new1");
}

TEST_F(StoreProcess, OneCommitIsOneAnnouncement) {
    write({"rename", "a", "make", "b", "rename", "c", "delete", "1"});
    ASSERT_TRUE(isTold());
    EXPECT_EQ(told.objects, (std::vector<void*>{groups(), items()}));
    EXPECT_EQ(action("1"), 9);
    EXPECT_EQ(action("2"), 23);
    EXPECT_EQ(action("3"), 23);
}

TEST_F(StoreProcess, TheEndOfTheWriterSavesWhatItLeaves) {
    write({"leave", "late"});
    ASSERT_TRUE(turnUntil([&] { return !told.notes.empty(); }));
    EXPECT_EQ(told.objects, std::vector<void*>{items()});
    EXPECT_EQ(action("3"), 18);
    EXPECT_EQ(Ref<Item>(items()->rowWithID(3))->mTitle.getValue()->utf8(), "late");
}

TEST_F(StoreProcess, WhatIsRolledBackOrInAnotherFileIsNoNews) {
    const Ref<Item> item = items()->rowWithID(1);
    item->doLoad();
    EXPECT_EQ(write({"rename", "never", "abort", ""}), "rolled back: abort\n");
    write({"make", "other", "rename", "other"}, directory / "Other.sqlite3");
    // Signals keep their order: what comes first is this one.
    write({"make", "third"});
    ASSERT_TRUE(isTold());
    EXPECT_EQ(action("3"), 18);
    EXPECT_EQ(told.lastInfo->count(), 1U);
    EXPECT_TRUE(item->isLoaded());
    EXPECT_EQ(item->mTitle.getValue()->utf8(), "first");
}
