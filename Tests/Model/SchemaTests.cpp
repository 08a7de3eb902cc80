#include "Model/Schema.h"

#include "Foundation/Date.h"
#include "Model/DeclaredColumns.h"
#include "Model/ModelTest.h"
#include "SQLite/Exception.h"

#include <gmock/gmock.h>

#include <stdexcept>

using namespace Foundation;
using namespace Orvane;
using namespace SQLite;
using testing::UnorderedElementsAre;

namespace {

class SchemaTest : public ModelTest {
 protected:
    /// The first column of a query's rows.
    static std::vector<std::string> texts(const char* sql) {
        std::vector<std::string> result;
        for (Cursor cursor(&db(), "%s", sql); cursor.hasRow(); cursor.nextRow()) {
            result.emplace_back(cursor.cStringColumn(0));
        }
        return result;
    }
    static std::string sqlOf(const char* name) {
        const Cursor cursor(&db(), "select sql from sqlite_master where name='%q'", name);
        return cursor.hasRow() ? cursor.cStringColumn(0) : "";
    }
    static void setNewest(double date) {
        db().execute("update Feeds set localDateCreatedOfNewestEntry=%f where rowID=1", date);
    }
    static double newest(int feed = 1) {
        const Cursor cursor(&db(), "select localDateCreatedOfNewestEntry from Feeds where rowID=%d",
                            feed);
        return cursor.doubleColumn(0);
    }
    static bool isNewestNull() {
        return db().execScalar(
                   "select localDateCreatedOfNewestEntry is null from Feeds where rowID=1") == 1;
    }
    static void makeFeeds() {
        db().execute("insert into Feeds (rowID, url) values (1, 'http://a/'), (2, 'http://b/')");
    }
    static void makeEntry(int feed, double date) {
        db().execute("insert into Entries (feed, localDateCreated) values (%d, %f)", feed, date);
    }
};

/// A column as `PRAGMA table_info` tells it.
struct Info {
    std::string name, type, defaultValue;
    bool isNotNull, isPrimaryKey;
    bool operator==(const Info&) const = default;
};
void PrintTo(const Info& info, std::ostream* out) {
    *out << info.name << ' ' << info.type << ' ' << info.isNotNull << info.isPrimaryKey << ' '
         << info.defaultValue;
}

std::vector<Info> infoOf(const char* table) {
    std::vector<Info> result;
    // sqlite3 tells the standard types in capitals, however they were written.
    for (Cursor cursor(gDatabase,
                       "select name, lower(type), dflt_value, [notnull], pk "
                       "from pragma_table_info('%q') order by cid",
                       table);
         cursor.hasRow(); cursor.nextRow()) {
        const char* value = cursor.cStringColumn(2);
        result.push_back({cursor.cStringColumn(0), cursor.cStringColumn(1), value ? value : "",
                          cursor.intColumn(3) != 0, cursor.intColumn(4) != 0});
    }
    return result;
}

/// What sqlite3 tells of a column that is declared so.
Info infoOf(const DeclaredColumn& declared) {
    const std::string text = declared.declaration;
    const std::string type = text.substr(0, text.find(' '));
    const std::size_t value = text.find(" default ");
    return {declared.name, type, value == std::string::npos ? "" : text.substr(value + 9),
            text.find("not null") != std::string::npos, false};
}

template <class T>
class SchemaOfTest : public ModelTest {};
using RowClasses = testing::Types<ClientCore, SubscriptionCore, FeedCore, EntryCore, EnclosureCore,
                                  AuthorCore, ContentCore>;
TYPED_TEST_SUITE(SchemaOfTest, RowClasses);

}  // namespace

TYPED_TEST(SchemaOfTest, HasExactlyTheDeclaredColumns) {
    std::vector<Info> expected = {{"rowID", "integer", "", true, true}};
    for (const DeclaredColumn& declared : Declared<TypeParam>::columns()) {
        expected.push_back(infoOf(declared));
    }
    EXPECT_EQ(infoOf(TypeParam::kTableName), expected);
}

TYPED_TEST(SchemaOfTest, DeclaresEachColumnWordForWord) {
    std::string expected = std::string("CREATE TABLE ") + TypeParam::kTableName +
                           " (rowID integer not null unique primary key";
    for (const DeclaredColumn& declared : Declared<TypeParam>::columns()) {
        expected += std::string(", ") + declared.name + " " + declared.declaration;
    }
    const Cursor cursor(gDatabase, "select sql from sqlite_master where type='table' and name='%s'",
                        TypeParam::kTableName);
    EXPECT_EQ(cursor.cStringColumn(0), expected + ")");
}

TEST_F(SchemaTest, MakesADatabaseOfVersion10022) {
    EXPECT_EQ(Schema::kVersion, 10022);
    EXPECT_EQ(db().getUserVersion(), 10022);
}

TEST_F(SchemaTest, MakesTheSevenTablesInOrder) {
    EXPECT_EQ(texts("select name from sqlite_master where type='table' order by rowid"),
              (std::vector<std::string>{"Clients", "Subscriptions", "Feeds", "Entries",
                                        "Enclosures", "Authors", "Contents"}));
}

TEST_F(SchemaTest, KeepsTheModeOfAutoVacuumInTheWriteAheadLog) {
    reopen(true);
    EXPECT_EQ(db().execScalar("PRAGMA auto_vacuum"), 2);
    EXPECT_EQ(texts("PRAGMA journal_mode"), std::vector<std::string>{"wal"});
}

TEST_F(SchemaTest, MakesTheIndexes) {
    EXPECT_THAT(texts("select sql from sqlite_master where type='index' and sql is not null"),
                UnorderedElementsAre(
                    "CREATE INDEX Clients_signature ON Clients(signature)",
                    "CREATE INDEX Subscriptions_feedandclient ON Subscriptions(feed, client)",
                    "CREATE INDEX Subscriptions_nonbackground ON "
                    "Subscriptions(client, refreshesInBackground, refreshInterval)",
                    "CREATE INDEX Feeds_identifier ON Feeds(identifier)",
                    "CREATE INDEX Feeds_url ON Feeds(url)",
                    "CREATE INDEX Feeds_localDateUpdated ON Feeds(localDateUpdated)",
                    "CREATE INDEX Entries_identifier ON Entries(identifier)",
                    "CREATE INDEX Entries_unreadcount ON Entries(feed, read, localDateCreated)",
                    "CREATE INDEX Entries_tosync ON Entries(localDateFlagsUpdated)",
                    "CREATE INDEX Enclosures_entry ON Enclosures(entry)",
                    "CREATE INDEX Enclosures_autodownloads ON "
                    "Enclosures(downloadState, downloadAuditStatus)"));
}

TEST_F(SchemaTest, MakesTheTriggers) {
    const std::string body =
        "BEGIN UPDATE Feeds SET localDateCreatedOfNewestEntry = "
        "MAX(localDateCreatedOfNewestEntry, NEW.localDateCreated) WHERE rowID = NEW.feed; END";
    const std::string name = "Entries_update_feeds_localdatecreatedofnewestentryinfeed_after_";
    EXPECT_EQ(count("sqlite_master where type='trigger'"), 2);
    EXPECT_EQ(
        sqlOf((name + "update").c_str()),
        "CREATE TRIGGER " + name + "update AFTER UPDATE OF localDateCreated ON Entries " + body);
    EXPECT_EQ(sqlOf((name + "insert").c_str()),
              "CREATE TRIGGER " + name + "insert AFTER INSERT ON Entries " + body);
}

TEST_F(SchemaTest, ANewEntryMovesItsFeedsNewestDateOn) {
    makeFeeds();
    setNewest(100);
    makeEntry(1, 200);
    EXPECT_EQ(newest(), 200);
    makeEntry(1, 150);
    EXPECT_EQ(newest(), 200);
}

TEST_F(SchemaTest, AChangedDateOfAnEntryMovesItsFeedsNewestDateOn) {
    makeFeeds();
    setNewest(100);
    makeEntry(1, 50);
    db().execute("update Entries set localDateCreated=300");
    EXPECT_EQ(newest(), 300);
    db().execute("update Entries set localDateCreated=10");
    EXPECT_EQ(newest(), 300);
}

TEST_F(SchemaTest, OtherChangesOfAnEntryLeaveTheNewestDate) {
    makeFeeds();
    makeEntry(1, 200);
    setNewest(100);
    db().execute("update Entries set read=1, localDateUpdated=400");
    EXPECT_EQ(newest(), 100);
}

TEST_F(SchemaTest, AnEntryMovesNoOtherFeedsDate) {
    makeFeeds();
    setNewest(100);
    db().execute("update Feeds set localDateCreatedOfNewestEntry=5 where rowID=2");
    makeEntry(1, 200);
    EXPECT_EQ(newest(2), 5);
}

TEST_F(SchemaTest, AFeedWithoutANewestDateStaysWithoutOne) {
    makeFeeds();
    makeEntry(1, 200);
    EXPECT_TRUE(isNewestNull());
}

TEST_F(SchemaTest, AnEntryWithoutADateTakesTheNewestDateAway) {
    makeFeeds();
    setNewest(100);
    db().execute("insert into Entries (feed) values (1)");
    EXPECT_TRUE(isNewestNull());
}

TEST_F(SchemaTest, DoesNotEnforceReferences) {
    db().execute("insert into Subscriptions (client, feed) values (77, 88)");
    EXPECT_EQ(count("Subscriptions"), 1);
}

TEST_F(SchemaTest, LeavesTablesThatAreThere) {
    db().execute("insert into Authors (name) values ('A')");
    db().execute("drop table Contents");
    Schema::createTables();
    EXPECT_EQ(count("Authors"), 1);
    EXPECT_EQ(count("Contents"), 0);
}

using SchemaOfEmptyFileTest = EmptyFileTest;

TEST_F(SchemaOfEmptyFileTest, IsMadeWholeOrNotAtAll) {
    const Support::LogCapture quiet;
    db().execute("create view Contents as select 1");
    EXPECT_THROW(Schema::createDatabase(), SQLite::Exception);
    EXPECT_EQ(db().getUserVersion(), 0);
    EXPECT_EQ(count("sqlite_master"), 1);
    db().execute("drop view Contents");
    Schema::createDatabase();
    EXPECT_EQ(db().getUserVersion(), 10022);
    EXPECT_EQ(count("Contents"), 0);
}

TEST_F(SchemaOfEmptyFileTest, IsFilledInTheTransactionThatMakesIt) {
    Schema::createDatabase([] {
        EXPECT_EQ(db().getTransactionDepth(), 1);
        EXPECT_EQ(db().getUserVersion(), 10022);
        db().execute("insert into Authors (name) values ('A')");
    });
    EXPECT_FALSE(db().isInTransaction());
    EXPECT_EQ(count("Authors"), 1);
    EXPECT_EQ(db().execScalar("PRAGMA auto_vacuum"), 2);
}

TEST_F(SchemaOfEmptyFileTest, IsNotMadeIfItCannotBeFilled) {
    const Support::LogCapture quiet;
    const auto restore = [] {
        db().execute("insert into Authors (name) values ('A')");
        throw std::runtime_error("no such luck");
    };
    EXPECT_THROW(Schema::createDatabase(restore), std::runtime_error);
    EXPECT_FALSE(db().isInTransaction());
    EXPECT_EQ(db().getUserVersion(), 0);
    EXPECT_EQ(count("sqlite_master"), 0);
}
