// What a connection that only reads may do.

#include "SQLite/StoreTest.h"

#include <string>

using Support::LogCapture;

namespace {

using DatabaseReaderTest = StoreTest;

struct DeniedCase {
    const char* sql;
    /// What the log says of it.
    const char* text;
};
class DatabaseAuthorizer : public StoreTest, public testing::WithParamInterface<DeniedCase> {};

}  // namespace

TEST_P(DatabaseAuthorizer, DeniesChangesToAReader) {
    db().execute("create table t (a); create index i on t (a); create table u (a)");
    db().execute("create trigger g after insert on u begin select 1; end");
    reopen(false);
    // A reader that has not read the schema yet is told that it changed.
    ASSERT_EQ(count("1"), 0);
    LogCapture log;
    EXPECT_EQ(codeOf([] { db().execute("%s", GetParam().sql); }), 23);
    EXPECT_EQ(log.lines().at(0),
              std::string("[WARNING] Database: Illegal operation on read-only database ") +
                  GetParam().text);
}

INSTANTIATE_TEST_SUITE_P(
    All, DatabaseAuthorizer,
    testing::Values(DeniedCase{"delete from t where a=1", "(action=9, p1='t', p2='(null)')"},
                    DeniedCase{"insert into t values (1)", "(action=18, p1='t', p2='(null)')"},
                    DeniedCase{"update t set a=1", "(action=23, p1='t', p2='a')"},
                    DeniedCase{"alter table t add column b", "(action=26, p1='main', p2='t')"},
                    DeniedCase{"reindex i", "(action=27, p1='i', p2='(null)')"},
                    DeniedCase{"create table v (a)", "(action=2, p1='v', p2='(null)')"},
                    DeniedCase{"create index j on t (a)", "(action=1, p1='j', p2='t')"},
                    DeniedCase{"drop index i", "(action=10, p1='i', p2='t')"},
                    DeniedCase{"drop trigger g", "(action=16, p1='g', p2='u')"},
                    DeniedCase{"drop table t", "(action=11, p1='t', p2='(null)')"},
                    DeniedCase{"create trigger h after insert on t begin select 1; end",
                               "(action=7, p1='h', p2='t')"}));

TEST_F(DatabaseReaderTest, LetsAReaderMakeTemporaryObjects) {
    reopen(false);
    db().execute("create temporary view v as select 1 as a");
    EXPECT_EQ(db().execScalar("select a from v"), 1);
    db().execute("create temporary table t (a)");
    EXPECT_EQ(db().execScalar("select count(*) from t"), 0);
    db().execute("drop view v; drop table t");
    EXPECT_EQ(db().execScalar("select count(*) from sqlite_temp_master"), 0);
    EXPECT_EQ(db().execScalar("select count(*) from Items"), 0);
}

TEST_F(DatabaseReaderTest, LetsAReaderCreateAndDropAView) {
    reopen(false);
    db().execute("create view v as select 7 as a");
    EXPECT_EQ(db().execScalar("select a from v"), 7);
    db().execute("drop view v");
    EXPECT_EQ(db().execScalar("select count(*) from sqlite_master where name='v'"), 0);
    // That a drop was allowed allows nothing else.
    const LogCapture log;
    db().execute("create view Seen as select 1");
    EXPECT_EQ(codeOf([] { db().execute("drop view Seen; delete from Items where 1"); }), 23);
}

TEST_F(DatabaseReaderTest, DoesNotLetAReaderWriteTheSchemaByHand) {
    reopen(false);
    const LogCapture log;
    db().execute("PRAGMA writable_schema = 1");
    EXPECT_NE(codeOf([] { db().execute("delete from sqlite_master"); }), 0);
}
