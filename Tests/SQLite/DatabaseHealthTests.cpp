#include "Foundation/NotificationRecorder.h"
#include "Foundation/Number.h"
#include "SQLite/Database.h"
#include "SQLite/Exception.h"
#include "SQLite/StoreTest.h"

#include <fcntl.h>
#include <unistd.h>

using namespace Foundation;
using namespace SQLite;
using Support::LogCapture;
using Support::LoggingOn;

namespace {

using DatabaseTest = StoreTest;

}  // namespace

TEST_F(DatabaseTest, ChecksTheFile) {
    const LoggingOn on({});
    LogCapture log;
    db().integrityCheck();
    EXPECT_TRUE(log.contains("*** Performing integrity_check on database"));
    EXPECT_TRUE(log.contains("*** Passed integrity_check on database"));
}

TEST_F(DatabaseTest, ReportsABrokenFileAsFatal) {
    db().execute("create table t (a); create index i on t (a); insert into t values (1), (2)");
    const int root = db().execScalar("select rootpage from sqlite_master where name='i'");
    const int size = db().execScalar("PRAGMA page_size");
    db().close(false);
    {
        // An empty index: its rows are missing.
        const int file = ::open(path.c_str(), O_RDWR);
        const char header[] = {
            10, 0, 0, 0, 0, static_cast<char>(size >> 8), static_cast<char>(size & 0xFF), 0};
        ASSERT_EQ(pwrite(file, header, sizeof header, static_cast<off_t>(root - 1) * size), 8);
        ::close(file);
    }
    db().open(path.c_str(), true);
    const LoggingOn on({});
    LogCapture log;
    NotificationRecorder fatal;
    NotificationCenter::getLocal()->addObserver(fatal, Database::kDatabaseFatalErrorNotification,
                                                &db());
    EXPECT_EQ(codeOf([] { db().integrityCheck(); }), 11);
    EXPECT_TRUE(log.contains("[WARNING] *** SQLite integrity check failed! Details:"));
    EXPECT_TRUE(log.contains("[WARNING]     row 1 missing from index i"));
    EXPECT_TRUE(
        log.contains("*** SQLite integrity check failed -- exception "
                     "SQLITE_CORRUPT[11.0]: integrity check failed"));
    EXPECT_TRUE(fatal.notes.empty());
    clock.advanceBy(0);
    EXPECT_EQ(fatal.notes.size(), 1U);
    NotificationCenter::getLocal()->removeObserver(fatal);
}

TEST_F(DatabaseTest, AnnouncesAFatalErrorOncePerBurst) {
    const LogCapture log;
    NotificationRecorder fatal;
    NotificationCenter::getLocal()->addObserver(fatal, Database::kDatabaseFatalErrorNotification,
                                                &db());
    EXPECT_EQ(codeOf([] { db()._throwQueryException(Exception(19, "not fatal")); }), 19);
    clock.advanceBy(0);
    EXPECT_TRUE(fatal.notes.empty());
    EXPECT_EQ(codeOf([] { db()._throwQueryException(Exception(11, "first")); }), 11);
    EXPECT_EQ(codeOf([] { db()._throwQueryException(Exception(26, "second")); }), 26);
    clock.advanceBy(0);
    ASSERT_EQ(fatal.notes.size(), 1U);
    EXPECT_EQ(Number::getInteger(fatal.lastInfo->getAs<Number>("error")), 11);
    EXPECT_EQ(fatal.lastInfo->getAs<String>("message")->utf8(), "SQLITE_CORRUPT[11.0]: first");
    EXPECT_EQ(codeOf([] { db()._throwQueryException(Exception(5, "third")); }), 5);
    clock.advanceBy(0);
    EXPECT_EQ(fatal.notes.size(), 2U);
    NotificationCenter::getLocal()->removeObserver(fatal);
}

TEST_F(DatabaseTest, VacuumsOnlyWhatIsMoreThan256FreePages) {
    Database fresh;
    fresh.open((directory / "fresh").c_str(), true);
    // In this order: the mode of auto_vacuum fixes the size of a page.
    fresh.execute("PRAGMA page_size = 1024");
    fresh.execute("PRAGMA auto_vacuum = INCREMENTAL");
    fresh.execute("create table t (a); create table u (a)");
    // A page for each row of u, so that the number of free pages can be chosen.
    fresh.execute(
        "with n(i) as (select 1 union all select i+1 from n where i<400) "
        "insert into u select zeroblob(900) from n");
    const auto freePages = [&](int pages) {
        for (int i = 0; i < 400 && fresh.execScalar("PRAGMA freelist_count") < pages; ++i) {
            fresh.execute("delete from u where rowid=(select max(rowid) from u)");
        }
    };
    freePages(256);
    ASSERT_EQ(fresh.execScalar("PRAGMA freelist_count"), 256);
    fresh.vacuumIncrementally();
    EXPECT_EQ(fresh.execScalar("PRAGMA freelist_count"), 256);
    freePages(257);
    const LoggingOn on({});
    LogCapture log;
    fresh.vacuumIncrementally();
    EXPECT_EQ(fresh.execScalar("PRAGMA freelist_count"), 0);
    EXPECT_TRUE(log.contains("Incremental vacuum reclaimed 257 free pages in 0ms."));
}
