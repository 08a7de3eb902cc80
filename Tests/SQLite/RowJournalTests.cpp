#include "SQLite/RowJournal.h"

#include "SQLite/Exception.h"
#include "SQLite/StoreTest.h"
#include "SQLite/Transaction.h"

#include <stdexcept>
#include <string>
#include <vector>

using namespace Foundation;
using namespace SQLite;
using Support::LogCapture;

namespace {

/// What rows in memory are after a transaction was rolled back.
class RowJournalTest : public StoreTest {
 protected:
    template <class Body>
    static void rollBack(Body&& body) {
        const LogCapture log;
        try {
            const Transaction transaction(true);
            body();
            throw std::runtime_error("no");
        } catch (const std::runtime_error&) {
        }
        ASSERT_FALSE(db().isInTransaction());
    }
    /// The same by a commit that fails.
    template <class Body>
    static void failToCommit(Body&& body) {
        db().execute("PRAGMA foreign_keys = ON");
        db().execute(
            "create table if not exists child (p references Groups(rowID) deferrable initially "
            "deferred)");
        const LogCapture log;
        EXPECT_THROW(
            {
                const Transaction transaction(true);
                body();
                db().execute("insert into child values (999)");
            },
            Exception);
        ASSERT_FALSE(db().isInTransaction());
    }
    static std::string titleInFile(RowID rowID) {
        const Cursor cursor(&db(), "select title from Items where rowID=%lld", rowID);
        return cursor.hasRow() ? cursor.cStringColumn(0) : "none";
    }
};

}  // namespace

TEST_F(RowJournalTest, AnUpdatedRowIsChangedAgainInTheColumnsThatWere) {
    const Ref<Item> item = Item::make("a");
    item->saveChanges();
    const RowID rowID = item->getRowID();
    item->mTitle.setValue(text("b"));
    rollBack([] { db().saveRows(); });
    EXPECT_TRUE(item->isChanged() && item->isRetained());
    EXPECT_TRUE(item->mTitle.isChanged());
    EXPECT_FALSE(item->mNumber.isChanged());
    EXPECT_EQ(item->mTitle.getValue()->utf8(), "b");
    EXPECT_EQ(titleInFile(rowID), "a");
    EXPECT_TRUE(items()->isChanged());
    db().saveRows();
    EXPECT_EQ(titleInFile(rowID), "b");
    EXPECT_FALSE(item->isChanged());
}

TEST_F(RowJournalTest, NewRowsAreNewAgainInTheirOrderWithoutIDs) {
    const Ref<Item> a = Item::make("a");
    const Ref<Item> b = Item::make("b");
    const Ref<Item> c = Item::make("c");
    a->addToTable(items());
    b->addToTable(items());
    rollBack([&] {
        db().saveRows();
        EXPECT_EQ(b->getRowID(), 2);
        c->addToTable(items());
        b->mNumber.setValue(5);
        db().saveRows();
    });
    for (const Ref<Item>& item : {a, b, c}) {
        EXPECT_EQ(item->getRowID(), 0);
        EXPECT_TRUE(item->isChanged());
        EXPECT_FALSE(item->isCached());
        EXPECT_EQ(item->getTable(), items());
    }
    EXPECT_EQ(items()->getCachedRowCount(), 0U);
    EXPECT_EQ(count("1"), 0);
    EXPECT_EQ(b->mNumber.getValue(), 5);
    saveItem("first");
    db().saveRows();
    EXPECT_EQ(a->getRowID(), 2);
    EXPECT_EQ(b->getRowID(), 3);
    EXPECT_EQ(c->getRowID(), 4);
    EXPECT_EQ(count("title='b' and number=5"), 1);
}

TEST_F(RowJournalTest, RowsThatNobodyHoldsAreSavedTheNextTime) {
    {
        const AutoreleasePool inner;
        Item::make("a")->addToTable(items());
    }
    rollBack([] { db().saveRows(); });
    EXPECT_EQ(count("1"), 0);
    db().saveRows();
    EXPECT_EQ(count("title='a'"), 1);
}

TEST_F(RowJournalTest, ADeletedRowStaysFreeAndItsIDGivesAFreshOne) {
    const Ref<Item> item = Item::make("a");
    item->saveChanges();
    const RowID rowID = item->getRowID();
    item->mNumber.setValue(3);
    rollBack([&] {
        item->saveChanges();
        item->deleteRow();
    });
    EXPECT_EQ(item->getTable(), nullptr);
    EXPECT_EQ(item->getRowID(), 0);
    EXPECT_FALSE(item->isChanged());
    const Ref<Item> fresh = items()->rowWithID(rowID);
    EXPECT_NE(fresh.get(), item.get());
    EXPECT_EQ(fresh->mTitle.getValue()->utf8(), "a");
    EXPECT_EQ(fresh->mNumber.getValue(), 0);
}

TEST_F(RowJournalTest, ARowThatWasInsertedAndDeletedStaysFree) {
    const Ref<Item> item = Item::make("a");
    rollBack([&] {
        item->saveChanges();
        item->deleteRow();
    });
    EXPECT_EQ(item->getTable(), nullptr);
    db().saveRows();
    EXPECT_EQ(count("1"), 0);
}

TEST_F(RowJournalTest, ToOneColumnsPointAtObjectsAgain) {
    const Ref<Item> item = Item::make("a");
    const Ref<Note> note = Note::make("n");
    const Ref<Group> group = Group::make("g");
    item->mNote.setValue(note.get());
    item->mOwner.setValue(group.get());
    rollBack([&] { item->saveChanges(); });
    EXPECT_EQ(note->getRowID(), 0);
    EXPECT_EQ(item->mNote.getRowID(), 0);
    EXPECT_EQ(item->mNote.getValue(), note.get());
    EXPECT_TRUE(item->mNote.isChanged());
    EXPECT_EQ(item->mOwner.getValue(), group.get());
    // The parent's row gets the ID that the note had.
    Note::make("other")->saveChanges();
    item->saveChanges();
    EXPECT_EQ(note->getRowID(), 2);
    EXPECT_EQ(count("note=2 and owner=1"), 1);
}

TEST_F(RowJournalTest, AColumnSetToARowOfTheTransactionPointsAtTheObject) {
    const Ref<Item> item = Item::make("a");
    item->saveChanges();
    const Ref<Note> note = Note::make("n");
    rollBack([&] {
        note->saveChanges();
        item->mNote.setValue(note.get());
    });
    EXPECT_EQ(item->mNote.getRowID(), 0);
    EXPECT_EQ(item->mNote.getValue(), note.get());
    db().saveRows();
    EXPECT_EQ(db().execScalar("select note from Items"), static_cast<int>(note->getRowID()));
}

TEST_F(RowJournalTest, AColumnThatWasSetAnewKeepsThat) {
    const Ref<Note> saved = Note::make("saved");
    saved->saveChanges();
    const Ref<Item> item = Item::make("a");
    const Ref<Note> note = Note::make("n");
    item->mNote.setValue(note.get());
    rollBack([&] {
        item->saveChanges();
        item->mNote.setValue(saved.get());
    });
    EXPECT_EQ(item->mNote.getValue(), saved.get());
    EXPECT_TRUE(item->mNote.isChanged());
}

TEST_F(RowJournalTest, AColumnThatEndsInTheTransactionIsLeftAlone) {
    const Ref<Note> note = Note::make("n");
    rollBack([&] {
        note->saveChanges();
        const AutoreleasePool inner;
        const Ref<Item> free = Item::make("free");
        free->mNote.setValue(note.get());
    });
    EXPECT_EQ(note->getRowID(), 0);
}

TEST_F(RowJournalTest, ToManyColumnsHaveTheirNewRowsAgain) {
    const Ref<Group> group = Group::make("g");
    const Ref<Item> a = Item::make("a");
    const Ref<Item> b = Item::make("b");
    for (const Ref<Item>& item : {a, b}) {
        item->mOwner.setValue(group.get());
        group->mItems.add(item.get());
    }
    rollBack([&] { group->saveChanges(); });
    ASSERT_EQ(group->mItems.getNewRows().size(), 2U);
    EXPECT_EQ(group->mItems.getNewRows().at(0).get(), a.get());
    EXPECT_EQ(a->mOwner.getValue(), group.get());
    group->saveChanges();
    EXPECT_EQ(count("owner=1"), 2);
    EXPECT_TRUE(group->mItems.getNewRows().empty());
}

TEST_F(RowJournalTest, ToManyColumnsHaveThousandsOfRowsAgainInTheirOrder) {
    constexpr std::size_t kRows = 3000;
    const Ref<Group> group = Group::make("g");
    group->saveChanges();
    std::vector<Ref<Item>> rows;
    for (std::size_t i = 0; i < kRows; ++i) {
        const AutoreleasePool inner;
        rows.push_back(Item::make(std::to_string(i).c_str()));
        rows.back()->mOwner.setValue(group.get());
        group->mItems.add(rows.back().get());
    }
    rollBack([&] {
        // All but the last leave one by one, as rows do that are saved by themselves.
        for (std::size_t i = 0; i + 1 < kRows; ++i) {
            const AutoreleasePool inner;
            rows[i]->addToTable(items());
            rows[i]->saveChanges();
            group->mItems.removeSaved(rows[i].get());
        }
        ASSERT_EQ(group->mItems.getNewRows().size(), 1U);
    });
    ASSERT_EQ(group->mItems.getNewRows().size(), kRows);
    for (std::size_t i = 0; i < kRows; ++i) {
        ASSERT_EQ(group->mItems.getNewRows()[i].get(), rows[i].get()) << i;
    }
    // None is there twice, and each is found.
    group->mItems.add(rows[0].get());
    EXPECT_EQ(group->mItems.getNewRows().size(), kRows);
    EXPECT_TRUE(group->mItems.remove(rows[kRows / 2].get()));
    group->mItems.saveChanges(items());
    EXPECT_EQ(count("owner=1"), static_cast<int>(kRows) - 1);
}

TEST_F(RowJournalTest, ASaveThatFailsHalfWayBringsAllBack) {
    saveItem("taken");
    const Ref<Item> item = Item::make("taken");
    const Ref<Note> note = Note::make("n");
    item->mNote.setValue(note.get());
    item->addToTable(items());
    const LogCapture log;
    EXPECT_THROW(db().saveRows(), Exception);
    EXPECT_EQ(note->getRowID(), 0);
    EXPECT_EQ(item->mNote.getValue(), note.get());
    item->mTitle.setValue(text("free"));
    db().saveRows();
    EXPECT_EQ(count("title='free' and note=1"), 1);
}

TEST_F(RowJournalTest, WhatWasReadInTheTransactionIsForgotten) {
    const Ref<Item> item = Item::make("a");
    item->saveChanges();
    item->mNumber.setValue(7);
    rollBack([&] {
        db().execute("update Items set title='z', real=2.5");
        item->unload();
        item->mBig.setValue(8);
        EXPECT_EQ(item->mTitle.getValue()->utf8(), "z");
    });
    EXPECT_EQ(item->mTitle.getValue()->utf8(), "a");
    EXPECT_EQ(item->mBig.getValue(), 8);
    EXPECT_TRUE(item->isChanged());
}

TEST_F(RowJournalTest, ACommitThatFailsBringsRowsBackToo) {
    const Ref<Item> old = Item::make("old");
    old->saveChanges();
    const Ref<Item> fresh = Item::make("new");
    old->mTitle.setValue(text("older"));
    fresh->addToTable(items());
    failToCommit([] { db().saveRows(); });
    EXPECT_EQ(fresh->getRowID(), 0);
    EXPECT_TRUE(fresh->isChanged() && old->isChanged() && old->mTitle.isChanged());
    EXPECT_EQ(count("1"), 1);
    db().saveRows();
    EXPECT_EQ(count("title in ('older', 'new')"), 2);
}

TEST_F(RowJournalTest, AnUndoneDeleteDoesNotTakeTheFreshRowAlong) {
    const RowID rowID = saveItem("a");
    clock.advanceBy(0);
    failToCommit([&] {
        const Ref<Item> item = items()->rowWithID(rowID);
        item->deleteRow();
    });
    const Ref<Item> fresh = items()->rowWithID(rowID);
    fresh->mNumber.setValue(4);
    // The delete is announced all the same, as it was pending.
    db()._postChangeNotification();
    EXPECT_NE(lastChanges().find("-1"), std::string::npos);
    EXPECT_EQ(items()->cachedRowWithID(rowID), fresh.get());
    db().saveRows();
    EXPECT_EQ(count("number=4"), 1);
}

TEST_F(RowJournalTest, HoldsNothingBehindACommit) {
    {
        const AutoreleasePool inner;
        const Ref<Item> item = Item::make("a");
        const Ref<Note> note = Note::make("n");
        item->mNote.setValue(note.get());
        {
            const Transaction transaction(true);
            item->saveChanges();
        }
        EXPECT_EQ(item->getRefCount(), 1U);
        EXPECT_EQ(note->getRefCount(), 1U);
        EXPECT_FALSE(item->_isProvisional());
    }
    EXPECT_EQ(items()->getCachedRowCount() + notes()->getCachedRowCount(), 0U);
}
