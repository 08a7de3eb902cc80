#pragma once

#include "Foundation/AutoreleasePool.h"
#include "Model/Schema.h"
#include "SQLite/Cursor.h"
#include "SQLite/Database.h"
#include "SQLite/FakeCenter.h"
#include "SQLite/TableOf.h"
#include "Support/LogCapture.h"
#include "Support/ManualClock.h"
#include "Support/TempDir.h"

#include <gtest/gtest.h>

#include <string>

/// A test of the process's database on a file of its own, which is open and empty.
class EmptyFileTest : public testing::Test {
 protected:
    EmptyFileTest() {
        SQLite::Database::initialize();
        reopen(true);
    }
    ~EmptyFileTest() noexcept override { db().close(false); }

    static SQLite::Database& db() { return *SQLite::gDatabase; }
    void reopen(bool writeable) {
        db().close(true);
        db().open(path.c_str(), writeable);
    }
    static int count(const char* from) { return db().execScalar("select count(*) from %s", from); }

    Foundation::AutoreleasePool pool;
    Support::TempDir directory;
    Support::ManualClock clock;
    FakeCenter platform;
    const std::string path = directory / "Database.sqlite3";
};

/// The same with the tables of the model.
class ModelTest : public EmptyFileTest {
 protected:
    ModelTest() {
        doNotWaitForDisk();
        Orvane::Schema::createDatabase();
        doNotWaitForDisk();
    }

 private:
    // What survives a power cut is not looked at here.
    static void doNotWaitForDisk() { db().execute("PRAGMA synchronous = OFF"); }
};
