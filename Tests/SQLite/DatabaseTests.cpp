#include "SQLite/Database.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/NotificationRecorder.h"
#include "Foundation/RunLoop.h"
#include "Foundation/URL.h"
#include "SQLite/Exception.h"
#include "SQLite/Statement.h"
#include "SQLite/StoreTest.h"
#include "Support/AssertionOf.h"

#include <sqlite3.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <filesystem>
#include <functional>
#include <thread>

using namespace Foundation;
using namespace SQLite;
using Support::assertionOf;
using Support::LogCapture;
using Support::LoggingOn;

namespace {

using DatabaseTest = StoreTest;

}  // namespace

TEST_F(DatabaseTest, OpensAFileWithItsSettings) {
    EXPECT_TRUE(db().isOpen());
    EXPECT_TRUE(db().isWriteable());
    EXPECT_EQ(db().getBusyTimeout(), 25000);
    EXPECT_EQ(db().execScalar("PRAGMA temp_store"), 2);
    EXPECT_EQ(db().execScalar("PRAGMA trusted_schema"), 0);
    EXPECT_EQ(db().execScalar("PRAGMA cell_size_check"), 1);
    EXPECT_EQ(db().getLocation()->getFileSystemRepresentation(), path);
    // Writing the schema by hand is refused.
    db().execute("PRAGMA writable_schema = 1");
    EXPECT_NE(codeOf([] { db().execute("delete from sqlite_master"); }), 0);
}

TEST_F(DatabaseTest, CountsAGenerationForEachOpenAndClose) {
    const std::uint32_t first = db().getGeneration();
    db().close(false);
    EXPECT_EQ(db().getGeneration(), first + 1);
    db().close(false);
    EXPECT_EQ(db().getGeneration(), first + 1);
    db().open(path.c_str(), true);
    EXPECT_EQ(db().getGeneration(), first + 2);
    EXPECT_EQ(Database().getGeneration(), 1U);
}

TEST_F(DatabaseTest, OpensInMemoryForANullPath) {
    const LoggingOn on({});
    LogCapture log;
    Database memory;
    memory.open(static_cast<const char*>(nullptr), true);
    EXPECT_TRUE(log.contains("*** Opening database :memory:"));
    EXPECT_EQ(memory.getLocation(), nullptr);
    EXPECT_EQ(memory.execScalar("select 3"), 3);
    EXPECT_EQ(assertionOf([&] { memory.setPostsNotifications(true); }), "mLocation");
}

TEST_F(DatabaseTest, OpensTheFileOfAURL) {
    Database other;
    const Ref<URL> url = URL::urlWithFileSystemPath(path.c_str(), false);
    other.open(url.get(), false);
    EXPECT_EQ(other.execScalar("select count(*) from Items"), 0);
    other.close(false);
    const Ref<URL> remote = URL::url(text("http://example.org/a"));
    EXPECT_EQ(assertionOf([&] { other.open(remote.get(), true); }), "filePath");
    EXPECT_EQ(assertionOf([&] { other.open(static_cast<URL*>(nullptr), true); }), "filePath");
}

TEST_F(DatabaseTest, RefusesASecondOpen) {
    const LogCapture log;
    EXPECT_EQ(assertionOf([] { db().open("/x", true); }), "Database already open!");
}

TEST_F(DatabaseTest, RefusesUseWhileClosed) {
    LogCapture log;
    const Database closed;
    EXPECT_EQ(assertionOf([&] { closed.db(); }), "Database not open");
    EXPECT_TRUE(log.contains("sqlite3 *SQLite::Database::db() const"));
}

TEST_F(DatabaseTest, ReadsOnlyFilesThatExist) {
    const LogCapture log;
    Database reader;
    const std::string missing = directory / "missing";
    try {
        reader.open(missing.c_str(), false);
        FAIL();
    } catch (const Exception& exception) {
        EXPECT_STREQ(exception.what(), "SQLITE_CANTOPEN[14.0]: Database file not found");
    }
    EXPECT_NE(access(missing.c_str(), F_OK), 0);
    reader.open(missing.c_str(), true);
    EXPECT_EQ(reader.execScalar("select 1"), 1);
}

TEST_F(DatabaseTest, IsClosedAfterAnOpenThatFails) {
    LogCapture log;
    Database other;
    EXPECT_EQ(codeOf([&] { other.open((directory / "no/such/folder").c_str(), true); }) & 0xFF, 14);
    EXPECT_TRUE(log.contains("SQL Error: SQLITE_CANTOPEN[14.0]: unable to open database file"));
    EXPECT_FALSE(other.isOpen());
    EXPECT_EQ(other.getLocation(), nullptr);
    other.open(path.c_str(), true);
    EXPECT_TRUE(other.isOpen());
}

TEST_F(DatabaseTest, KeepsAutoVacuumWhenItTurnsToTheWriteAheadLog) {
    Database fresh;
    fresh.open((directory / "fresh").c_str(), true);
    fresh.execute("PRAGMA auto_vacuum = INCREMENTAL");
    EXPECT_TRUE(fresh.useWriteAheadLog());
    fresh.execute("create table t (a)");
    EXPECT_EQ(fresh.execScalar("PRAGMA auto_vacuum"), 2);
    EXPECT_EQ(fresh.execScalar("PRAGMA synchronous"), 2);
    const Cursor mode(&fresh, "PRAGMA journal_mode");
    EXPECT_STREQ(mode.cStringColumn(0), "wal");
}

TEST_F(DatabaseTest, KeepsTheRollBackJournalWhereThereIsNoWriteAheadLog) {
    Database memory;
    memory.open(static_cast<const char*>(nullptr), true);
    EXPECT_FALSE(memory.useWriteAheadLog());
    EXPECT_EQ(memory.execScalar("PRAGMA synchronous"), 2);
}

TEST_F(DatabaseTest, KeepsTheRollBackJournalWhileSomebodyReads) {
    const LogCapture log;
    const Locker reader(path, "begin; select * from Items");
    const Locker holder(path, "begin immediate");
    EXPECT_FALSE(db().useWriteAheadLog());
    clock.advanceBy(1);
    EXPECT_FALSE(log.contains("DBFatalErr"));
}

TEST_F(DatabaseTest, ReadsAndWritesTheUserVersion) {
    EXPECT_EQ(db().getUserVersion(), 0);
    db().setUserVersion(10022);
    EXPECT_EQ(db().getUserVersion(), 10022);
    EXPECT_EQ(db().execScalar("PRAGMA user_version"), 10022);
}

TEST_F(DatabaseTest, ExecutesFormattedTextsAndCountsChanges) {
    EXPECT_EQ(db().execute("insert into Items (title) values (%Q), (%Q)", "it's", "b"), 2);
    EXPECT_EQ(db().execScalar("select count(*) from Items where title='%q'", "it's"), 1);
    EXPECT_EQ(db().lastInsertedRowID(), 2);
    const LogCapture log;
    EXPECT_EQ(assertionOf([] { db().execScalar("select 1 where 0"); }), "Cursor has no more rows");
}

TEST_F(DatabaseTest, DropsAnIndexThatMayNotBeThere) {
    items()->addIndex("Items_title", "title");
    EXPECT_EQ(db().execScalar("select count(*) from sqlite_master where name='Items_title'"), 1);
    db().dropIndex("Items_title");
    db().dropIndex("Items_title");
    EXPECT_EQ(db().execScalar("select count(*) from sqlite_master where name='Items_title'"), 0);
}

TEST_F(DatabaseTest, FindsTablesByNameInTheOrderOfFirstUse) {
    EXPECT_EQ(db().getRegisteredTable("Items"), items());
    EXPECT_EQ(db().getRegisteredTable("items"), nullptr);
}

TEST_F(DatabaseTest, TriesTransientErrorsThreeTimes) {
    const LogCapture log;
    const std::string attach = "attach '" + (directory / "no/such/folder") + "' as other";
    EXPECT_EQ(codeOf([&] { db().execute("%s", attach); }), 14);
    EXPECT_DOUBLE_EQ(clock.slept(), 0.4 + 0.9);
}

TEST_F(DatabaseTest, DoesNotTryOtherErrorsAgain) {
    const LogCapture log;
    EXPECT_EQ(codeOf([] { db().execute("nonsense"); }), 1);
    EXPECT_TRUE(log.contains("in \"nonsense\""));
    EXPECT_EQ(clock.slept(), 0);
}

TEST_F(DatabaseTest, WaitsForLocksOnTheClockAndNoLongerThanTheTimeOut) {
    const LogCapture log;
    const Locker locker(path, "begin exclusive");
    EXPECT_EQ(codeOf([] { db().execute("insert into Items (title) values ('a')"); }), 5);
    EXPECT_NEAR(clock.slept(), 25.0, 0.001);
}

TEST_F(DatabaseTest, ChecksResultCodes) {
    const LogCapture log;
    db().check(0);
    EXPECT_EQ(codeOf([] { db().check(1); }), 1);
}

TEST_F(DatabaseTest, LogsWhatItRunsInAndOutOfTransactions) {
    const LoggingOn on({&gLogSQL});
    LogCapture log;
    db().execute("update Items set number=1");
    EXPECT_TRUE(log.contains("[SQL] Exec update Items set number=1  -->0 [0.000 sec]"));
    db().beginTransaction(true);
    EXPECT_TRUE(log.contains("[SQL] >>>> BEGIN IMMEDIATE TRANSACTION"));
    EXPECT_TRUE(log.contains("[SQL] Exec ( begin immediate transaction  -->0 ) [0.000 sec]"));
    db().execute("update Items set number=2");
    EXPECT_TRUE(log.contains("[SQL] Exec ( update Items set number=2  -->0 ) [0.000 sec]"));
    clock.jumpTo(clock.now() + 1.5);
    db().endTransaction();
    EXPECT_TRUE(log.contains("[SQL] Exec commit  -->0 [0.000 sec]"));
    EXPECT_TRUE(log.contains("[SQL] <<<< END TRANSACTION (1.500 sec)"));
    db().beginTransaction(false);
    db().endTransaction();
    EXPECT_TRUE(log.contains("[SQL] >>>> BEGIN DEFERRED TRANSACTION"));
}

TEST_F(DatabaseTest, NumbersStatementsWhileTheyAreLogged) {
    db().compile("select 1");
    const LoggingOn on({&gLogSQL});
    LogCapture log;
    db().compile("select 2");
    db().compile("select 3");
    ASSERT_EQ(log.count("Prepare #"), 2);
    const std::string first = log.lines().at(0);
    EXPECT_TRUE(log.contains(": \"select 2\" --> 0x"));
    EXPECT_EQ(first.substr(0, 15), "[SQL] Prepare #");
}

TEST_F(DatabaseTest, CompilesOneStatementPerText) {
    const LogCapture log;
    EXPECT_EQ(assertionOf([] { db().compile(nullptr); }), "NULL SQL string");
    EXPECT_EQ(assertionOf([] { db().compile("-- nothing"); }), "Empty SQL statement");
    EXPECT_EQ(assertionOf([] { db().compile("select 1; select 2"); }),
              "Excess characters past end of SQL statement");
    EXPECT_EQ(codeOf([] { db().compile("selec 1"); }), 1);
    EXPECT_TRUE(log.contains("in \"selec 1\""));
}

TEST_F(DatabaseTest, AnnouncesThatItCloses) {
    const LoggingOn on({});
    LogCapture log;
    NotificationRecorder closing;
    NotificationCenter::getLocal()->addObserver(closing, Database::kDatabaseClosingNotification,
                                                &db());
    const Ref<Item> item = Item::make("a");
    item->addToTable(items());
    closing.also = [](Notification*) {
        EXPECT_EQ(db().execScalar("select count(*) from Items"), 0);
    };
    db().close(true);
    EXPECT_EQ(closing.notes, std::vector<std::string>{"com.tarnwick.orvane.DBClosing"});
    EXPECT_TRUE(log.contains("*** Closing database"));
    EXPECT_FALSE(db().isOpen());
    db().close(true);
    EXPECT_EQ(closing.notes.size(), 1U);
    NotificationCenter::getLocal()->removeObserver(closing);
    db().open(path.c_str(), true);
    EXPECT_EQ(count("title='a'"), 1);
}

TEST_F(DatabaseTest, StopsItsTimersWhenItCloses) {
    db().saveRowsSoon();
    db().execute("insert into Items (title) values ('a')");
    db().close(false);
    db().open(path.c_str(), true);
    clock.advanceBy(10);
    EXPECT_TRUE(platform.posts.empty());
}

namespace {

/// How many descriptors this process has for files of a folder.
std::ptrdiff_t openFilesIn(const std::string& folder) {
    using std::filesystem::directory_iterator;
    return std::count_if(directory_iterator("/proc/self/fd"), directory_iterator(),
                         [&](const auto& entry) {
                             std::error_code error;
                             const auto target = std::filesystem::read_symlink(entry, error);
                             return target.string().starts_with(folder);
                         });
}

}  // namespace

TEST_F(DatabaseTest, EndsWithItsConnectionAlsoIfItCannotSave) {
    LogCapture log;
    const Support::TempDir otherDirectory;
    const std::string otherPath = otherDirectory / "Other";
    {
        Database other;
        other.open(otherPath.c_str(), true);
        // As tables of the process do, it lives on.
        static auto* const table = new TableOf<Item>(&other, "Items", true, false);
        table->create(Item::kSchema, nullptr, nullptr);
        for (int i = 0; i < 2; ++i) {
            Item::make("same")->addToTable(table);
        }
        ASSERT_GT(openFilesIn(otherDirectory / ""), 0);
    }
    EXPECT_TRUE(log.contains("UNIQUE constraint failed: Items.title"));
    EXPECT_TRUE(log.contains("virtual SQLite::Database::~Database()"));
    EXPECT_EQ(openFilesIn(otherDirectory / ""), 0);
}

TEST_F(DatabaseTest, EndsStatementsThatOthersHoldWhenItCloses) {
    Query query(&db(), "select 1");
    query.statement();
    Cursor cursor(query);
    db().close(false);
    const LogCapture log;
    EXPECT_THROW(cursor.nextRow(), AssertionFailure);
    EXPECT_THROW(cursor.intColumn(0), AssertionFailure);
    // Nothing is left of the connection: the file may be deleted and made anew.
    std::filesystem::remove(path);
    db().open(path.c_str(), true);
    EXPECT_EQ(db().execScalar("select count(*) from sqlite_master"), 0);
}

TEST_F(DatabaseTest, PostsThatItWasReplaced) {
    const LoggingOn on({});
    LogCapture log;
    db().postReplacedNotification();
    ASSERT_EQ(platform.posts.size(), 1U);
    EXPECT_EQ(platform.posts[0].name, "com.tarnwick.orvane.DBReplaced");
    EXPECT_EQ(platform.posts[0].object, "Orvane Agent");
    EXPECT_EQ(platform.posts[0].info.get(), nullptr);
    EXPECT_TRUE(platform.posts[0].isUrgent);
    EXPECT_TRUE(log.contains("===== Database posting distributed 'Replaced' notification"));
}

#ifndef NDEBUG
TEST_F(DatabaseTest, NoticesUseOnAnotherThread) {
    const LogCapture log;
    const RowID rowID = saveItem("a");
    const Ref<Item> item = items()->rowWithID(rowID);
    Query query(&db(), "select 1");
    const std::function<void()> uses[] = {
        [] { db().db(); },
        [&] { query.statement(); },
        [&] { (void)items()->rowWithID(rowID); },
        [&] { item->setChanged(); },
        [&] { item->doLoad(); },
    };
    std::vector<std::string> messages;
    std::thread other([&] {
        for (const auto& use : uses) {
            messages.push_back(assertionOf(use));
        }
    });
    other.join();
    const std::string message = "Database used on another thread than the one that opened it";
    EXPECT_EQ(messages, std::vector<std::string>(std::size(uses), message));
}

TEST_F(DatabaseTest, NoticesAReadersCursorThatMeetsATurnOfTheRunLoop) {
    saveItem("a");
    reopen(false);
    LogCapture log;
    { const Cursor brief(&db(), "select * from Items"); }
    clock.advanceBy(0);
    EXPECT_FALSE(log.contains("Cursor lives across"));
    const Cursor cursor(&db(), "select * from Items");
    clock.advanceBy(0);
    EXPECT_TRUE(log.contains("Cursor lives across a turn of the run loop"));
}
#endif
