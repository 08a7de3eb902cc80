#include "SQLite/Cursor.h"

#include "Foundation/Logger.h"
#include "SQLite/Exception.h"
#include "SQLite/Statement.h"
#include "SQLite/StoreTest.h"
#include "SQLite/Transaction.h"
#include "Support/AssertionOf.h"

#include <sqlite3.h>

using namespace Foundation;
using namespace SQLite;
using Support::assertionOf;
using Support::LogCapture;
using Support::LoggingOn;

namespace {

using CursorTest = StoreTest;
using QueryTest = StoreTest;

/// The value that a text binds as, with its type.
class BindTest : public StoreTest {
 protected:
    template <class Value>
    std::string bound(const Value& value) {
        query[1] = value;
        const Cursor cursor(query);
        return std::string(cursor.cStringColumn(0)) + " " + cursor.cStringColumn(1);
    }
    Query query{&db(), "select typeof(?1), quote(?1)"};
};

}  // namespace

TEST_F(CursorTest, WalksRowsAndRunsOut) {
    Query query(&db(), "select 1 as a union select 2 order by 1");
    Cursor cursor(query);
    ASSERT_TRUE(cursor.hasRow());
    EXPECT_EQ(cursor.intColumn(0), 1);
    EXPECT_TRUE(cursor.nextRow());
    EXPECT_EQ(cursor.int64Column("A"), 2);
    EXPECT_FALSE(cursor.nextRow());
    EXPECT_FALSE(cursor.hasRow());
}

TEST_F(CursorTest, OnNoRowsGivesTheStatementBackAtOnce) {
    Query query(&db(), "select 1 where 0");
    const LoggingOn on({&gLogSQL});
    LogCapture log;
    const Cursor cursor(query);
    EXPECT_FALSE(cursor.hasRow());
    query.statement();
    EXPECT_EQ(log.count("ompiling Query"), 1);
    EXPECT_EQ(assertionOf([&] { cursor.intColumn(0); }), "Cursor has no more rows");
    EXPECT_EQ(assertionOf([&] { cursor.columnCount(); }), "Cursor has no more rows");
    EXPECT_TRUE(log.contains("SQLite::Statement *SQLite::Cursor::statement() const"));
}

TEST_F(CursorTest, RefusesColumnsThatAreNotThere) {
    LogCapture log;
    const Cursor cursor(&db(), "select 1 as a");
    for (const int column : {-1, 1}) {
        EXPECT_EQ(assertionOf([&] { cursor.intColumn(column); }), "Invalid column index requested");
    }
    EXPECT_TRUE(log.contains("int SQLite::Statement::checkColumn(int) const"));
    EXPECT_EQ(cursor.columnIndex("b"), -1);
    EXPECT_EQ(cursor.columnIndex(nullptr), -1);
    EXPECT_EQ(cursor.columnIndex("A"), 0);
    EXPECT_EQ(cursor.column("b").getIndex(), -1);
}

TEST_F(CursorTest, ReadsEachKindOfValue) {
    Cursor cursor(&db(),
                  "select 5000000000, 1.5, 'text', 'http://example.org/', 42.0, x'0102', x'', "
                  "cast('Europe/Berlin' as blob), null");
    EXPECT_EQ(cursor.int64Column(0), 5000000000);
    EXPECT_EQ(cursor.doubleColumn(1), 1.5);
    EXPECT_STREQ(cursor.cStringColumn(2), "text");
    const Ref<String> string = cursor.stringColumn(2);
    EXPECT_EQ(string->utf8(), "text");
    const Ref<URL> url = cursor.urlColumn(3);
    EXPECT_EQ(url->text(), "http://example.org/");
    const Ref<Date> date = cursor.dateColumn(4);
    EXPECT_EQ(date->getAbsoluteTime(), 42.0);
    const Ref<Data> data = cursor.dataColumn(5);
    EXPECT_EQ(data->view(), std::string_view("\1\2", 2));
    EXPECT_EQ(Ref<Data>(cursor.dataColumn(6)).get(), nullptr);
    const Ref<TimeZone> zone = cursor.timeZoneColumn(7);
    EXPECT_EQ(zone->getName(), "Europe/Berlin");
    EXPECT_EQ(cursor.intColumn(8), 0);
    EXPECT_EQ(cursor.cStringColumn(8), nullptr);
    EXPECT_EQ(Ref<String>(cursor.stringColumn(8)).get(), nullptr);
    EXPECT_EQ(Ref<URL>(cursor.urlColumn(8)).get(), nullptr);
    EXPECT_EQ(Ref<Date>(cursor.dateColumn(8)).get(), nullptr);
    EXPECT_EQ(Ref<Data>(cursor.dataColumn(8)).get(), nullptr);
    EXPECT_EQ(Ref<TimeZone>(cursor.timeZoneColumn(8)).get(), nullptr);
}

TEST_F(CursorTest, ReadsARowOfAnotherTableByItsID) {
    const RowID rowID = saveItem("a");
    const Cursor cursor(&db(), "select rowID, 0 from Items");
    Ref<Item> item;
    EXPECT_FALSE(cursor.getObject(1, item));
    EXPECT_EQ(item.get(), nullptr);
    EXPECT_TRUE(cursor.getObject(0, item));
    EXPECT_EQ(item->getRowID(), rowID);
    EXPECT_FALSE(cursor.getObject(1, item));
    EXPECT_NE(item.get(), nullptr);
}

TEST_F(CursorTest, LogsItsSteps) {
    const LoggingOn on({&gLogSQL});
    LogCapture log;
    Cursor cursor(&db(), "select 1");
    cursor.nextRow();
    EXPECT_TRUE(log.contains("[SQL] Cursor 0x"));
    EXPECT_TRUE(log.contains(" \"select 1\" ..."));
    EXPECT_EQ(log.count("[SQL]   step 0x"), 1);
    EXPECT_EQ(log.count(" [1]"), 1);
    EXPECT_EQ(log.count("[SQL] ---end 0x"), 1);
}

TEST_F(CursorTest, ThrowsWhatAStepReports) {
    const LoggingOn on({&gLogSQL});
    LogCapture log;
    try {
        const Cursor cursor(&db(), "select abs(-9223372036854775808)");
        FAIL();
    } catch (const Exception& exception) {
        EXPECT_STREQ(exception.what(),
                     "SQLITE_ERROR[1.0]: integer overflow in "
                     "\"select abs(-9223372036854775808)\"");
    }
    EXPECT_EQ(log.count(" [1] -- ERROR 1"), 1);
    EXPECT_EQ(log.count("---end"), 1);
    EXPECT_EQ(assertionOf([] { const Cursor cursor(nullptr, false); }), "query");
}

TEST_F(CursorTest, EndsAStepThatFailsWithoutASecondReport) {
    // Both cursors have a statement of their own; the outer one's is left over.
    Query query(&db(), "select abs(a) from (select 1 as a union all select -9223372036854775808)");
    LogCapture log;
    Cursor outer(query);
    { const Cursor inner(query); }
    EXPECT_THROW(outer.nextRow(), Exception);
    EXPECT_FALSE(outer.hasRow());
    EXPECT_FALSE(log.contains("sqlite3_finalize"));
}

TEST_F(QueryTest, LogsAFailureOfFinalize) {
    LogCapture log;
    const auto statement = db().compile("select abs(-9223372036854775808)");
    EXPECT_EQ(statement->step(), SQLITE_ERROR);
    const std::string address = OVFormat("%p", statement->getAddress());
    statement->invalidate();
    EXPECT_EQ(log.lines(), std::vector<std::string>{"[WARNING] Error from sqlite3_finalize(" +
                                                    address + "): 1 / SQLITE_ERROR"});
    EXPECT_FALSE(statement->isCurrent());
    EXPECT_EQ(statement->columnIndex("a"), -1);
}

TEST_F(QueryTest, CompilesOnceForTwoCursorsInTurn) {
    Query query(&db(), "select 1 union select 2");
    const LoggingOn on({&gLogSQL});
    LogCapture log;
    { const Cursor first(query); }
    { const Cursor second(query); }
    EXPECT_EQ(log.count("Compiling Query["), 1);
    EXPECT_EQ(log.count("Recompiling"), 0);
}

TEST_F(QueryTest, CompilesTwiceForNestedCursorsAndDropsTheSurplus) {
    Query query(&db(), "select 1 union select 2");
    const LoggingOn on({&gLogSQL});
    LogCapture log;
    {
        Cursor outer(query);
        {
            Cursor inner(query);
            EXPECT_EQ(inner.intColumn(0), 1);
            inner.nextRow();
        }
        EXPECT_EQ(outer.intColumn(0), 1);
    }
    { const Cursor again(query); }
    EXPECT_EQ(log.count("Compiling Query["), 2);
}

TEST_F(QueryTest, RecompilesAfterAReopen) {
    Query query(&db(), "select 1");
    query.statement();
    reopen(true);
    const LoggingOn on({&gLogSQL});
    LogCapture log;
    const Cursor cursor(query);
    EXPECT_EQ(cursor.intColumn(0), 1);
    EXPECT_EQ(log.count("Recompiling Query["), 1);
}

TEST_F(QueryTest, SeesASchemaThatAnotherProcessHasAltered) {
    const RowID rowID = saveItem("a");
    reopen(false);
    Query query(items(), "select * from Items");
    int columns = 0;
    {
        const Cursor before(query);
        columns = before.columnCount();
        EXPECT_EQ(before.rowID(), rowID);
        EXPECT_EQ(before.columnIndex("extra"), -1);
    }
    executeElsewhere("alter table Items add column extra integer default 5");
    const LoggingOn on({&gLogSQL});
    LogCapture log;
    const Cursor after(query);
    EXPECT_EQ(after.columnCount(), columns + 1);
    EXPECT_EQ(after.int64Column("extra"), 5);
    EXPECT_EQ(log.count("Recompiled statement"), 1);
}

TEST_F(QueryTest, ExecuteGivesTheNewIDOfAnInsertAndTheCountOfOthers) {
    EXPECT_EQ(Query(&db(), "INSERT into Items (rowID) values (40)").execute(), 40);
    EXPECT_EQ(Query(&db(), "insert into Items (rowID) values (41)").execute(), 41);
    EXPECT_EQ(Query(&db(), "update Items set number=1").execute(), 2);
    EXPECT_EQ(Query(&db(), "delete from Items where rowID=40").execute(), 1);
}

TEST_F(QueryTest, ExecuteLogsAndThrows) {
    Query query(&db(), "insert into Items (title) values ('a')");
    const LoggingOn on({&gLogSQL});
    LogCapture log;
    query.execute();
    EXPECT_TRUE(log.contains(" insert into Items (title) values ('a') -->101 [0.000 sec]"));
    try {
        const Transaction transaction(true);
        query.execute();
        FAIL();
    } catch (const Exception& exception) {
        EXPECT_EQ(exception.getCode(), SQLITE_CONSTRAINT_UNIQUE);
    }
    EXPECT_TRUE(log.contains(" (insert into Items (title) values ('a') ) -->2067 [0.000 sec] "));
}

TEST_F(QueryTest, GivesRowsOfItsTable) {
    saveItem("b");
    saveItem("a");
    Query query(items(), "select * from Items order by title");
    const Ref<Row> first = query._firstRow();
    EXPECT_EQ(first->getRowID(), 2);
    const Ref<ArrayOf<Row>> all = query.allRows();
    ASSERT_EQ(all->count(), 2U);
    EXPECT_EQ(all->at(0), first.get());
    const LogCapture log;
    Query tableless(&db(), "select * from Items");
    EXPECT_EQ(assertionOf([&] { (void)tableless._firstRow(); }), "mTable");
    EXPECT_EQ(assertionOf([&] { (void)tableless.allRows(); }), "mTable");
    EXPECT_EQ(Ref<Row>(Query(&db(), "select 1 where 0")._firstRow()).get(), nullptr);
    EXPECT_EQ(assertionOf([&] { (void)Query(items(), "select title from Items")._firstRow(); }),
              "Cursor has no rowID column");
}

TEST_F(QueryTest, ForgetsItsTextWhenFinalized) {
    const LogCapture log;
    Query query(&db(), "select 1");
    query.statement();
    query.finalize();
    EXPECT_EQ(assertionOf([&] { query.statement(); }), "NULL SQL string");
}

TEST_F(BindTest, BindsEachKindOfValue) {
    EXPECT_EQ(bound("it's"), "text 'it''s'");
    EXPECT_EQ(bound(static_cast<const char*>(nullptr)), "null NULL");
    EXPECT_EQ(bound(nullptr), "null NULL");
    EXPECT_EQ(bound(text("ä")), "text 'ä'");
    EXPECT_EQ(bound(static_cast<String*>(nullptr)), "null NULL");
    EXPECT_EQ(bound(7), "integer 7");
    EXPECT_EQ(bound(-5000000000LL), "integer -5000000000");
    EXPECT_EQ(bound(5L), "integer 5");
    EXPECT_EQ(bound(0.5), "real 0.5");
    const Ref<Data> data = Data::data("\1\2", 2);
    EXPECT_EQ(bound(data.get()), "blob X'0102'");
    const Ref<Data> empty = Data::data("", 0);
    EXPECT_EQ(bound(empty.get()), "blob X''");
    EXPECT_EQ(bound(static_cast<Data*>(nullptr)), "null NULL");
    const Ref<Date> date = Date::date(12.5);
    EXPECT_EQ(bound(date.get()), "real 12.5");
    EXPECT_EQ(bound(static_cast<Date*>(nullptr)), "real 0.0");
    const Ref<URL> url = URL::url(text("http://a/b"));
    EXPECT_EQ(bound(url.get()), "text 'http://a/b'");
    EXPECT_EQ(bound(static_cast<URL*>(nullptr)), "null NULL");
    const Ref<TimeZone> zone = TimeZone::timeZone("GMT+01:00");
    EXPECT_EQ(bound(zone.get()).substr(0, 6), "blob X");
    EXPECT_EQ(bound(static_cast<TimeZone*>(nullptr)), "null NULL");
    const Ref<Item> item = Item::make("a");
    item->saveChanges();
    EXPECT_EQ(bound(static_cast<Row*>(item.get())), "integer 1");
    EXPECT_EQ(bound(static_cast<Row*>(nullptr)), "integer 0");
}

TEST_F(BindTest, BindsTextsOfAnyLength) {
    const std::string longText(1000, 'x');
    EXPECT_EQ(bound(text(longText.c_str())), "text '" + longText + "'");
}

TEST_F(BindTest, RefusesARowWithoutAnID) {
    const LogCapture log;
    const Ref<Item> item = Item::make("a");
    EXPECT_EQ(assertionOf([&] { query.bind(1, static_cast<Row*>(item.get())); }),
              "Can't bind query param to an unsaved row");
}

TEST_F(BindTest, ThrowsForParametersThatAreNotThere) {
    const LogCapture log;
    try {
        query.bind(2, 1);
        FAIL();
    } catch (const Exception& exception) {
        EXPECT_STREQ(exception.what(),
                     "SQLITE_RANGE[25.0]: Error binding param in "
                     "\"select typeof(?1), quote(?1)\"");
    }
    Query named(&db(), "select :id");
    named.parameterNamed(":id") = 4;
    EXPECT_EQ(Cursor(named).intColumn(0), 4);
    EXPECT_EQ(assertionOf([&] { (void)named.parameterNamed(":no"); }), "Unknown parameter name");
}

TEST_F(BindTest, KeepsATextByPointerUnlessItIsToCopy) {
    char value[] = "one";
    query.bind(1, value, false);
    value[0] = 'O';
    EXPECT_STREQ(Cursor(query).cStringColumn(1), "'One'");
    query.bind(1, value, true);
    value[0] = 'x';
    EXPECT_STREQ(Cursor(query).cStringColumn(1), "'One'");
}

TEST_F(BindTest, LogsWhatItBinds) {
    const Ref<Item> item = Item::make("a");
    item->saveChanges();
    const LoggingOn on({&gLogSQL});
    LogCapture log;
    query.bind(1, "x", true);
    query.bind(1, 7);
    query.bind(1, 8LL);
    query.bind(1, 1.25);
    query.bindNull(1);
    query.bind(1, static_cast<Row*>(item.get()));
    const Ref<Data> data = Data::data("abc", 3);
    query.bind(1, data.get());
    for (const char* end : {"[1] = 'x'", "[1] = 7", "[1] = 8", "[1] = 1.25", "[1] = null",
                            "[1] = row 1", "[1] = Data (3 bytes)"}) {
        EXPECT_EQ(log.count(end), 1) << end;
    }
    EXPECT_EQ(log.count("\tBIND 0x"), 7);
}
