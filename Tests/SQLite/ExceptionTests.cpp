#include "SQLite/Exception.h"

#include "Support/LogCapture.h"

#include <gtest/gtest.h>
#include <sqlite3.h>

#include <new>
#include <string>

using SQLite::Exception;
using SQLite::SQLText;

namespace {

struct NameCase {
    int code;
    const char* name;
};

class ExceptionNames : public testing::TestWithParam<NameCase> {};

struct FatalCase {
    int code;
    bool isFatal;
};

class ExceptionFatality : public testing::TestWithParam<FatalCase> {};

}  // namespace

TEST_P(ExceptionNames, NamesTheCode) {
    EXPECT_STREQ(Exception::errorCodeAsString(GetParam().code), GetParam().name);
}

INSTANTIATE_TEST_SUITE_P(
    All, ExceptionNames,
    testing::Values(NameCase{0, "SQLITE_OK"}, NameCase{1, "SQLITE_ERROR"},
                    NameCase{2, "SQLITE_INTERNAL"}, NameCase{3, "SQLITE_PERM"},
                    NameCase{4, "SQLITE_ABORT"}, NameCase{5, "SQLITE_BUSY"},
                    NameCase{6, "SQLITE_LOCKED"}, NameCase{7, "SQLITE_NOMEM"},
                    NameCase{8, "SQLITE_READONLY"}, NameCase{9, "SQLITE_INTERRUPT"},
                    NameCase{10, "SQLITE_IOERR"}, NameCase{11, "SQLITE_CORRUPT"},
                    NameCase{12, "SQLITE_NOTFOUND"}, NameCase{13, "SQLITE_FULL"},
                    NameCase{14, "SQLITE_CANTOPEN"}, NameCase{15, "SQLITE_PROTOCOL"},
                    NameCase{16, "SQLITE_EMPTY"}, NameCase{17, "SQLITE_SCHEMA"},
                    NameCase{18, "SQLITE_TOOBIG"}, NameCase{19, "SQLITE_CONSTRAINT"},
                    NameCase{20, "SQLITE_MISMATCH"}, NameCase{21, "SQLITE_MISUSE"},
                    NameCase{22, "SQLITE_NOLFS"}, NameCase{23, "SQLITE_AUTH"},
                    NameCase{24, "SQLITE_FORMAT"}, NameCase{25, "SQLITE_RANGE"},
                    NameCase{26, "SQLITE_NOTADB"}, NameCase{100, "SQLITE_ROW"},
                    NameCase{101, "SQLITE_DONE"}, NameCase{266, "SQLITE_IOERR_READ"},
                    NameCase{522, "SQLITE_IOERR_SHORT_READ"}, NameCase{778, "SQLITE_IOERR_WRITE"},
                    NameCase{1034, "SQLITE_IOERR_FSYNC"}, NameCase{1290, "SQLITE_IOERR_DIR_FSYNC"},
                    NameCase{1546, "SQLITE_IOERR_TRUNCATE"}, NameCase{1802, "SQLITE_IOERR_FSTAT"},
                    NameCase{2058, "SQLITE_IOERR_UNLOCK"}, NameCase{2314, "SQLITE_IOERR_RDLOCK"},
                    // Without a name of its own: that of the low byte.
                    NameCase{3082, "SQLITE_IOERR"}, NameCase{787, "SQLITE_CONSTRAINT"},
                    NameCase{99, "Unknown error code"}, NameCase{-1, "Unknown error code"},
                    NameCase{256 + 99, "Unknown error code"}));

TEST_P(ExceptionFatality, FollowsTheLowByte) {
    const Support::LogCapture log;
    EXPECT_EQ(Exception(GetParam().code, "x").isFatal(), GetParam().isFatal);
}

INSTANTIATE_TEST_SUITE_P(All, ExceptionFatality,
                         testing::Values(FatalCase{3, true}, FatalCase{5, true},
                                         FatalCase{261, true}, FatalCase{11, true},
                                         FatalCase{26, true}, FatalCase{522, true},
                                         FatalCase{10, false}, FatalCase{266, false},
                                         FatalCase{778, false}, FatalCase{1, false},
                                         FatalCase{6, false}, FatalCase{13, false},
                                         FatalCase{14, false}, FatalCase{19, false}));

TEST(Exception, IsTransientForOneCodeAlone) {
    const Support::LogCapture log;
    EXPECT_TRUE(Exception(14, "x").isTransient());
    for (const int code : {0, 5, 6, 10, 14 + 256, 14 + 512}) {
        EXPECT_FALSE(Exception::isTransient(code)) << code;
    }
}

TEST(Exception, HasATextOfNameCodesMessageAndStatement) {
    const Support::LogCapture log;
    EXPECT_STREQ(Exception(1034, "disk I/O error", "select 1").what(),
                 "SQLITE_IOERR_FSYNC[10.4]: disk I/O error in \"select 1\"");
    EXPECT_STREQ(Exception(14, "Database file not found").what(),
                 "SQLITE_CANTOPEN[14.0]: Database file not found");
    EXPECT_STREQ(Exception(1, nullptr, nullptr).what(), "SQLITE_ERROR[1.0]:  in \"\"");
}

TEST(Exception, IsLoggedOnceWhenItIsMadeAndNotWhenItIsCopied) {
    const Support::LogCapture log;
    const Exception exception(5, "locked");
    const Exception copy(exception);
    EXPECT_EQ(log.count("SQL Error: "), 1);
    EXPECT_EQ(log.lines().at(0), "[WARNING] SQL Error: SQLITE_BUSY[5.0]: locked");
    EXPECT_STREQ(copy.what(), exception.what());
    EXPECT_NE(copy.what(), exception.what());
    EXPECT_EQ(copy.getCode(), 5);
}

TEST(Exception, IsTransientForOneCodeOnly) {
    EXPECT_TRUE(Exception::isTransient(14));
    EXPECT_FALSE(Exception::isTransient(270));
    EXPECT_FALSE(Exception::isTransient(5));
}

TEST(SQLText, FormatsAsSqliteDoes) {
    const std::string quoted = "it's";
    EXPECT_STREQ(SQLText::format("a %s %q %Q", "x", quoted, quoted).c_str(), "a x it''s 'it''s'");
    EXPECT_STREQ(SQLText::format("%Q %s.", static_cast<const char*>(nullptr),
                                 static_cast<const char*>(nullptr))
                     .c_str(),
                 "NULL .");
    EXPECT_STREQ(SQLText::format("%w", "a\"b").c_str(), "a\"\"b");
    EXPECT_STREQ(SQLText::format("%d %i %lld %03d", 1, -2L, 1LL << 40, 7).c_str(),
                 "1 -2 1099511627776 007");
    EXPECT_STREQ(SQLText::format("%.2f %g", 1.5, 0.25).c_str(), "1.50 0.25");
    EXPECT_STREQ(SQLText::format("100%% of %s%%", "it").c_str(), "100% of it%");
    EXPECT_STREQ(SQLText::format("").c_str(), "");
}

TEST(SQLText, ThrowsWithoutMemory) {
    const std::string large(1 << 20, 'x');
    const sqlite3_int64 before =
        sqlite3_hard_heap_limit64(sqlite3_memory_used() + static_cast<int>(large.size()) / 2);
    EXPECT_THROW(SQLText(std::string_view(large)), std::bad_alloc);
    EXPECT_THROW(SQLText::format("%s", large), std::bad_alloc);
    sqlite3_hard_heap_limit64(before);
    EXPECT_EQ(std::string_view(SQLText::format("%s", large).c_str()), large);
}

TEST(SQLText, TakesAWholeTextAsItStands) {
    EXPECT_STREQ(SQLText(std::string_view("like '%s'")).c_str(), "like '%s'");
    EXPECT_EQ(SQLText().c_str(), nullptr);
    const SQLText text(std::string_view("a"));
    EXPECT_STREQ(SQLText(text).c_str(), "a");
}
