#pragma once

#include <functional>

namespace Orvane {

/// The tables of the model in the database of the process.
class Schema {
 public:
    static constexpr int kMajorVersion = 1;
    static constexpr int kMinorVersion = 22;
    /// What the file's user version says.
    static constexpr int kVersion = kMajorVersion * 10000 + kMinorVersion;

    /// Makes a new database of an empty file that is open for writing, all of it or nothing. Throws
    /// `Exception`, and what `restore` throws: that is called once the tables are there, within the
    /// same transaction, and fills them from what else there is of an earlier database.
    static void createDatabase(const std::function<void()>& restore = nullptr);
    /// Makes the tables that are missing, with their indexes and triggers.
    static void createTables();
};

}  // namespace Orvane
