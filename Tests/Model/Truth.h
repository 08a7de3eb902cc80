#pragma once

#include "Model/LineFeeding.h"
#include "Model/StorageTest.h"

#include <string>
#include <vector>

/// A storage with a database of feeds, a client that subscribes to them, and all the files that the
/// database can be made anew from.
class TruthTest : public StorageTest {
 protected:
    static constexpr int kCurrentEntries = 3;  ///< of each feed
    static constexpr int kOldEntries = 2;
    static constexpr const char* kEntries =
        "select e.identifier, e.id, e.title, f.url, f.rowID, (select group_concat(url) from "
        "Enclosures where entry=e.rowID) from Entries as e, Feeds as f where e.feed=f.rowID "
        "order by e.identifier";

    /// Makes all of it and closes the database. Gives the rows of `kEntries`.
    std::vector<std::string> makeTruth(int feeds) {
        ministry().openDatabase();
        db().execute("insert into Clients values (3, 'com.example.reader', 0, 700000000)");
        for (int i = 1; i <= feeds; ++i) {
            const Foundation::AutoreleasePool inner;
            makeFeed(i * 10);
        }
        ministry().saveSubscriptions();
        const std::vector<std::string> entries = rows(kEntries);
        db().close(true);
        log.clear();
        return entries;
    }
    /// Breaks the database, which is closed.
    void breakDatabase() const {
        std::filesystem::remove_all(storage() / "Database");
        writeFile("Database/Database.sqlite3", std::string(20000, 'x'));
    }
    static Orvane::FeedCore* feed(int id) {
        return SQLite::TableOf<Orvane::FeedCore>::instance()->rowWithID(id);
    }
    /// What asks for a feed's entries does: reads the old ones too, if they wait to be read.
    static void askForEntries(int feeds) {
        for (int i = 1; i <= feeds; ++i) {
            const Foundation::AutoreleasePool inner;
            feed(i * 10)->getEntries(nullptr);
        }
    }

    LineFeeding feeding;

 private:
    void makeFeed(int id) const {
        db().execute("insert into Feeds (rowID, url) values (%d, 'http://example.com/%d')", id, id);
        db().execute(
            "insert into Subscriptions (rowID, client, feed, refreshInterval, unreadCount) values "
            "(%d, 3, %d, 300, 5)",
            id + 1, id);
        const std::string identifier = feed(id)->getIdentifier()->utf8();
        std::string document = "feed Number " + std::to_string(id) + "\n";
        for (int i = 0; i < kCurrentEntries; ++i) {
            document += line(id, i) + "\n";
        }
        writeFile("Feeds/" + identifier + ".xml", document);
        LineFeeding::merge(*feed(id), document);
        for (int i = 0; i < kOldEntries; ++i) {
            LineFeeding::merge(*feed(id), line(id, 100 + i));
        }
        const std::string old =
            "select id, identifier from Entries where length(id) > 1 and feed=" +
            std::to_string(id);
        for (const std::string& entry : rows(old.c_str())) {
            const std::size_t bar = entry.find('|');
            const std::string text = line(id, std::stoi(entry.substr(0, bar)));
            writeFile("Feeds/" + identifier + "/" + entry.substr(bar + 1) + ".xml", text);
        }
    }
    static std::string line(int feed, int number) {
        const std::string name = std::to_string(number);
        const std::string title = " Entry " + name + " of " + std::to_string(feed);
        return number % 2 ? "entry " + name + title
                          : "enclosing " + name + " http://e/" + name + title;
    }
};
