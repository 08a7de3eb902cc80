#pragma once

#include "Foundation/Logger.h"
#include "Model/OldSchema.h"
#include "Model/OlderDatabase.h"
#include "Model/StorageTest.h"

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <string>
#include <vector>

/// Keeps how it is asked. It is the port of the process while it lives.
class FakeOlderDatabase : public Orvane::OlderDatabase {
 public:
    FakeOlderDatabase() { setCurrent(this); }
    ~FakeOlderDatabase() override { setCurrent(nullptr); }
    void checkIn(bool createdNew) override {
        // It may write.
        EXPECT_TRUE(SQLite::gDatabase->isOpen());
        calls.push_back(createdNew);
    }

    std::vector<bool> calls;
};

/// A test of how the database is opened, with a trash of its own.
class DatabaseLifeTest : public StorageTest {
 protected:
    using Strings = std::vector<std::string>;

    DatabaseLifeTest() { std::filesystem::remove_all(mTrash); }
    ~DatabaseLifeTest() override { std::filesystem::remove_all(mTrash); }

    /// Opens the database as the agent does when it starts.
    static void start() { ministry().openDatabase(); }
    /// Makes a file of an old version.
    void makeOld(int version) {
        openPlainFile();
        OldSchema::make(version);
        endOfFile();
    }
    /// Makes a file with a table and a version.
    void makeOther(int version) {
        openPlainFile();
        db().execute("create table Other (name text)");
        db().setUserVersion(version);
        endOfFile();
    }
    /// Makes a database that is up to date, with a client and its settings.
    void makeCurrent() {
        openPlainFile();
        Orvane::Schema::createDatabase();
        db().execute("insert into Clients values (3, 'com.example.reader', 0, 700000000)");
        db().execute("insert into Subscriptions (rowID, client) values (7, 3)");
        endOfFile();
    }
    void restart() {
        db().close(true);
        log.clear();
        platform.posts.clear();
        start();
    }
    /// The names in the trash.
    Strings trash() const {
        Strings result;
        if (!std::filesystem::exists(mTrash / "files")) return result;
        for (const auto& entry : std::filesystem::directory_iterator(mTrash / "files")) {
            result.push_back(entry.path().filename());
        }
        std::sort(result.begin(), result.end());
        return result;
    }
    /// Column 0 of the first row of what is in the trash.
    std::string valueInTrash(const char* sql) const {
        SQLite::Database other;
        other.open((mTrash / "files/Database/Database.sqlite3").c_str(), false);
        const SQLite::Cursor cursor(&other, "%s", sql);
        return cursor.cStringColumn(0);
    }
    void breakTrash() const { std::ofstream(mTrash).put('x'); }
    Strings postNames() const {
        Strings result;
        for (const auto& post : platform.posts) {
            result.push_back(post.name);
        }
        return result;
    }
    void expectNewDatabase() const {
        EXPECT_EQ(db().getUserVersion(), 10022);
        EXPECT_EQ(count("sqlite_master where type='table'"), 7);
        EXPECT_EQ(db().execScalar("PRAGMA auto_vacuum"), 2);
        EXPECT_EQ(rows("PRAGMA journal_mode"), Strings{"wal"});
    }

    /// A file of two clients, two feeds and two subscriptions.
    static constexpr const char* kPlist = R"(<plist version="1.0"><dict>
<key>Clients</key><dict>
  <key>30</key><dict><key>Signature</key><string>com.example.b</string>
    <key>DateUsed</key><date>2023-03-08T20:26:40Z</date></dict>
  <key>4</key><dict><key>Signature</key><string>com.example.a</string>
    <key>Private</key><true/></dict>
</dict>
<key>Feeds</key><dict>
  <key>17</key><dict><key>URL</key><string>http://example.com/%C3%A4</string>
    <key>Login</key><string>anna</string></dict>
  <key>5</key><dict><key>URL</key><string>http://example.com/</string></dict>
</dict>
<key>Subscriptions</key><dict>
  <key>100</key><dict><key>Client</key><integer>30</integer></dict>
  <key>8</key><dict><key>Client</key><integer>4</integer><key>Feed</key><integer>17</integer>
    <key>RefreshInterval</key><real>-1</real><key>ExpirationInterval</key><integer>86400</integer>
    <key>RefreshesInBackground</key><true/><key>DownloadsEnclosures</key><true/>
    <key>MaxEnclosureSize</key><real>1000000</real>
    <key>EnclosureTypes</key><string>audio/mpeg&#9;video/mp4</string></dict>
</dict></dict></plist>)";

    Support::LoggingOn logging{{&Orvane::gLogAgent, &Orvane::gLogAgentVerbose, &SQLite::gLogTruth}};
    FakeOlderDatabase older;

 private:
    void openPlainFile() {
        std::filesystem::create_directories(storage() / "Database");
        db().open((storage() / "Database/Database.sqlite3").c_str(), true);
    }
    void endOfFile() {
        db().close(true);
        log.clear();
    }

    const std::filesystem::path mTrash =
        std::filesystem::path(std::getenv("XDG_DATA_HOME")) / "Trash";
};
