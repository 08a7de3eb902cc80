#pragma once

#include "Foundation/AutoreleasePool.h"
#include "SQLite/Cursor.h"
#include "SQLite/Database.h"
#include "SQLite/Exception.h"
#include "SQLite/FakeCenter.h"
#include "SQLite/TestRows.h"
#include "Support/LogCapture.h"
#include "Support/ManualClock.h"
#include "Support/TempDir.h"

#include <gtest/gtest.h>

#include <memory>
#include <string>

/// Holds a lock on a file, while it lives, as another process would.
class Locker : Foundation::Uncopyable {
 public:
    /// `sql` takes the lock.
    Locker(const std::string& path, const char* sql);
    ~Locker();

 private:
    sqlite3* mDB = nullptr;
};

/// A test of the process's database on a file of its own, with the tables of `TestRows`, a clock
/// that stands still and a distributed centre that only keeps what is posted.
class StoreTest : public testing::Test {
 protected:
    StoreTest() {
        SQLite::Database::initialize();
        reopen(true);
        groups()->create(Group::kSchema, nullptr, nullptr);
        items()->create(Item::kSchema, nullptr, nullptr);
        notes()->create(Note::kSchema, nullptr, nullptr);
    }
    ~StoreTest() noexcept override { db().close(false); }

    static SQLite::Database& db() { return *SQLite::gDatabase; }
    static SQLite::TableOf<Group>* groups() { return SQLite::TableOf<Group>::instance(); }
    static SQLite::TableOf<Item>* items() { return SQLite::TableOf<Item>::instance(); }
    static SQLite::TableOf<Note>* notes() { return SQLite::TableOf<Note>::instance(); }
    /// Opens the file anew, and forgets what was posted.
    void reopen(bool writeable) {
        db().close(true);
        db().open(path.c_str(), writeable);
        // What survives a power cut is not looked at here, and waiting for the disk takes time.
        db().execute("PRAGMA synchronous = OFF");
        if (writeable) db().setPostsNotifications(true);
        platform.posts.clear();
    }
    /// Saves an item and lets go of it. Gives its ID.
    SQLite::RowID saveItem(const char* title) {
        const Foundation::AutoreleasePool inner;
        const Foundation::Ref<Item> item = Item::make(title);
        item->saveChanges();
        return item->getRowID();
    }
    static int count(const char* where) {
        return db().execScalar("select count(*) from Items where %s", where);
    }
    static Foundation::String* text(const char* utf8) { return Foundation::String::string(utf8); }
    /// The code of the `Exception` that `body` throws; 0 if it throws none.
    template <class Body>
    static int codeOf(Body&& body) {
        try {
            body();
        } catch (const SQLite::Exception& exception) {
            return exception.getCode();
        }
        return 0;
    }
    /// What the last commit announced, as the log has it.
    std::string lastChanges() const {
        if (platform.posts.empty()) return "";
        const Foundation::Ref<Foundation::String> changes =
            SQLite::describeChanges(platform.posts.back().info.get());
        return changes->utf8();
    }
    /// Another connection to the file, behind the store's back.
    void executeElsewhere(const char* sql) const;

    Foundation::AutoreleasePool pool;
    Support::TempDir directory;
    Support::ManualClock clock;
    FakeCenter platform;
    const std::string path = directory / "Database.sqlite3";
};
