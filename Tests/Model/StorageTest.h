#pragma once

#include "Foundation/Logger.h"
#include "Foundation/PropertyList.h"
#include "Foundation/URL.h"
#include "Model/MinistryOfTruth.h"
#include "Model/Schema.h"
#include "SQLite/Cursor.h"
#include "SQLite/Database.h"
#include "SQLite/FakeCenter.h"
#include "Support/LogCapture.h"
#include "Support/ManualClock.h"
#include "Support/TempDir.h"
#include "Utilities/FileSystem.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <memory>
#include <string>
#include <vector>

/// A test with a storage of its own, in which there is nothing yet. What is logged is kept.
class StorageTest : public testing::Test {
 protected:
    StorageTest() {
        SQLite::Database::initialize();
        useStorage(base.path().string());
    }
    ~StorageTest() noexcept override {
        if (db().isOpen()) clock.advanceBy(Orvane::MinistryOfTruth::kSaveDelaySeconds);
        db().close(false);
        Compatibility::FileSystem::setStorageBaseURL(nullptr);
    }

    static SQLite::Database& db() { return *SQLite::gDatabase; }
    static Orvane::MinistryOfTruth& ministry() { return *Orvane::MinistryOfTruth::instance(); }
    static void useStorage(const std::string& path) {
        const Foundation::AutoreleasePool inner;
        Foundation::Ref<Foundation::URL> url{
            Foundation::URL::urlWithFileSystemPath(path.c_str(), true)};
        Compatibility::FileSystem::setStorageBaseURL(url);
    }
    /// Makes a new database that is in no file.
    void makeInMemory() {
        std::filesystem::create_directories(storage());
        db().open(static_cast<const char*>(nullptr), true);
        Orvane::Schema::createDatabase();
        log.clear();
    }
    static int count(const char* from) { return db().execScalar("select count(*) from %s", from); }
    /// All columns of a query's rows, as texts with "|" between them.
    static std::vector<std::string> rows(const char* sql) {
        std::vector<std::string> result;
        for (SQLite::Cursor cursor(&db(), "%s", sql); cursor.hasRow(); cursor.nextRow()) {
            std::string line;
            for (int i = 0; i < cursor.columnCount(); ++i) {
                const char* text = cursor.cStringColumn(i);
                line += (i ? "|" : "") + std::string(text ? text : "null");
            }
            result.push_back(line);
        }
        return result;
    }

    std::filesystem::path storage() const { return base.path() / "Orvane"; }
    /// Makes a file in the storage, with the directories above it.
    void writeFile(const std::string& name, const std::string& content) const {
        std::filesystem::create_directories((storage() / name).parent_path());
        base.writeFile("Orvane/" + name, content);
    }
    std::string readFile(const std::string& name) const { return base.readFile("Orvane/" + name); }
    bool has(const std::string& name) const { return std::filesystem::exists(storage() / name); }
    /// Lives as long as the test.
    Foundation::URL* urlOf(const std::string& name, bool isDirectory = false) const {
        return Foundation::URL::urlWithFileSystemPath((storage() / name).c_str(), isDirectory);
    }

    Foundation::AutoreleasePool pool;
    Support::TempDir base;
    Support::ManualClock clock;
    FakeCenter platform;
    Support::LogCapture log;
};
