#include "EndToEnd/LifeStore.h"

#include <gtest/gtest.h>
#include <sqlite3.h>

#include <algorithm>
#include <cmath>
#include <fstream>
#include <iterator>
#include <memory>
#include <stdexcept>
#include <utility>

namespace fs = std::filesystem;

namespace {

/// Dates are stored as doubles, and are sums.
constexpr double kTolerance = 1e-3;

std::string number(int value) {
    return std::to_string(value);
}

/// A date that is not set is 0.
void expectDate(const std::string& text, const std::optional<double>& date, const char* what) {
    const double stored = text.empty() ? 0 : std::stod(text);
    EXPECT_NEAR(stored, date.value_or(0), kTolerance) << what;
}

}  // namespace

LifeStore::LifeStore(fs::path folder) : mFolder(std::move(folder)) {
    const std::string path = mFolder / "Database/Database.sqlite3";
    const int result = sqlite3_open_v2(path.c_str(), &mDatabase, SQLITE_OPEN_READONLY, nullptr);
    if (result != SQLITE_OK) throw std::runtime_error("cannot open " + path);
    sqlite3_busy_timeout(mDatabase, 25000);
}

LifeStore::~LifeStore() {
    sqlite3_close(mDatabase);
}

std::vector<LifeStore::Row> LifeStore::rows(const std::string& query) const {
    sqlite3_stmt* statement = nullptr;
    if (sqlite3_prepare_v2(mDatabase, query.c_str(), -1, &statement, nullptr) != SQLITE_OK) {
        throw std::runtime_error(query + ": " + sqlite3_errmsg(mDatabase));
    }
    const std::unique_ptr<sqlite3_stmt, int (*)(sqlite3_stmt*)> owned(statement, sqlite3_finalize);
    std::vector<Row> result;
    while (sqlite3_step(statement) == SQLITE_ROW) {
        Row& row = result.emplace_back();
        for (int i = 0; i < sqlite3_column_count(statement); ++i) {
            const void* bytes = sqlite3_column_blob(statement, i);
            const int length = sqlite3_column_bytes(statement, i);
            row.emplace_back(static_cast<const char*>(bytes), static_cast<std::size_t>(length));
        }
    }
    return result;
}

std::string LifeStore::value(const std::string& query) const {
    return rows(query).at(0).at(0);
}

std::string LifeStore::contentOf(const std::string& file) const {
    std::ifstream stream(mFolder / file, std::ios::binary);
    EXPECT_TRUE(stream.is_open()) << file;
    return {std::istreambuf_iterator<char>(stream), std::istreambuf_iterator<char>()};
}

void LifeStore::compare(const LifeModel& model) {
    EXPECT_EQ(value("pragma integrity_check"), "ok");
    EXPECT_EQ(value("pragma user_version"), "10022");
    compareClients(model);
    std::set<std::string> found;
    for (const Row& row :
         rows("select rowID, url, identifier, title, ifnull(redirectedUrl, ''), "
              "ifnull(refreshEtag, ''), ifnull(refreshHttpDate, ''), refreshLocalDate, "
              "ifnull(lastErrorDomain, 0), ifnull(lastErrorCode, 0), dateUpdated, "
              "localDateCreatedOfNewestEntry from Feeds")) {
        SCOPED_TRACE(row[1]);
        const auto feed = model.feeds().find(row[1]);
        if (feed == model.feeds().end()) {
            ADD_FAILURE() << "nobody subscribes to it";
            continue;
        }
        found.insert(row[1]);
        compareFeed(*feed->second, row);
        compareSubscriptions(*feed->second, row[0]);
        compareEntries(*feed->second, row[0]);
        compareFiles(*feed->second);
    }
    EXPECT_EQ(found.size(), model.feeds().size());
    compareRest(model);
    comparePropertyList(model);
}

void LifeStore::compareClients(const LifeModel& model) const {
    std::map<std::string, Row> stored;
    for (const Row& row : rows("select c.signature, s.refreshInterval, s.expirationInterval "
                               "from Clients c, Subscriptions s where s.client=c.rowID and "
                               "ifnull(s.feed, 0)=0")) {
        stored[row[0]] = row;
    }
    EXPECT_EQ(stored.size(), model.clients().size());
    for (const auto& [name, client] : model.clients()) {
        ASSERT_TRUE(stored.contains(name)) << name;
        EXPECT_EQ(std::stod(stored[name][1]), client.refresh) << name;
        EXPECT_EQ(std::stod(stored[name][2]), client.expiration) << name;
    }
}

void LifeStore::compareFeed(const ModelFeed& feed, const Row& row) const {
    EXPECT_EQ(row[2], feed.identifier);
    EXPECT_EQ(row[3], feed.title);
    EXPECT_EQ(row[4], feed.redirected.value_or(""));
    EXPECT_EQ(row[5], feed.eTag);
    EXPECT_EQ(row[6], feed.lastModified);
    expectDate(row[7], feed.refreshed == 0 ? std::nullopt : std::optional(feed.refreshed),
               "refreshed");
    EXPECT_EQ(row[8], std::to_string(feed.error.domain));
    EXPECT_EQ(row[9], number(feed.error.code));
    std::optional<double> said;
    if (feed.date) said = std::floor(*feed.date);
    expectDate(row[10], said, "the feed's own date");
}

void LifeStore::compareSubscriptions(const ModelFeed& feed, const std::string& rowID) const {
    const std::vector<Row> stored = rows(
        "select c.signature, s.refreshInterval, s.expirationInterval, s.expirationDate, "
        "s.unreadCount from Clients c, Subscriptions s where s.client=c.rowID and s.feed=" +
        rowID);
    EXPECT_EQ(stored.size(), feed.subscriptions.size());
    for (const Row& row : stored) {
        const auto found = feed.subscriptions.find(row[0]);
        ASSERT_NE(found, feed.subscriptions.end()) << row[0];
        EXPECT_EQ(std::stod(row[1]), found->second.refresh);
        EXPECT_EQ(std::stod(row[2]), found->second.expiration);
        expectDate(row[3], found->second.expirationDate, "expiration");
        EXPECT_EQ(row[4].empty() ? "0" : row[4], number(found->second.unread)) << row[0];
    }
}

void LifeStore::compareEntries(const ModelFeed& feed, const std::string& rowID) const {
    std::size_t known = 0;
    for (const Row& row :
         rows("select e.identifier, e.title, e.alternateUrl, c.data, c.mimeType, e.current, "
              "e.read, e.flagged, e.localDateCreated, x.data, "
              "(select group_concat(url || ' ' || length || ' ' || mimeType) from Enclosures "
              "where entry=e.rowID) from Entries e left join Contents c on c.rowID=e.content "
              "left join Contents x on x.rowID=e.xmlRepresentation where e.feed=" +
              rowID)) {
        SCOPED_TRACE(row[1]);
        const auto found = feed.entries.find(row[0]);
        if (found == feed.entries.end()) {
            ADD_FAILURE() << "should not be there";
            continue;
        }
        ++known;
        compareEntry(found->second, row);
        if (!found->second.current) {
            EXPECT_EQ(contentOf("Feeds/" + feed.identifier + "/" + row[0] + ".xml"), row[9]);
        }
    }
    EXPECT_EQ(known, feed.entries.size());
}

void LifeStore::compareEntry(const ModelEntry& entry, const Row& row) const {
    const Post& post = entry.post;
    EXPECT_EQ(row[1], post.title);
    EXPECT_EQ(row[2], post.link);
    EXPECT_EQ(row[3], entry.content);
    EXPECT_EQ(row[4], entry.contentType);
    EXPECT_EQ(row[5], number(entry.current)) << "current";
    EXPECT_EQ(row[6], number(entry.read)) << "read";
    EXPECT_EQ(row[7], number(entry.flagged)) << "flagged";
    expectDate(row[8], entry.created, "first seen");
    EXPECT_NE(row[9].find(post.link), std::string::npos) << row[9];
    EXPECT_NE(row[9].find("version " + number(post.version)), std::string::npos) << row[9];
    const std::string enclosure =
        post.enclosure.empty()
            ? ""
            : post.enclosure + " " + number(post.enclosureLength) + " audio/mpeg";
    EXPECT_EQ(row[10], enclosure);
}

void LifeStore::compareFiles(const ModelFeed& feed) const {
    const std::string name = "Feeds/" + feed.identifier;
    if (feed.document) {
        EXPECT_TRUE(contentOf(name + ".xml") == feed.document->bytes) << "another document";
    } else {
        EXPECT_FALSE(fs::exists(mFolder / (name + ".xml")));
    }
    std::set<std::string> expected, found;
    for (const auto& [identifier, entry] : feed.entries) {
        if (!entry.current) expected.insert(identifier + ".xml");
    }
    if (fs::exists(mFolder / name)) {
        for (const fs::directory_entry& file : fs::directory_iterator(mFolder / name))
            found.insert(file.path().filename());
    }
    EXPECT_EQ(found, expected);
}

/// That there is nothing else.
void LifeStore::compareRest(const LifeModel& model) const {
    std::size_t entries = 0, enclosures = 0;
    std::set<std::string> expected;
    for (const auto& [url, feed] : model.feeds()) {
        entries += feed->entries.size();
        for (const auto& [identifier, entry] : feed->entries) {
            enclosures += entry.post.enclosure.empty() ? 0 : 1;
            if (!entry.current) expected.insert(feed->identifier);
        }
        if (feed->document) expected.insert(feed->identifier + ".xml");
    }
    EXPECT_EQ(value("select count(*) from Entries"), std::to_string(entries));
    EXPECT_EQ(value("select count(*) from Enclosures"), std::to_string(enclosures));
    EXPECT_EQ(value("select count(*) from Contents"), std::to_string(2 * entries));
    for (const fs::directory_entry& file : fs::directory_iterator(mFolder / "Feeds")) {
        const std::string name = file.path().filename();
        // Folders stay when the last of their files goes.
        const bool isEmptyFolder = file.is_directory() && fs::is_empty(file.path());
        EXPECT_TRUE(expected.contains(name) || isEmptyFolder || name.starts_with(".")) << name;
    }
}

void LifeStore::comparePropertyList(const LifeModel& model) const {
    const std::string text = contentOf("Clients.plist");
    std::size_t subscriptions = model.clients().size();
    for (const auto& [url, feed] : model.feeds()) {
        EXPECT_NE(text.find("<string>" + url + "</string>"), std::string::npos) << url;
        subscriptions += feed->subscriptions.size();
    }
    for (const auto& [name, client] : model.clients()) {
        EXPECT_NE(text.find("<string>" + name + "</string>"), std::string::npos) << name;
    }
    const auto countOf = [&](const std::string& key) {
        std::size_t count = 0;
        for (std::size_t at = 0;
             (at = text.find("<key>" + key + "</key>", at)) != std::string::npos; ++at)
            ++count;
        return count;
    };
    EXPECT_EQ(countOf("URL"), model.feeds().size());
    EXPECT_EQ(countOf("Signature"), model.clients().size());
    EXPECT_EQ(countOf("Client"), subscriptions);
}
