#include "SQLite/Row.h"

#include "Foundation/Logger.h"
#include "SQLite/Exception.h"
#include "SQLite/StoreTest.h"
#include "Support/AssertionOf.h"

using namespace Foundation;
using namespace SQLite;
using Support::assertionOf;
using Support::LogCapture;
using Support::LoggingOn;

namespace {

using RowTest = StoreTest;

}  // namespace

TEST_F(RowTest, IsNewOrAFault) {
    const Ref<Item> fresh = Returner<Item>::adopted(new Item(items()));
    EXPECT_EQ(fresh->getRowID(), 0);
    EXPECT_TRUE(fresh->isLoaded());
    EXPECT_FALSE(fresh->isChanged() || fresh->isCached() || fresh->isRetained());
    const Ref<Item> fault = Returner<Item>::adopted(new Item(items(), 9));
    EXPECT_EQ(fault->getRowID(), 9);
    EXPECT_FALSE(fault->isLoaded() || fault->isChanged() || fault->isCached());
    const LogCapture log;
    EXPECT_EQ(assertionOf([] { delete new Item(nullptr, 1); }), "table!=NULL");
    EXPECT_EQ(assertionOf([] { delete new Item(items(), 0); }), "rowID>0");
}

TEST_F(RowTest, ComparesByTableAndIDOrIdentity) {
    const Ref<Item> a = Returner<Item>::adopted(new Item(items(), 5));
    const Ref<Item> b = Returner<Item>::adopted(new Item(items(), 5));
    const Ref<Item> c = Returner<Item>::adopted(new Item(items(), 6));
    const Ref<Group> d = Returner<Group>::adopted(new Group(groups(), 5));
    EXPECT_TRUE(a->isEqual(b.get()));
    EXPECT_EQ(a->getPFHashCode(), b->getPFHashCode());
    EXPECT_FALSE(a->isEqual(c.get()));
    EXPECT_FALSE(a->isEqual(d.get()));
    EXPECT_FALSE(a->isEqual(nullptr));
    EXPECT_NE(a->getPFHashCode(), d->getPFHashCode());
    const Ref<Item> free = Item::make("a");
    const Ref<Item> other = Item::make("a");
    EXPECT_TRUE(free->isEqual(free.get()));
    EXPECT_FALSE(free->isEqual(other.get()));
    EXPECT_EQ(free->getPFHashCode(), reinterpret_cast<std::size_t>(free.get()));
}

TEST_F(RowTest, DescribesItself) {
    const Ref<Item> free = Item::make("a");
    const Ref<Item> fault = Returner<Item>::adopted(new Item(items(), 5));
    const Ref<String> freeText = free->toString();
    const Ref<String> faultText = fault->toString();
    EXPECT_EQ(freeText->utf8(), OVFormat("Item[%p]", free.get()));
    EXPECT_EQ(faultText->utf8(), OVFormat("Item[Items #5] %p", fault.get()));
}

TEST_F(RowTest, FaultsInWhenAColumnIsRead) {
    const RowID rowID = saveItem("a");
    const LoggingOn on({&gLogPersist});
    LogCapture log;
    const Ref<Item> item = items()->rowWithID(rowID);
    EXPECT_FALSE(item->isLoaded());
    EXPECT_EQ(item->mTitle.getValue()->utf8(), "a");
    EXPECT_TRUE(item->isLoaded());
    EXPECT_EQ(item->mNumber.getValue(), 0);
    EXPECT_EQ(log.count("[Persist] Faulting in Item[Items #1] 0x"), 1);
    EXPECT_EQ(log.count("[Persist] Loaded 12 columns of Row Items[1]"), 1);
}

TEST_F(RowTest, RefusesToLoadWhatIsNotThere) {
    const LogCapture log;
    const Ref<Item> missing = items()->rowWithID(77);
    EXPECT_EQ(assertionOf([&] { missing->doLoad(); }), "Loading nonexistent rowID 77!");
    const Ref<Item> free = Item::make("a");
    EXPECT_EQ(assertionOf([&] { free->doLoad(); }), "Can't load, no table");
    const Ref<Item> unsaved = Returner<Item>::adopted(new Item(items()));
    EXPECT_EQ(assertionOf([&] { unsaved->doLoad(); }), "mRowID!=0");
    saveItem("a");
    const Cursor other(&db(), "select * from Items");
    EXPECT_EQ(assertionOf([&] { missing->doLoad(other); }),
              "loadFrom: Cursor has wrong or missing rowID");
}

TEST_F(RowTest, LoadsAPartialResult) {
    const RowID rowID = saveItem("a");
    const Ref<Item> item = items()->rowWithID(rowID);
    const Cursor cursor(&db(), "select rowID, 5 as number from Items");
    item->doLoad(cursor);
    EXPECT_TRUE(item->mNumber.isLoaded());
    EXPECT_FALSE(item->mTitle.isLoaded());
    EXPECT_EQ(item->mNumber.getValue(), 5);
    EXPECT_EQ(item->mTitle.getValue()->utf8(), "a");
}

TEST_F(RowTest, KeepsEachKindOfValue) {
    RowID rowID = 0;
    {
        const AutoreleasePool inner;
        const Ref<Item> item = Item::make("a");
        item->mFlag.setValue(true);
        item->mNumber.setValue(-7);
        item->mBig.setValue(1LL << 40);
        item->mReal.setValue(0.25);
        item->mURL.setValue(URL::url(text("http://example.org/")));
        item->mDate.setValue(Date::date(1000.5));
        item->mBytes.setValue(Data::data("xyz", 3));
        item->mZone.setValue(TimeZone::timeZone("GMT+01:00"));
        item->saveChanges();
        rowID = item->getRowID();
    }
    ASSERT_EQ(items()->cachedRowWithID(rowID), nullptr);
    const Ref<Item> item = items()->rowWithID(rowID);
    EXPECT_TRUE(item->mFlag.getValue());
    EXPECT_EQ(item->mNumber.getValue(), -7);
    EXPECT_EQ(item->mBig.getValue(), 1LL << 40);
    EXPECT_EQ(item->mReal.getValue(), 0.25);
    EXPECT_EQ(item->mURL.getValue()->text(), "http://example.org/");
    EXPECT_EQ(item->mURL.getValue(), item->mURL.getValue());
    EXPECT_EQ(item->mDate.getValue()->getAbsoluteTime(), 1000.5);
    EXPECT_EQ(item->mBytes.getValue()->view(), "xyz");
    EXPECT_EQ(item->mZone.getValue()->getSecondsFromGMT(0), 3600);
    EXPECT_EQ(item->mNote.getValue(), nullptr);
    EXPECT_FALSE(item->isChanged());
}

TEST_F(RowTest, IsAddedToOneTableOnly) {
    const LoggingOn on({&gLogPersist});
    LogCapture log;
    const Ref<Item> item = Item::make("a");
    EXPECT_EQ(assertionOf([&] { item->addToTable(nullptr); }), "NULL table");
    item->addToTable(items());
    EXPECT_TRUE(item->isChanged());
    EXPECT_TRUE(log.contains(OVFormat("[Persist] Adding Row %p to table Items", item.get())));
    EXPECT_TRUE(log.contains(OVFormat("[Persist] Table Items: Caching new row [%p]", item.get())));
    item->addToTable(items());
    EXPECT_EQ(log.count("Caching new row"), 1);
    EXPECT_EQ(assertionOf([&] { item->addToTable(notes()); }), "Can't add Row to a second Table");
    item->deleteRow();
}

TEST_F(RowTest, MayNotBeChangedInAReader) {
    const RowID rowID = saveItem("a");
    const Ref<Group> group = Group::make("g");
    reopen(false);
    const LogCapture log;
    TableOf<Item> missing(&db(), "Missing", true, false);
    const Ref<Item> item = items()->rowWithID(rowID);
    for (const std::function<void()>& change : std::vector<std::function<void()>>{
             [&] { item->mNumber.setValue(9); }, [&] { item->setChanged(); },
             [&] { item->deleteRow(); }, [&] { group->addToTable(groups()); },
             [&] { items()->addColumn("x", "text"); }, [&] { items()->addIndex("i", "title"); },
             [&] { missing.create("a", nullptr, nullptr); }}) {
        try {
            change();
            ADD_FAILURE();
        } catch (const Exception& exception) {
            EXPECT_STREQ(exception.what(),
                         "SQLITE_AUTH[23.0]: Cannot change row: database is not writeable");
        }
    }
    EXPECT_FALSE(item->isChanged() || item->mNumber.isChanged());
    EXPECT_EQ(item->mNumber.getValue(), 0);
    EXPECT_EQ(group->getTable(), nullptr);
    EXPECT_TRUE(group->isChangeable());
    EXPECT_FALSE(item->isChangeable());
}

TEST_F(RowTest, SavesOnlyWhatIsChangedAndInATable) {
    const LoggingOn on({&gLogPersist});
    LogCapture log;
    const Ref<Item> item = Item::make("a");
    item->saveChanges();
    EXPECT_TRUE(log.contains("[Persist] Inserting Row into Items"));
    EXPECT_TRUE(log.contains(OVFormat("[Persist] Inserted Row -- now Items[1] %p", item.get())));
    EXPECT_TRUE(log.contains(OVFormat("Table Items: Uncaching new row [%p]", item.get())));
    EXPECT_FALSE(item->isChanged() || item->mTitle.isChanged());
    log.clear();
    item->saveChanges();
    EXPECT_FALSE(log.contains("Updating"));
    item->mNumber.setValue(4);
    EXPECT_TRUE(log.contains("[Persist] Changed Row Items[1]"));
    item->saveChanges();
    EXPECT_TRUE(log.contains(OVFormat("[Persist] Updating Row Items[1] %p", item.get())));
    EXPECT_EQ(count("number=4 and title='a'"), 1);
}

namespace {

/// A row whose class lists nothing and stores nothing.
class BareRow : public Row {
 public:
    using Row::Row;
    RowID doInsert() override { return newID; }
    void doUpdate() override { ++updates; }
    RowID newID = 0;
    int updates = 0;
};

}  // namespace

TEST_F(RowTest, NeedsATableAndAnIDToBeSaved) {
    const LogCapture log;
    const Ref<BareRow> row = Returner<BareRow>::adopted(new BareRow(static_cast<Table*>(nullptr)));
    row->saveChanges();
    row->setChanged();
    EXPECT_EQ(assertionOf([&] { row->saveChanges(); }),
              "Can't saveChanges to row that's not added to a Table");
    row->addToTable(items());
    EXPECT_EQ(assertionOf([&] { row->saveChanges(); }), "mRowID");
    row->deleteRow();
}

TEST_F(RowTest, LeavesFileAndTableWhenItIsDeleted) {
    const LoggingOn on({&gLogPersist});
    LogCapture log;
    const Ref<Item> item = Item::make("a");
    item->saveChanges();
    item->mNumber.setValue(5);
    item->deleteRow();
    EXPECT_EQ(count("1"), 0);
    EXPECT_TRUE(log.contains("[Persist] Table Items: Deleting Item[Items #1] 0x"));
    EXPECT_TRUE(log.contains(OVFormat("Table Items: Uncaching row #1 [%p]", item.get())));
    EXPECT_EQ(item->getRowID(), 0);
    EXPECT_EQ(item->getTable(), nullptr);
    EXPECT_TRUE(item->isLoaded());
    EXPECT_FALSE(item->isChanged() || item->isCached() || item->isRetained());
    EXPECT_EQ(items()->cachedRowWithID(1), nullptr);
    EXPECT_EQ(item->mTitle.getValue()->utf8(), "a");
}

TEST_F(RowTest, KeepsItsChangesIfItCannotBeDeleted) {
    const LogCapture log;
    const Ref<Item> item = Item::make("a");
    item->saveChanges();
    item->mNumber.setValue(5);
    {
        const Locker locker(path, "begin immediate");
        EXPECT_EQ(codeOf([&] { item->deleteRow(); }), 5);
    }
    EXPECT_TRUE(item->isChanged() && item->isRetained());
    EXPECT_EQ(items()->cachedRowWithID(1), item.get());
    db().saveRows();
    EXPECT_EQ(count("number=5"), 1);
}

TEST_F(RowTest, NeverTouchesTheFileIfItIsDeletedBeforeItIsSaved) {
    const LoggingOn on({&gLogSQL});
    LogCapture log;
    const Ref<Item> item = Item::make("a");
    item->addToTable(items());
    item->deleteRow();
    db().saveRows();
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(RowTest, WarnsOfChangesThatAreLost) {
    const LoggingOn on({&gLogPersist});
    LogCapture log;
    {
        const AutoreleasePool inner;
        const Ref<Item> item = Item::make("a");
        item->addToTable(items());
        items()->uncacheRows();
    }
    EXPECT_TRUE(log.contains("[WARNING] Dealloced Row Items[0] with unsaved changes!"));
    log.clear();
    saveItem("b");
    EXPECT_TRUE(log.contains("[Persist] Uncaching dealloced Row Items[1] 0x"));
    EXPECT_FALSE(log.contains("[WARNING]"));
}

TEST_F(RowTest, WarnsOfAReferenceThatOthersGaveUp) {
    const RowID rowID = saveItem("a");
    LogCapture log;
    {
        const Ref<Item> item = items()->rowWithID(rowID);
        item->setCached(true, true);
        item->release();
    }
    EXPECT_EQ(log.lines(), std::vector<std::string>{
                               "[WARNING] Dealloced Row Items[1] with its mRetained flag set! "
                               "Someone else has over-released it."});
    EXPECT_EQ(items()->getCachedRowCount(), 0U);
}

TEST_F(RowTest, CountsRowsWhileTheyAreLogged) {
    const LoggingOn on({&gLogPersist});
    LogCapture log;
    {
        const Ref<Item> free = Returner<Item>::adopted(new Item);
        const Ref<Item> fault = Returner<Item>::adopted(new Item(items(), 3));
    }
    ASSERT_EQ(log.lines().size(), 4U);
    EXPECT_EQ(log.count("[Persist] Created new Row 0x"), 1);
    EXPECT_EQ(log.count(" in (null) [now "), 1);
    EXPECT_EQ(log.count("[Persist] Instantiated row Items[3] 0x"), 1);
    EXPECT_EQ(log.count("[Persist] Dealloced Row Items[3] 0x"), 1);
    EXPECT_EQ(log.count("[Persist] Dealloced row 0x"), 1);
    EXPECT_EQ(log.count(" left]"), 2);
}

TEST_F(RowTest, IsNotToBeSavedOnceItIsUnloaded) {
    const Ref<Item> item = Item::make("a");
    item->saveChanges();
    item->mNumber.setValue(5);
    ASSERT_TRUE(item->isChanged() && item->isRetained());
    item->unload();
    EXPECT_FALSE(item->isChanged() || item->isRetained());
    EXPECT_TRUE(item->isCached());
    EXPECT_EQ(item->getRefCount(), 1U);
    platform.posts.clear();
    const LogCapture log;
    db().saveRows();
    EXPECT_FALSE(log.contains("*** Saving all database changes"));
    EXPECT_EQ(lastChanges(), "");
}

TEST_F(RowTest, IsToBeSavedForTheFirstTimeEvenIfItIsUnloaded) {
    const Ref<Item> item = Item::make("a");
    item->addToTable(items());
    item->unload();
    EXPECT_TRUE(item->isChanged());
    db().saveRows();
    EXPECT_EQ(count("1"), 1);
}

TEST_F(RowTest, ChangesAgainAfterItWasUnloaded) {
    const Ref<Item> item = Item::make("a");
    item->saveChanges();
    item->mNumber.setValue(5);
    item->unload();
    item->mNumber.setValue(6);
    db().saveRows();
    EXPECT_EQ(count("number=6"), 1);
}

TEST_F(RowTest, UnloadingGivesChangesUp) {
    const Ref<Item> item = Item::make("a");
    item->saveChanges();
    item->mNumber.setValue(5);
    item->unload();
    EXPECT_FALSE(item->isLoaded() || item->mNumber.isChanged() || item->mTitle.isLoaded());
    EXPECT_EQ(item->mNumber.getValue(), 0);
    const Ref<Note> note = Note::make("n");
    item->mNote.setValue(note.get());
    item->unload();
    EXPECT_EQ(item->mNote.getValue(), nullptr);
    EXPECT_EQ(note->getRefCount(), 1U);
    item->saveChanges();
    EXPECT_EQ(count("number=0 and note=0"), 1);
}
