#pragma once

#include "EndToEnd/LifeModel.h"

#include <filesystem>
#include <map>
#include <set>
#include <string>
#include <vector>

struct sqlite3;

/// What the agent has on disk, read by nothing of its own, and compared with a model. Every
/// difference fails the test.
class LifeStore {
 public:
    /// `folder`: that of the storage. Opens the database, to be read only.
    explicit LifeStore(std::filesystem::path folder);
    ~LifeStore();
    LifeStore(const LifeStore&) = delete;
    LifeStore& operator=(const LifeStore&) = delete;

    void compare(const LifeModel& model);

 private:
    /// Rows of texts; "" for null.
    using Row = std::vector<std::string>;

    std::vector<Row> rows(const std::string& query) const;
    std::string value(const std::string& query) const;
    std::string contentOf(const std::string& file) const;

    void compareClients(const LifeModel& model) const;
    void compareFeed(const ModelFeed& feed, const Row& row) const;
    void compareSubscriptions(const ModelFeed& feed, const std::string& rowID) const;
    void compareEntries(const ModelFeed& feed, const std::string& rowID) const;
    void compareEntry(const ModelEntry& entry, const Row& row) const;
    void compareFiles(const ModelFeed& feed) const;
    void compareRest(const LifeModel& model) const;
    void comparePropertyList(const LifeModel& model) const;

    const std::filesystem::path mFolder;
    sqlite3* mDatabase = nullptr;
};
