// What a connection that only reads may do.

#include "SQLite/StoreTest.h"

#include <string>

using Support::LogCapture;

namespace {

using DatabaseReaderTest = StoreTest;

struct DeniedCase {
    const char* sql;
    int action;
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
    EXPECT_TRUE(
        log.contains("[WARNING] Database: Illegal operation on read-only database "
                     "(action=" +
                     std::to_string(GetParam().action) + ", p1='"));
}

INSTANTIATE_TEST_SUITE_P(
    All, DatabaseAuthorizer,
    testing::Values(DeniedCase{"delete from t where a=1", 9},
                    DeniedCase{"insert into t values (1)", 18}, DeniedCase{"update t set a=1", 23},
                    DeniedCase{"alter table t add column b", 26}, DeniedCase{"reindex i", 27},
                    DeniedCase{"create table v (a)", 2}, DeniedCase{"create index j on t (a)", 1},
                    DeniedCase{"drop index i", 10}, DeniedCase{"drop trigger g", 16},
                    DeniedCase{"drop table t", 11},
                    DeniedCase{"create trigger h after insert on t begin select 1; end", 7}));

TEST_F(DatabaseReaderTest, LetsAReaderMakeTemporaryObjects) {
    reopen(false);
    db().execute("create temporary view v as select 1 as a");
    EXPECT_EQ(db().execScalar("select a from v"), 1);
    EXPECT_EQ(db().execScalar("select count(*) from Items"), 0);
}

TEST_F(DatabaseReaderTest, LetsAReaderCreateAView) {
    reopen(false);
    db().execute("create view v as select 7 as a");
    EXPECT_EQ(db().execScalar("select a from v"), 7);
}

TEST_F(DatabaseReaderTest, DoesNotLetAReaderWriteTheSchemaByHand) {
    reopen(false);
    const LogCapture log;
    db().execute("PRAGMA writable_schema = 1");
    EXPECT_NE(codeOf([] { db().execute("delete from sqlite_master"); }), 0);
}
