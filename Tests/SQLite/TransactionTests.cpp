#include "SQLite/Transaction.h"

#include "Foundation/Logger.h"
#include "SQLite/Exception.h"
#include "SQLite/StoreTest.h"

#include <sqlite3.h>

using namespace Foundation;
using namespace SQLite;
using Support::LogCapture;
using Support::LoggingOn;

namespace {

class TransactionTest : public StoreTest {
 protected:
    static void insert() { db().execute("insert into Items (number) values (1)"); }
    static int rows() { return count("1"); }
    /// Whether the open transaction has the right to write.
    bool holdsWriteLock() const {
        sqlite3* other = nullptr;
        sqlite3_open(path.c_str(), &other);
        const int result = sqlite3_exec(other, "begin immediate", nullptr, nullptr, nullptr);
        sqlite3_close(other);
        return result == SQLITE_BUSY;
    }
};

}  // namespace

TEST_F(TransactionTest, TheOutermostOneDecidesHowItBegins) {
    {
        const Transaction immediate(&db(), true);
        db().beginTransaction(false);
        EXPECT_TRUE(holdsWriteLock());
        db().endTransaction();
        EXPECT_TRUE(holdsWriteLock());
    }
    const Transaction deferred(false);
    const Transaction nested(true);
    EXPECT_FALSE(holdsWriteLock());
    EXPECT_EQ(db().getTransactionDepth(), 2);
}

TEST_F(TransactionTest, CommitsAtTheOutermostEnd) {
    {
        const Transaction outer(true);
        {
            const Transaction inner(true);
            insert();
        }
        EXPECT_TRUE(platform.posts.empty());
        EXPECT_TRUE(holdsWriteLock());
    }
    EXPECT_FALSE(holdsWriteLock());
    EXPECT_EQ(rows(), 1);
    EXPECT_EQ(platform.posts.size(), 1U);
}

TEST_F(TransactionTest, RollsBackWhenAnExceptionEndsIt) {
    LogCapture log;
    try {
        const Transaction outer(true);
        insert();
        const Transaction inner(true);
        insert();
        throw std::runtime_error("no");
    } catch (const std::runtime_error&) {
    }
    EXPECT_EQ(rows(), 0);
    EXPECT_FALSE(db().isInTransaction());
    EXPECT_TRUE(log.contains("[WARNING] <<<< ABORTED TRANSACTION"));
    clock.advanceBy(10);
    EXPECT_TRUE(platform.posts.empty());
}

TEST_F(TransactionTest, ANestedEndInsideACatchDoesNotRollBack) {
    const Transaction outer(true);
    try {
        const Transaction inner(true);
        insert();
        throw std::runtime_error("no");
    } catch (const std::runtime_error&) {
    }
    EXPECT_EQ(db().getTransactionDepth(), 1);
    EXPECT_EQ(rows(), 1);
}

TEST_F(TransactionTest, DoesNothingWithoutADatabase) {
    const Transaction none(nullptr, true);
    EXPECT_FALSE(db().isInTransaction());
}

TEST_F(TransactionTest, WarnsOfOneEndTooMany) {
    LogCapture log;
    db().endTransaction();
    EXPECT_EQ(log.lines(), std::vector<std::string>{"[WARNING] Too many calls to endTransaction"});
    EXPECT_EQ(db().getTransactionDepth(), 0);
}

TEST_F(TransactionTest, IsNotOpenAfterABeginThatFails) {
    const LogCapture log;
    sqlite3* other = nullptr;
    sqlite3_open(path.c_str(), &other);
    sqlite3_exec(other, "begin immediate", nullptr, nullptr, nullptr);
    EXPECT_THROW(Transaction(true), Exception);
    sqlite3_close(other);
    EXPECT_FALSE(db().isInTransaction());
    const Transaction again(true);
    EXPECT_EQ(db().getTransactionDepth(), 1);
}

TEST_F(TransactionTest, ACommitThatFailsLeavesNoTransactionAndThrows) {
    db().execute("PRAGMA foreign_keys = ON");
    db().execute(
        "create table child (p references parent(id) deferrable initially deferred);"
        "create table parent (id integer primary key)");
    clock.advanceBy(0);
    platform.posts.clear();
    const LogCapture log;
    EXPECT_THROW(
        {
            const Transaction transaction(true);
            insert();
            db().execute("insert into child values (7)");
        },
        Exception);
    EXPECT_FALSE(db().isInTransaction());
    EXPECT_FALSE(holdsWriteLock());
    EXPECT_EQ(rows(), 0);
    EXPECT_TRUE(platform.posts.empty());
    // What the commit would have announced is still pending.
    db()._postChangeNotification();
    ASSERT_EQ(platform.posts.size(), 1U);
    EXPECT_EQ(lastChanges(), "\n          Items:  +1\n          child:  +1");
}

TEST_F(TransactionTest, RefusesToWriteBehindATransactionThatSqliteEnded) {
    const LogCapture log;
    EXPECT_THROW(
        {
            const Transaction transaction(true);
            insert();
            // As an I/O error or a full disk does by itself.
            sqlite3_exec(db().db(), "rollback", nullptr, nullptr, nullptr);
            insert();
        },
        Exception);
    EXPECT_EQ(rows(), 0);
    insert();
    EXPECT_EQ(rows(), 1);
}
