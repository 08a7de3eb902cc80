#pragma once

namespace Orvane {

/// The tables of the model in the database of the process.
class Schema {
 public:
    static constexpr int kMajorVersion = 1;
    static constexpr int kMinorVersion = 22;
    /// What the file's user version says.
    static constexpr int kVersion = kMajorVersion * 10000 + kMinorVersion;

    /// Makes a new database of an empty file that is open for writing, all of it or nothing. Throws
    /// `Exception`.
    static void createDatabase();
    /// Makes the tables that are missing, with their indexes and triggers.
    static void createTables();
};

}  // namespace Orvane
