#include "Foundation/Logger.h"
#include "Foundation/NotificationRecorder.h"
#include "SQLite/Exception.h"
#include "SQLite/StoreTest.h"
#include "SQLite/Transaction.h"

#include <sqlite3.h>

#include <stdexcept>

using namespace Foundation;
using namespace SQLite;
using Support::LogCapture;
using Support::LoggingOn;

namespace {

class DatabaseChanges : public StoreTest {
 protected:
    DatabaseChanges() {
        NotificationCenter::getLocal()->addObserver(rows, Table::kRowsChangedNotification, nullptr);
    }
    ~DatabaseChanges() noexcept override { NotificationCenter::getLocal()->removeObserver(rows); }

    /// As the writer would announce it.
    void announce(const char* table, std::initializer_list<std::pair<const char*, int>> changes) {
        using Rows = MutableDictionaryOf<String, Number>;
        const Ref<Rows> dict{Rows::dictionary()};
        for (const auto& [rowID, action] : changes) {
            dict->set(rowID, Number::number(action));
        }
        const Ref<MutableDictionary> all{MutableDictionary::dictionary()};
        all->set(table, static_cast<PFRefCounted*>(dict.get()));
        platform.deliver("com.tarnwick.orvane.DBChanged", path, all.get());
    }

    NotificationRecorder rows;
};

class FailingTable : public TableOf<Item> {
 public:
    using TableOf::TableOf;
    void _receiveChangeNotification(Dictionary*) override {
        throw std::runtime_error("cannot receive");
    }
    void databaseClosing() override { throw std::runtime_error("cannot close"); }
};

}  // namespace

TEST_F(DatabaseChanges, AnnouncesACommitWithItsChangesAtOnce) {
    const LoggingOn on({&gLogPersist});
    LogCapture log;
    {
        const Transaction transaction(true);
        db().execute("insert into Items (title) values ('a'), ('b')");
        db().execute("insert into Notes (body) values ('n')");
        db().execute("update Items set number=1 where rowID=1");
        db().execute("insert into Items (title) values ('c')");
        db().execute("delete from Items where title='c'");
    }
    ASSERT_EQ(platform.posts.size(), 1U);
    const FakeCenter::Post& post = platform.posts[0];
    EXPECT_EQ(post.name, "com.tarnwick.orvane.DBChanged");
    EXPECT_EQ(post.object, path);
    EXPECT_TRUE(post.isUrgent);
    const auto* changed = post.info->getAs<Dictionary>("Items");
    EXPECT_EQ(Number::getInteger(changed->getAs<Number>("1")), 23);
    EXPECT_EQ(Number::getInteger(changed->getAs<Number>("2")), 18);
    EXPECT_EQ(Number::getInteger(changed->getAs<Number>("3")), 9);
    EXPECT_EQ(changed->count(), 3U);
    EXPECT_TRUE(log.contains("[Persist] ~~~~Database changed: #18 'Items' 1"));
    EXPECT_TRUE(
        log.contains("===== Database posting distributed change notification:"
                     "\n          Items:  1 +2 -3\n          Notes:  +1"));
    EXPECT_TRUE(log.contains("[Persist] ===== Posting local table-changed notifications"));
    // The tables' own notifications follow, with their part.
    ASSERT_EQ(rows.notes.size(), 2U);
    EXPECT_EQ(rows.notes[0], "Orvane::Table::RowsChanged");
    EXPECT_EQ(rows.objects, (std::vector<void*>{items(), notes()}));
}

TEST_F(DatabaseChanges, GathersWhatChangesOutsideOfTransactionsForTheNextTurn) {
    db().execute("insert into Items (title) values ('a')");
    db().execute("insert into Items (title) values ('b')");
    EXPECT_TRUE(platform.posts.empty());
    clock.advanceBy(0);
    ASSERT_EQ(platform.posts.size(), 1U);
    EXPECT_EQ(lastChanges(), "\n          Items:  +1 +2");
    clock.advanceBy(1);
    EXPECT_EQ(platform.posts.size(), 1U);
}

TEST_F(DatabaseChanges, ACommitAnnouncesWhatWasPendingToo) {
    db().execute("insert into Items (title) values ('a')");
    {
        const Transaction transaction(true);
        db().execute("insert into Items (title) values ('b')");
    }
    EXPECT_EQ(lastChanges(), "\n          Items:  +1 +2");
    clock.advanceBy(1);
    EXPECT_EQ(platform.posts.size(), 1U);
}

TEST_F(DatabaseChanges, SaysNothingOfACommitWithoutChanges) {
    {
        const Transaction transaction(true);
        db().execute("update Items set number=1");
    }
    db()._postChangeNotification();
    EXPECT_TRUE(platform.posts.empty());
    EXPECT_TRUE(rows.notes.empty());
}

TEST_F(DatabaseChanges, SaysNothingWithoutTheHook) {
    db().setPostsNotifications(false);
    db().execute("insert into Items (title) values ('a')");
    clock.advanceBy(1);
    EXPECT_TRUE(platform.posts.empty());
}

TEST_F(DatabaseChanges, SkipsTablesThatTheProcessHasNot) {
    db().execute("create table other (a); insert into other values (1)");
    clock.advanceBy(0);
    EXPECT_EQ(platform.posts.size(), 1U);
    EXPECT_TRUE(rows.notes.empty());
}

TEST_F(DatabaseChanges, NeverLetsAnExceptionIntoSqlite) {
    // A reader that writes: what would let it do so is taken away.
    reopen(false);
    db().setPostsNotifications(true);
    sqlite3_set_authorizer(db().db(), nullptr, nullptr);
    LogCapture log;
    db().execute("insert into Items (title) values ('a')");
    EXPECT_EQ(count("title='a'"), 1);
    EXPECT_TRUE(log.contains("mWriteable"));
    EXPECT_TRUE(
        log.contains("static void SQLite::Database::_updateHook(void *, int, const char *, "
                     "const char *, sqlite_int64)"));
    clock.advanceBy(1);
    EXPECT_TRUE(platform.posts.empty());
}

TEST_F(DatabaseChanges, ARollBackDropsWhatWasPendingBeforeIt) {
    const LogCapture log;
    db().execute("insert into Items (title) values ('a')");
    EXPECT_THROW(
        {
            const Transaction transaction(true);
            throw std::runtime_error("no");
        },
        std::runtime_error);
    clock.advanceBy(1);
    EXPECT_TRUE(platform.posts.empty());
    EXPECT_EQ(count("1"), 1);
}

TEST_F(DatabaseChanges, ATableThatFailsToReceiveDoesNotStopTheOthers) {
    const RowID rowID = saveItem("a");
    reopen(false);
    const FailingTable failing(&db(), "Failing", true, false);
    const Ref<Item> item = items()->rowWithID(rowID);
    item->doLoad();
    using Rows = MutableDictionaryOf<String, Number>;
    const Ref<Rows> changed{Rows::dictionary()};
    changed->set("1", Number::number(23));
    const Ref<MutableDictionary> all{MutableDictionary::dictionary()};
    for (const char* table : {"Failing", "Items"}) {
        all->set(table, static_cast<PFRefCounted*>(changed.get()));
    }
    LogCapture log;
    platform.deliver("com.tarnwick.orvane.DBChanged", path, all.get());
    EXPECT_TRUE(log.contains("cannot receive"));
    EXPECT_TRUE(
        log.contains("void SQLite::Database::_receiveChangeNotification("
                     "Foundation::Notification *)"));
    EXPECT_FALSE(item->isLoaded());
    EXPECT_EQ(rows.objects.size(), 2U);
}

TEST_F(DatabaseChanges, ATableThatFailsToCloseEndsTheWalk) {
    const RowID rowID = saveItem("a");
    const FailingTable failing(&db(), "Failing", true, false);
    TableOf<Item> after(&db(), "Items", true, false);
    const Ref<Item> before = items()->rowWithID(rowID);
    const Ref<Item> item = after.rowWithID(rowID);
    LogCapture log;
    db().close(true);
    EXPECT_TRUE(log.contains("cannot close"));
    EXPECT_TRUE(log.contains("void SQLite::Database::close(bool)"));
    EXPECT_FALSE(before->isCached());
    EXPECT_TRUE(item->isCached());
    EXPECT_FALSE(db().isOpen());
    reopen(true);
    EXPECT_EQ(count("1"), 1);
}

TEST_F(DatabaseChanges, DescribesChangesForTheLog) {
    using Rows = MutableDictionaryOf<String, Number>;
    const Ref<Rows> changed{Rows::dictionary()};
    changed->set("1", Number::number(9));
    changed->set("2", Number::number(18));
    changed->set("3", Number::number(23));
    changed->set("4", Number::number(7));
    const Ref<MutableDictionary> all{MutableDictionary::dictionary()};
    all->set("Feeds", static_cast<PFRefCounted*>(changed.get()));
    const Ref<String> described = describeChanges(all.get());
    EXPECT_EQ(described->utf8(), "\n          Feeds:  -1 +2 3 ?4");
    const Ref<String> nothing = describeChanges(nullptr);
    EXPECT_EQ(nothing->utf8(), "");
}

TEST_F(DatabaseChanges, SavesSoonOnceFiveSecondsAfterTheFirstRequest) {
    const LoggingOn on({});
    LogCapture log;
    const Ref<Item> item = Item::make("a");
    item->addToTable(items());
    for (int i = 0; i < 10; ++i) {
        db().saveRowsSoon();
        clock.advanceBy(0.4);
    }
    EXPECT_EQ(log.count("(Will save database changes in 5 sec)"), 10);
    clock.advanceBy(0.9);
    EXPECT_EQ(count("1"), 0);
    clock.advanceBy(0.11);
    EXPECT_EQ(count("1"), 1);
    EXPECT_EQ(log.count("*** Saving all database changes"), 1);
    clock.advanceBy(20);
    EXPECT_EQ(platform.posts.size(), 1U);
}

TEST_F(DatabaseChanges, ASaveIsNoLongerDueOnceItIsDone) {
    const Ref<Item> item = Item::make("a");
    item->addToTable(items());
    db().saveRowsSoon();
    clock.advanceBy(1);
    db().saveRows();
    item->mNumber.setValue(1);
    clock.advanceBy(20);
    EXPECT_EQ(count("number=0"), 1);
    item->unload();
}

TEST_F(DatabaseChanges, SavesWithoutATransactionWhereNothingChanged) {
    const LoggingOn on({&gLogSQL});
    LogCapture log;
    db().saveRows();
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(DatabaseChanges, SavesTablesInTheOrderOfTheirFirstUse) {
    const Ref<Note> note = Note::make("n");
    note->addToTable(notes());
    const Ref<Group> group = Group::make("g");
    group->addToTable(groups());
    const LoggingOn on({&gLogPersist, &gLogSQL});
    LogCapture log;
    db().saveRows();
    std::vector<std::string> inserted;
    for (const std::string& line : log.lines()) {
        if (line.find("Inserting Row into") != std::string::npos) inserted.push_back(line);
    }
    EXPECT_EQ(inserted, (std::vector<std::string>{"[Persist] Inserting Row into Groups",
                                                  "[Persist] Inserting Row into Notes"}));
    EXPECT_EQ(log.count(">>>> BEGIN IMMEDIATE TRANSACTION"), 1);
    EXPECT_EQ(platform.posts.size(), 1U);
}

TEST_F(DatabaseChanges, AReaderObservesItsFileAndUnloadsWhatWasUpdated) {
    const RowID rowID = saveItem("old");
    reopen(false);
    EXPECT_EQ(platform.subscriptions.back(), "com.tarnwick.orvane.DBChanged " + path);
    const Ref<Item> item = items()->rowWithID(rowID);
    EXPECT_EQ(item->mTitle.getValue()->utf8(), "old");
    executeElsewhere("update Items set title='new'");
    EXPECT_EQ(item->mTitle.getValue()->utf8(), "old");
    const LoggingOn on({&gLogPersist});
    LogCapture log;
    announce("Items", {{"1", 23}});
    EXPECT_TRUE(
        log.contains("===== Received distributed database-changed notification:"
                     "\n          Items:  1"));
    EXPECT_TRUE(log.contains("Table 'Items' changed externally!"));
    EXPECT_TRUE(log.contains("    ...unloaded columns of row 1"));
    EXPECT_FALSE(item->isLoaded());
    EXPECT_EQ(items()->cachedRowWithID(rowID), item.get());
    EXPECT_EQ(item->mTitle.getValue()->utf8(), "new");
    EXPECT_EQ(rows.objects, std::vector<void*>{items()});
}

TEST_F(DatabaseChanges, AReaderForgetsWhatWasDeleted) {
    const RowID rowID = saveItem("a");
    reopen(false);
    const Ref<Item> item = items()->rowWithID(rowID);
    const LoggingOn on({&gLogPersist});
    LogCapture log;
    announce("Items", {{"1", 9}, {"2", 9}, {"3", 18}});
    EXPECT_EQ(log.count("    ...uncached deleted row"), 1);
    EXPECT_EQ(items()->cachedRowWithID(rowID), nullptr);
    EXPECT_FALSE(item->isCached());
}

TEST_F(DatabaseChanges, AReaderInvalidatesAllTablesBeforeAnybodyIsTold) {
    const RowID rowID = saveItem("a");
    {
        const Ref<Group> group = Group::make("g");
        group->saveChanges();
    }
    reopen(false);
    const Ref<Item> item = items()->rowWithID(rowID);
    const Ref<Group> group = groups()->rowWithID(1);
    item->doLoad();
    group->doLoad();
    bool allUnloaded = true;
    rows.also = [&](Notification*) {
        allUnloaded = allUnloaded && !item->isLoaded() && !group->isLoaded();
    };
    using Rows = MutableDictionaryOf<String, Number>;
    const Ref<Rows> changed{Rows::dictionary()};
    changed->set("1", Number::number(23));
    const Ref<MutableDictionary> all{MutableDictionary::dictionary()};
    for (const char* table : {"Items", "Groups", "Unknown"}) {
        all->set(table, static_cast<PFRefCounted*>(changed.get()));
    }
    platform.deliver("com.tarnwick.orvane.DBChanged", path, all.get());
    EXPECT_EQ(rows.notes.size(), 2U);
    EXPECT_TRUE(allUnloaded);
}

TEST_F(DatabaseChanges, AReaderReportsWhatItCannotReadAndGoesOn) {
    const RowID rowID = saveItem("a");
    reopen(false);
    const Ref<Item> item = items()->rowWithID(rowID);
    LogCapture log;
    announce("Items", {{"nonsense", 9}, {"1", 9}});
    EXPECT_TRUE(log.contains("Bad rowID 'nonsense'"));
    EXPECT_TRUE(
        log.contains("void SQLite::Table::_applyChangeNotification("
                     "Database::TableChangeDict *, bool)"));
    EXPECT_FALSE(item->isCached());
    platform.deliver("com.tarnwick.orvane.DBChanged", path, nullptr);
}

TEST_F(DatabaseChanges, TheWriterKeepsWhatItUpdated) {
    const Ref<Item> item = Item::make("a");
    item->saveChanges();
    item->mNumber.setValue(7);
    item->saveChanges();
    const std::size_t before = platform.posts.size();
    clock.advanceBy(0);
    EXPECT_GT(platform.posts.size(), before);
    EXPECT_TRUE(item->isLoaded());
    EXPECT_TRUE(item->mNumber.isLoaded());
    EXPECT_EQ(items()->cachedRowWithID(item->getRowID()), item.get());
}

TEST_F(DatabaseChanges, AWriterDoesNotObserve) {
    EXPECT_TRUE(platform.subscriptions.empty());
    const RowID rowID = saveItem("a");
    const Ref<Item> item = items()->rowWithID(rowID);
    item->doLoad();
    announce("Items", {{"1", 23}});
    EXPECT_TRUE(item->isLoaded());
}

TEST_F(DatabaseChanges, AClosedReaderObservesNoMore) {
    saveItem("a");
    reopen(false);
    db().close(false);
    announce("Items", {{"1", 23}});
    EXPECT_TRUE(rows.notes.empty());
}
