#include "Foundation/AssertionFailure.h"
#include "Foundation/Logger.h"
#include "SQLite/StoreTest.h"
#include "SQLite/UpdateQuery.h"
#include "Support/DefaultZone.h"

#include <algorithm>
#include <vector>

using namespace Foundation;
using namespace SQLite;
using Support::DefaultZone;
using Support::LogCapture;
using Support::LoggingOn;

namespace {

using ScalarColumnTest = StoreTest;
using ToOneColumnTest = StoreTest;
using ToManyColumnTest = StoreTest;
using UpdateQueryTest = StoreTest;

const ColumnList& listOfTitleAndNumber() {
    static const ColumnList sColumns = {column<&Item::mNumber>("number"),
                                        column<&Item::mTitle>("title")};
    return sColumns;
}

}  // namespace

TEST_F(ScalarColumnTest, StartsLoadedOnlyInAFreeRow) {
    EXPECT_TRUE(Item::make("a")->mNumber.isLoaded());
    const Ref<Item> inTable = Returner<Item>::adopted(new Item(items()));
    EXPECT_FALSE(inTable->mNumber.isLoaded());
}

TEST_F(ScalarColumnTest, TheValueThatItHasChangesNothing) {
    const Ref<Item> item = Item::make("a");
    item->saveChanges();
    item->mTitle.setValue(text("a"));
    item->mNumber.setValue(0);
    item->mDate.setValue(nullptr);
    EXPECT_FALSE(item->isChanged());
    item->mTitle.setValue(text("b"));
    EXPECT_TRUE(item->isChanged() && item->mTitle.isChanged());
    EXPECT_FALSE(item->mNumber.isChanged());
}

TEST_F(ScalarColumnTest, AnyValueChangesAColumnThatIsNotLoaded) {
    const RowID rowID = saveItem("a");
    const Ref<Item> item = items()->rowWithID(rowID);
    item->mTitle.setValue(text("a"));
    EXPECT_TRUE(item->isChanged());
    EXPECT_TRUE(item->mTitle.isLoaded());
    EXPECT_FALSE(item->isLoaded());
}

TEST_F(ScalarColumnTest, KeepsAChangeThroughALoad) {
    const RowID rowID = saveItem("a");
    const Ref<Item> item = items()->rowWithID(rowID);
    item->mTitle.setValue(text("mine"));
    EXPECT_EQ(item->mNumber.getValue(), 0);
    EXPECT_EQ(item->mTitle.getValue()->utf8(), "mine");
    item->mTitle.setValue(text("a"));
    EXPECT_TRUE(item->mTitle.isChanged());
}

TEST_F(ScalarColumnTest, LoadsByNameAndLeavesOutWhatIsMissing) {
    const RowID rowID = saveItem("a");
    const Ref<Item> item = items()->rowWithID(rowID);
    const Cursor cursor(&db(), "select rowID, 6 as number from Items");
    item->mBig.loadValue(cursor.column("big"));
    EXPECT_FALSE(item->mBig.isLoaded());
    item->mNumber.loadValue(cursor.column("number"));
    EXPECT_TRUE(item->mNumber.isLoaded());
    EXPECT_EQ(item->mNumber.getValue(), 6);
}

TEST_F(ScalarColumnTest, KeepsTheOldValueAliveForThePool) {
    const Ref<Item> item = Item::make("a");
    String* old = item->mTitle.getValue();
    item->mTitle.setValue(text("b"));
    EXPECT_EQ(old->utf8(), "a");
}

TEST_F(ScalarColumnTest, ReadsEachKindOfValue) {
    const RowID rowID = saveItem("a");
    db().execute(
        "update Items set title='t\xC3\xA4', url='http://a.example/', date=5.5, bytes=x'0001ff', "
        "zone=cast('Europe/Berlin' as blob)");
    const Ref<Item> item = items()->rowWithID(rowID);
    EXPECT_EQ(item->mTitle.getValue()->utf8(), "t\xC3\xA4");
    EXPECT_EQ(Ref<String>(item->mURL.getValue()->getString())->utf8(), "http://a.example/");
    EXPECT_EQ(item->mDate.getValue()->getAbsoluteTime(), 5.5);
    EXPECT_EQ(item->mBytes.getValue()->view(), std::string_view("\0\1\xff", 3));
    EXPECT_EQ(item->mZone.getValue()->getName(), "Europe/Berlin");
    EXPECT_EQ(item->mTitle.getValue(), item->mTitle.getValue());
}

TEST_F(ScalarColumnTest, IsNullForWhatStandsForNoValue) {
    const RowID rowID = saveItem("a");
    const auto expectNulls = [&] {
        const Ref<Item> item = items()->rowWithID(rowID);
        EXPECT_EQ(item->mTitle.getValue(), nullptr);
        EXPECT_EQ(item->mURL.getValue(), nullptr);
        EXPECT_EQ(item->mDate.getValue(), nullptr);
        EXPECT_EQ(item->mBytes.getValue(), nullptr);
        EXPECT_EQ(item->mZone.getValue(), nullptr);
    };
    db().execute("update Items set title=null");
    expectNulls();
    db().execute("update Items set title=null, date=0.0, bytes=x'', zone=x'6d617273'");
    expectNulls();
}

TEST_F(ScalarColumnTest, IsEmptyForAnEmptyText) {
    const RowID rowID = saveItem("");
    const Ref<Item> item = items()->rowWithID(rowID);
    ASSERT_NE(item->mTitle.getValue(), nullptr);
    EXPECT_TRUE(item->mTitle.getValue()->isEmpty());
}

TEST_F(ScalarColumnTest, WarnsOnceOfATextThatIsNotUTF8) {
    const RowID rowID = saveItem("a");
    db().execute("update Items set title=cast(x'ff' as text)");
    const Ref<Item> item = items()->rowWithID(rowID);
    const LogCapture log;
    EXPECT_EQ(item->mNumber.getValue(), 0);
    EXPECT_TRUE(log.lines().empty());
    EXPECT_EQ(item->mTitle.getValue(), nullptr);
    EXPECT_EQ(item->mTitle.getValue(), nullptr);
    EXPECT_EQ(log.count("unable to parse UTF-8"), 1);
}

TEST_F(ScalarColumnTest, ReadsAZoneByThePlaceThatItWasWrittenWith) {
    const DefaultZone central("CET");
    const Ref<Item> item = Item::make("a");
    item->mZone.setValue(TimeZone::defaultZone());
    item->saveChanges();
    item->unload();
    const double summer = 174'000'000;  // in July 2006
    EXPECT_EQ(item->mZone.getValue()->getSecondsFromGMT(summer), 7200);
}

TEST_F(ScalarColumnTest, KeepsTheOldValueAliveThroughALoad) {
    const Ref<Item> item = Item::make("a");
    item->saveChanges();
    String* old = item->mTitle.getValue();
    db().execute("update Items set title='b'");
    item->doLoad();
    EXPECT_EQ(old->utf8(), "a");
    EXPECT_EQ(item->mTitle.getValue()->utf8(), "b");
}

TEST_F(ToOneColumnTest, PointsAtAnUnsavedRowWithoutAFault) {
    const RowID rowID = saveItem("a");
    const Ref<Item> item = items()->rowWithID(rowID);
    const Ref<Note> note = Note::make("n");
    item->mNote.setValue(note.get());
    EXPECT_TRUE(static_cast<bool>(item->mNote));
    EXPECT_FALSE(item->isLoaded());
    EXPECT_EQ(item->mNote.getValue(), note.get());
    EXPECT_EQ(item->mNote.getRowID(), 0);
    item->mNote.setValue(nullptr);
    EXPECT_FALSE(static_cast<bool>(item->mNote));
    EXPECT_EQ(item->mNote.getValue(), nullptr);
}

TEST_F(ToOneColumnTest, OwnsAnUnsavedChildButNotAParent) {
    const Ref<Item> item = Item::make("a");
    const Ref<Note> note = Note::make("n");
    const Ref<Group> group = Group::make("g");
    item->mNote.setValue(note.get());
    item->mOwner.setValue(group.get());
    EXPECT_EQ(note->getRefCount(), 2U);
    EXPECT_EQ(group->getRefCount(), 1U);
    item->mNote.setValue(nullptr);
    item->mOwner.setValue(nullptr);
    EXPECT_EQ(note->getRefCount(), 1U);
    EXPECT_EQ(group->getRefCount(), 1U);
}

TEST_F(ToOneColumnTest, SavesWhatItPointsAtFirst) {
    const Ref<Item> item = Item::make("a");
    {
        const AutoreleasePool inner;
        item->mNote.setValue(Note::make("n").get());
    }
    const Ref<Group> group = Group::make("g");
    item->mOwner.setValue(group.get());
    item->saveChanges();
    EXPECT_EQ(item->mNote.getRowID(), 1);
    EXPECT_EQ(group->getRowID(), 1);
    EXPECT_EQ(count("note=1 and owner=1"), 1);
    EXPECT_FALSE(item->mNote.isChanged());
    EXPECT_EQ(item->mNote.getValue()->mBody.getValue()->utf8(), "n");
    EXPECT_EQ(group->getRefCount(), 2U);
    EXPECT_EQ(item->mOwner.getValue(), group.get());
}

TEST_F(ToOneColumnTest, FindsTheRowByItsID) {
    const Ref<Note> note = Note::make("n");
    note->saveChanges();
    const Ref<Item> item = Item::make("a");
    item->mNote.setValue(note.get());
    item->saveChanges();
    const RowID rowID = item->getRowID();
    item->unload();
    EXPECT_TRUE(static_cast<bool>(item->mNote));
    EXPECT_EQ(item->mNote.getValue(), note.get());
    item->mNote.setValue(note.get());
    EXPECT_FALSE(item->isChanged());
    item->mNote.setValue(nullptr);
    item->saveChanges();
    EXPECT_EQ(db().execScalar("select note=0 from Items where rowID=%lld", rowID), 1);
}

namespace {

/// A row that never gets an ID.
class NoRow : public Row {
 public:
    NoRow() : Row(static_cast<Table*>(nullptr)) {}
    void saveChanges() override {}
    RowID doInsert() override { return 0; }
    void doUpdate() override {}
};

}  // namespace

TEST_F(ToOneColumnTest, NeedsARowThatGetsAnID) {
    const LogCapture log;
    const Ref<Item> item = Item::make("a");
    const Ref<NoRow> row = Returner<NoRow>::adopted(new NoRow);
    static_cast<BasicToOneColumn&>(item->mNote).setValue(row.get(), true);
    try {
        item->mNote.saveChanges(notes());
        FAIL();
    } catch (const AssertionFailure& failure) {
        EXPECT_STREQ(failure.what(), "BasicToOneColumn can't get dst rowID");
    }
    item->mNote.setValue(nullptr);
    notes()->uncacheRows();
}

TEST_F(ToManyColumnTest, KeepsEachNewRowOnceInOrder) {
    const Ref<Group> group = Group::make("g");
    const Ref<Item> a = Item::make("a");
    const Ref<Item> b = Item::make("b");
    const Ref<Item> c = Item::make("c");
    for (const Ref<Item>& item : {a, b, a, c}) {
        group->mItems.add(item.get());
    }
    EXPECT_EQ(group->mItems.getNewRows().size(), 3U);
    EXPECT_TRUE(group->mItems.remove(a.get()));
    EXPECT_FALSE(group->mItems.remove(a.get()));
    EXPECT_EQ(group->mItems.getNewRows().at(0).get(), b.get());
    EXPECT_EQ(group->mItems.getNewRows().at(1).get(), c.get());
    EXPECT_STREQ(group->mItems.getForeignKey(), "owner");
}

TEST_F(ToManyColumnTest, KeepsThousandsOfRowsAsItKeepsAFew) {
    constexpr std::size_t kRows = 5000;
    const Ref<Group> group = Group::make("g");
    std::vector<Ref<Item>> rows;
    for (std::size_t i = 0; i < kRows; ++i) {
        rows.push_back(Item::make("a"));
    }
    for (int times = 0; times < 2; ++times) {
        for (const Ref<Item>& item : rows) {
            group->mItems.add(item.get());
        }
    }
    ASSERT_EQ(group->mItems.getNewRows().size(), kRows);
    // One that has gone may come again, as the last.
    for (const std::size_t gone : {std::size_t{0}, kRows / 2, kRows - 1}) {
        EXPECT_TRUE(group->mItems.remove(rows[gone].get()));
        EXPECT_FALSE(group->mItems.remove(rows[gone].get()));
    }
    group->mItems.add(rows[0].get());
    ASSERT_EQ(group->mItems.getNewRows().size(), kRows - 2);
    EXPECT_EQ(group->mItems.getNewRows().at(0).get(), rows[1].get());
    EXPECT_EQ(group->mItems.getNewRows().at(kRows / 2 - 1).get(), rows[kRows / 2 + 1].get());
    EXPECT_EQ(group->mItems.getNewRows().back().get(), rows[0].get());
    // Down to none, the last first.
    std::reverse(rows.begin(), rows.end());
    for (const Ref<Item>& item : rows) {
        group->mItems.remove(item.get());
    }
    EXPECT_TRUE(group->mItems.getNewRows().empty());
    group->mItems.add(rows[0].get());
    EXPECT_EQ(group->mItems.getNewRows().size(), 1U);
}

TEST_F(ToManyColumnTest, ReleasesARowThatGoesAtOnce) {
    const Ref<Group> group = Group::make("g");
    Ref<Item> first = Item::make("a");
    const Ref<Item> second = Item::make("b");
    group->mItems.add(first.get());
    group->mItems.add(second.get());
    const std::uint32_t references = second->getRefCount();
    {
        const AutoreleasePool inner;
        group->mItems.remove(first.get());
        EXPECT_EQ(first->getRefCount(), 1U);
    }
    EXPECT_EQ(second->getRefCount(), references);
}

TEST_F(ToManyColumnTest, SavesItsRowsBehindTheOwner) {
    const Ref<Group> group = Group::make("g");
    {
        const AutoreleasePool inner;
        for (const char* title : {"a", "b"}) {
            const Ref<Item> item = Item::make(title);
            item->mOwner.setValue(group.get());
            group->mItems.add(item.get());
        }
    }
    group->saveChanges();
    EXPECT_EQ(count("owner=1"), 2);
    EXPECT_TRUE(group->mItems.getNewRows().empty());
    EXPECT_EQ(items()->getCachedRowCount(), 0U);
}

TEST_F(UpdateQueryTest, WritesOnlyWhatChanged) {
    const Ref<Item> item = Item::make("a");
    item->saveChanges();
    executeElsewhere("update Items set real=1.5");
    item->mTitle.setValue(text("b"));
    item->mNumber.setValue(3);
    UpdateQuery query(item.get(), listOfTitleAndNumber());
    EXPECT_STREQ(query.getSQL(), "update Items set number=?, title=? where rowID=1");
    EXPECT_EQ(query.execute(), 1);
    EXPECT_EQ(count("title='b' and number=3 and real=1.5"), 1);
    item->mNumber.clearChanged();
    EXPECT_STREQ(UpdateQuery(item.get(), listOfTitleAndNumber()).getSQL(),
                 "update Items set title=? where rowID=1");
}

TEST_F(UpdateQueryTest, RunsNoSQLWithoutAChange) {
    const Ref<Item> item = Item::make("a");
    item->saveChanges();
    const LoggingOn on({&gLogSQL, &gLogPersist});
    LogCapture log;
    EXPECT_EQ(UpdateQuery(item.get(), listOfTitleAndNumber()).execute(), 0);
    EXPECT_EQ(log.lines(),
              std::vector<std::string>{"[Persist] UpdateQuery found no changed columns; no-op"});
}
