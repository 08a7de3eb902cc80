#include "SQLite/ChangeSet.h"

#include "Foundation/Ref.h"

#include <gtest/gtest.h>

using namespace Foundation;
using namespace SQLite;

namespace {

constexpr int kManyTimes = 100'000;

std::string textOf(const ChangeSet& changes) {
    const Ref<ChangeDict> dictionary = changes.dictionary();
    return Ref<String>(describeChanges(dictionary.get()))->utf8();
}

}  // namespace

TEST(ChangeSet, TellsTheRowsOfEachTableByID) {
    ChangeSet changes;
    changes.note(ChangeAction::kUpdate, "Items", 12);
    changes.note(ChangeAction::kInsert, "Groups", 7);
    changes.note(ChangeAction::kDelete, "Items", 3);
    EXPECT_EQ(textOf(changes), "\n         Groups:  +7\n          Items:  -3 12");
}

TEST(ChangeSet, TellsTheLastThingThatHappenedToARow) {
    ChangeSet changes;
    changes.note(ChangeAction::kInsert, "Items", 1);
    changes.note(ChangeAction::kInsert, "Items", 2);
    changes.note(ChangeAction::kUpdate, "Items", 1);
    changes.note(ChangeAction::kUpdate, "Items", 2);
    changes.note(ChangeAction::kDelete, "Items", 2);
    EXPECT_EQ(textOf(changes), "\n          Items:  1 -2");
}

TEST(ChangeSet, TellsTheLastThingOfRowsThatComeAgainAndAgain) {
    ChangeSet changes;
    for (int i = 0; i < kManyTimes; ++i) {
        changes.note(ChangeAction::kInsert, "Items", i % 3 + 1);
    }
    for (const RowID rowID : {3, 1, 2}) {
        changes.note(ChangeAction::kDelete, "Items", rowID);
    }
    changes.note(ChangeAction::kInsert, "Items", 1);
    EXPECT_EQ(textOf(changes), "\n          Items:  +1 -2 -3");
}

TEST(ChangeSet, TellsEachOfManyRowsOnce) {
    ChangeSet changes;
    for (RowID rowID = kManyTimes; rowID > 0; --rowID) {
        changes.note(ChangeAction::kInsert, "Items", rowID);
        changes.note(ChangeAction::kUpdate, "Items", kManyTimes + 1 - rowID);
    }
    const Ref<ChangeDict> dictionary = changes.dictionary();
    const TableChangeDict* rows = dictionary->get("Items");
    EXPECT_EQ(rows->count(), static_cast<std::size_t>(kManyTimes));
    // Of a row the insert came first where its number is high, otherwise the update.
    EXPECT_EQ(Number::getInteger(rows->get("1")), ChangeAction::kInsert);
    EXPECT_EQ(Number::getInteger(rows->get("100000")), ChangeAction::kUpdate);
    EXPECT_EQ(rows->begin().operator*().key->utf8(), "1");
}

TEST(ChangeSet, IsNothingWithoutChanges) {
    const ChangeSet changes;
    EXPECT_EQ(textOf(changes), "");
    EXPECT_EQ(Ref<String>(describeChanges(nullptr))->utf8(), "");
}
