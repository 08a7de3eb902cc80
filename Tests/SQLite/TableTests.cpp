#include "SQLite/Table.h"

#include "Foundation/Logger.h"
#include "SQLite/CursorOf.h"
#include "SQLite/Exception.h"
#include "SQLite/StoreTest.h"
#include "SQLite/Transaction.h"
#include "Support/AssertionOf.h"

#include <utility>

using namespace Foundation;
using namespace SQLite;
using Support::assertionOf;
using Support::LogCapture;
using Support::LoggingOn;

namespace {

class TableTest : public StoreTest {
 protected:
    /// Saves groups of the names "1" and so on.
    static void saveGroups(int first, int last) {
        for (int i = first; i <= last; ++i) {
            const AutoreleasePool inner;
            Group::make(std::to_string(i).c_str())->saveChanges();
        }
    }
    static int object(const char* type, const char* name) {
        return db().execScalar("select count(*) from sqlite_master where type=%Q and name=%Q", type,
                               name);
    }
};

}  // namespace

TEST_F(TableTest, NeedsADatabaseAndAName) {
    const LogCapture log;
    EXPECT_EQ(assertionOf([] { TableOf<Item>(nullptr, "x", true, true); }),
              "NULL db in Table constructor");
    EXPECT_EQ(assertionOf([] { TableOf<Item>(&db(), nullptr, true, true); }),
              "NULL name in Table constructor");
}

TEST_F(TableTest, RegistersWhileItLives) {
    {
        const TableOf<Item> table(&db(), "Extra", false, false);
        EXPECT_EQ(db().getRegisteredTable("Extra"), &table);
    }
    EXPECT_EQ(db().getRegisteredTable("Extra"), nullptr);
}

TEST_F(TableTest, CreatesItselfWithIndexesAndTriggersOnce) {
    static constexpr Table::IndexSpec kIndexes[] = {
        {"Extra_a", "a"}, {"Extra_ab", "a, b"}, {nullptr, nullptr}};
    static constexpr Table::TriggerSpec kTriggers[] = {
        {"Extra_t", "AFTER INSERT", "BEGIN UPDATE Items SET number=1; END"},
        {nullptr, nullptr, nullptr}};
    TableOf<Item> table(&db(), "Extra", false, false);
    table.create("rowID integer primary key, a, b", kIndexes, kTriggers);
    EXPECT_EQ(object("table", "Extra"), 1);
    EXPECT_EQ(object("index", "Extra_a") + object("index", "Extra_ab"), 2);
    EXPECT_EQ(object("trigger", "Extra_t"), 1);
    // A table that is there is left alone, indexes and all.
    db().dropIndex("Extra_a");
    table.create("other", kIndexes, kTriggers);
    EXPECT_EQ(object("index", "Extra_a"), 0);
    table.addColumn("c", "text");
    EXPECT_EQ(db().execScalar("select count(*) from pragma_table_info('Extra')"), 4);
}

TEST_F(TableTest, HandsOutOneObjectForARow) {
    const RowID rowID = saveItem("a");
    const LoggingOn on({&gLogPersist});
    LogCapture log;
    const Ref<Item> item = items()->rowWithID(rowID);
    EXPECT_EQ(Ref<Item>(items()->rowWithID(rowID)).get(), item.get());
    EXPECT_EQ(items()->cachedRowWithID(rowID), item.get());
    EXPECT_TRUE(item->isCached());
    EXPECT_FALSE(item->isRetained());
    EXPECT_TRUE(log.contains(
        OVFormat("[Persist] Table Items: mCacheAllRows is set.  Caching row #1 [%p]", item.get())));
    EXPECT_EQ(assertionOf([] { (void)items()->rowWithID(0); }), "rowID>0");
}

TEST_F(TableTest, LetsRowsGoThatItDoesNotRetain) {
    const RowID rowID = saveItem("a");
    { const Ref<Item> item = items()->rowWithID(rowID); }
    EXPECT_EQ(items()->getCachedRowCount(), 0U);
    saveGroups(1, 1);
    EXPECT_EQ(groups()->getCachedRowCount(), 1U);
    EXPECT_TRUE(groups()->cachedRowWithID(1)->isRetained());
}

TEST_F(TableTest, WithoutACacheHandsOutNewObjects) {
    const RowID rowID = saveItem("a");
    TableOf<Item> table(&db(), "Items", false, true);
    const Ref<Item> first = table.rowWithID(rowID);
    const Ref<Item> second = table.rowWithID(rowID);
    EXPECT_NE(first.get(), second.get());
    EXPECT_FALSE(first->isCached());
    EXPECT_STREQ(table._colsToFetch(), "*");
}

TEST_F(TableTest, KeepsAChangedRowUntilItIsSaved) {
    const RowID rowID = saveItem("a");
    {
        const AutoreleasePool inner;
        const Ref<Item> item = items()->rowWithID(rowID);
        item->mNumber.setValue(3);
        EXPECT_TRUE(item->isRetained());
    }
    EXPECT_EQ(items()->getCachedRowCount(), 1U);
    EXPECT_TRUE(items()->isChanged());
    db().saveRows();
    EXPECT_EQ(items()->getCachedRowCount(), 0U);
    EXPECT_FALSE(items()->isChanged());
    EXPECT_EQ(count("number=3"), 1);
}

TEST_F(TableTest, FetchesOnlyIDsOnceARetainingTableIsWarm) {
    saveGroups(1, 4);
    EXPECT_STREQ(groups()->_colsToFetch(), "*");
    EXPECT_STREQ(groups()->rowsWhere("1")->getSQL(), "SELECT * FROM Groups WHERE 1");
    saveGroups(5, 5);
    EXPECT_STREQ(groups()->rowsWhere("1")->getSQL(), "SELECT rowID FROM Groups WHERE 1");
    EXPECT_STREQ(groups()->queryWhere("name=%Q", "1")->getSQL(),
                 "SELECT rowID FROM Groups WHERE name='1'");
    EXPECT_STREQ(groups()->allRows()->getSQL(), "SELECT * FROM Groups");
    const Ref<ArrayOf<Group>> all = groups()->rowsWhere("name > '3' order by name")->allRows();
    ASSERT_EQ(all->count(), 2U);
    EXPECT_EQ(all->at(1)->mName.getValue()->utf8(), "5");
    for (int i = 0; i < 6; ++i) {
        saveItem(std::to_string(i).c_str());
    }
    EXPECT_STREQ(items()->rowsWhere("1")->getSQL(), "SELECT * FROM Items WHERE 1");
}

TEST_F(TableTest, ReplacesWhatARowHasByWhatACursorHas) {
    const Ref<Item> item = Item::make("old");
    item->saveChanges();
    executeElsewhere("update Items set title='new', number=4");
    item->mNumber.setValue(9);
    const Ref<Item> found = items()->rowsWhere("1")->firstRow();
    EXPECT_EQ(found.get(), item.get());
    EXPECT_EQ(item->mTitle.getValue()->utf8(), "new");
    EXPECT_EQ(item->mNumber.getValue(), 9);
}

TEST_F(TableTest, WalksTypedRows) {
    saveItem("a");
    saveItem("b");
    std::string titles;
    for (CursorOf<Item> cursor(items()->allRows()); cursor.hasRow(); cursor.nextRow()) {
        titles += cursor.row()->mTitle.getValue()->utf8();
    }
    EXPECT_EQ(titles, "ab");
    CursorOf<Item> none(items(), "select * from Items where title=%Q", "c");
    EXPECT_EQ(Ref<Item>(none.row()).get(), nullptr);
}

TEST_F(TableTest, SavesNewRowsInOrderAndThenChangedOnesByID) {
    const Ref<Item> a = Item::make("a");
    const Ref<Item> b = Item::make("b");
    a->saveChanges();
    b->saveChanges();
    b->mNumber.setValue(1);
    const Ref<Item> d = Item::make("d");
    d->addToTable(items());
    const Ref<Item> c = Item::make("c");
    c->addToTable(items());
    a->mNumber.setValue(1);
    const LoggingOn on({&gLogPersist});
    LogCapture log;
    items()->saveRows();
    EXPECT_EQ(d->getRowID(), 3);
    EXPECT_EQ(c->getRowID(), 4);
    std::vector<std::string> updates;
    for (const std::string& line : log.lines()) {
        if (line.find("Updating") != std::string::npos) updates.push_back(line.substr(22, 8));
    }
    EXPECT_EQ(updates, (std::vector<std::string>{" Items[1", " Items[2"}));
    EXPECT_TRUE(log.contains("[Persist] Table Items: Saving rows..."));
    EXPECT_FALSE(items()->isChanged());
}

TEST_F(TableTest, SavesADroppedNewRow) {
    {
        const AutoreleasePool inner;
        Item::make("a")->addToTable(items());
    }
    EXPECT_TRUE(items()->isChanged());
    db().saveRows();
    EXPECT_EQ(count("title='a'"), 1);
    EXPECT_EQ(items()->getCachedRowCount(), 0U);
}

TEST_F(TableTest, StaysChangedWhenASaveFails) {
    saveItem("same");
    const LogCapture log;
    const Ref<Item> item = Item::make("same");
    item->addToTable(items());
    EXPECT_THROW(db().saveRows(), Exception);
    EXPECT_TRUE(items()->isChanged());
    EXPECT_TRUE(item->isChanged());
    EXPECT_FALSE(db().isInTransaction());
    item->mTitle.setValue(text("other"));
    db().saveRows();
    EXPECT_EQ(item->getRowID(), 2);
}

namespace {

/// A row that changes another one when it is saved.
class Meddler : public Item {
 public:
    using Item::Item;
    void saveChanges() override {
        Item::saveChanges();
        if (Meddler* row = std::exchange(other, nullptr)) row->mNumber.setValue(7);
    }
    Meddler* other = nullptr;
};

}  // namespace

TEST_F(TableTest, SavesWhatASaveChangesFurtherOn) {
    for (const char* title : {"a", "b", "c"}) {
        saveItem(title);
    }
    TableOf<Meddler> table(&db(), "Items", true, false);
    const Ref<Meddler> first = table.rowWithID(1);
    const Ref<Meddler> middle = table.rowWithID(2);
    const Ref<Meddler> last = table.rowWithID(3);
    middle->mNumber.setValue(1);
    middle->other = last.get();
    table.saveRows();
    EXPECT_EQ(count("number=7"), 1);
    EXPECT_FALSE(table.isChanged());
    // What is behind it already has to wait for the next time.
    middle->mNumber.setValue(2);
    middle->other = first.get();
    table.saveRows();
    EXPECT_TRUE(first->isChanged());
    EXPECT_TRUE(table.isChanged());
    EXPECT_EQ(count("number=7"), 1);
    table.saveRows();
    EXPECT_EQ(count("number=7"), 2);
    EXPECT_FALSE(table.isChanged());
}

TEST_F(TableTest, KeepsWhatAFailedSaveHasNotReached) {
    for (const char* title : {"a", "b", "c"}) {
        saveItem(title);
    }
    const LogCapture log;
    const Ref<Item> b = items()->rowWithID(2);
    const Ref<Item> c = items()->rowWithID(3);
    b->mTitle.setValue(text("a"));
    c->mNumber.setValue(5);
    EXPECT_THROW(items()->saveRows(), Exception);
    EXPECT_TRUE(b->isChanged() && c->isChanged());
    b->mTitle.setValue(text("d"));
    items()->saveRows();
    EXPECT_EQ(count("title='d' or number=5"), 2);
    EXPECT_FALSE(items()->isChanged());
}

TEST_F(TableTest, IsUnchangedOnceItsChangedRowsAre) {
    saveItem("a");
    saveItem("b");
    const Ref<Item> a = items()->rowWithID(1);
    const Ref<Item> b = items()->rowWithID(2);
    a->mNumber.setValue(1);
    b->mNumber.setValue(1);
    a->unload();
    EXPECT_TRUE(items()->isChanged());
    b->deleteRow();
    EXPECT_FALSE(items()->isChanged());
    items()->saveRows();
    EXPECT_EQ(count("number=1"), 0);
    a->mNumber.setValue(2);
    items()->saveRows();
    EXPECT_EQ(count("number=2"), 1);
}

TEST_F(TableTest, ForgetsAllRows) {
    saveGroups(1, 1);
    const Ref<Group> held = groups()->rowWithID(1);
    const Ref<Group> fresh = Group::make("new");
    fresh->addToTable(groups());
    const LoggingOn on({&gLogPersist});
    LogCapture log;
    groups()->uncacheRows();
    EXPECT_TRUE(log.contains("[Persist] Table Groups: Clearing row cache"));
    EXPECT_FALSE(groups()->isChanged());
    EXPECT_FALSE(held->isCached() || held->isRetained());
    EXPECT_EQ(held->mName.getValue()->utf8(), "1");
    EXPECT_NE(Ref<Group>(groups()->rowWithID(1)).get(), held.get());
}

namespace {

/// A row that has another one of its table.
class LinkedItem : public Item {
 public:
    using Item::Item;
    Ref<LinkedItem> next;
};

}  // namespace

TEST_F(TableTest, ForgetsARowThatEndsWithAnother) {
    saveItem("a");
    saveItem("b");
    TableOf<LinkedItem> table(&db(), "Items", true, false);
    {
        const LogCapture log;
        const AutoreleasePool inner;
        const Ref<LinkedItem> owner = table.rowWithID(1);
        owner->next = table.rowWithID(2);
        owner->setChanged();
    }
    EXPECT_EQ(table.getCachedRowCount(), 2U);
    LogCapture log;
    table.uncacheRows();
    EXPECT_EQ(table.getCachedRowCount(), 0U);
    EXPECT_EQ(log.lines(),
              std::vector<std::string>{"[WARNING] Dealloced Row Items[1] with unsaved changes!"});
}

TEST_F(TableTest, LetsGoOfARowWhoseForgottenObjectComesBack) {
    saveGroups(1, 1);
    const Ref<Group> old = groups()->rowWithID(1);
    groups()->uncacheRows();
    const Ref<Group> now = groups()->rowWithID(1);
    EXPECT_EQ(now->getRefCount(), 2U);
    old->mName.setValue(text("x"));
    EXPECT_EQ(groups()->cachedRowWithID(1), old.get());
    EXPECT_FALSE(now->isCached() || now->isRetained());
    EXPECT_EQ(now->getRefCount(), 1U);
}

TEST_F(TableTest, CompilesItsStatementsForRowsOnce) {
    saveItem("a");
    saveItem("b");
    const LoggingOn on({&gLogSQL});
    LogCapture log;
    for (const RowID rowID : {1, 2}) {
        const Ref<Item> item = items()->rowWithID(rowID);
        item->doLoad();
        item->deleteRow();
    }
    EXPECT_EQ(log.count("\"SELECT * FROM Items WHERE rowID=?\" --> "), 1);
    EXPECT_EQ(log.count("\"DELETE FROM Items WHERE rowID=?\" --> "), 1);
}

TEST_F(TableTest, LetsRowsGoWhenTheDatabaseCloses) {
    saveGroups(1, 6);
    const Ref<Group> held = groups()->rowWithID(1);
    db().close(true);
    EXPECT_EQ(groups()->getCachedRowCount(), 0U);
    EXPECT_FALSE(held->isRetained());
    db().open(path.c_str(), true);
    const Ref<Group> again = groups()->rowWithID(1);
    EXPECT_NE(again.get(), held.get());
    EXPECT_TRUE(again->isRetained());
}

TEST_F(TableTest, AForgottenObjectDoesNotTakeItsSuccessorAlong) {
    const RowID rowID = saveItem("a");
    Ref<Item> old = items()->rowWithID(rowID);
    items()->uncacheRows();
    const Ref<Item> now = items()->rowWithID(rowID);
    old->mNumber.setValue(1);
    old->saveChanges();
    old = nullptr;
    EXPECT_EQ(Ref<Item>(items()->rowWithID(rowID))->mTitle.getValue()->utf8(), "a");
}
