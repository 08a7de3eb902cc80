#pragma once

namespace Orvane {

/// What has become different from version to version of the schema, as one ordered list. The files
/// of users have been through it, so what stands in the list never changes; a new version gets a
/// step at its end.
///
/// A migrated database is not quite like a new one: it has columns and an index that nothing reads
/// any more, triggers of other names, and some columns are declared otherwise.
struct Migrations {
    /// The minor version of the oldest schema that there is a way from.
    static constexpr int kOldestMinorVersion = 5;

    /// Brings the database of the process from a minor version, which is at least the oldest, to
    /// that of `Schema`. Each step and its version number are one transaction, so that one that is
    /// cut short is taken up again from there. Throws `SQLite::Exception`.
    static void run(int fromMinorVersion);
};

}  // namespace Orvane
