#pragma once

#include "Foundation/Uncopyable.h"

namespace SQLite {

class Database;

/// A transaction for as long as it lives. Where an exception ends it, the outermost one is rolled
/// back; otherwise the outermost one commits, which may throw.
class Transaction : Foundation::Uncopyable {
 public:
    /// On `database`, which may be null: then there is none. `immediate` takes the right to write
    /// at once; it counts for the outermost transaction only.
    Transaction(Database* database, bool immediate);
    /// On the database of the process.
    explicit Transaction(bool immediate);
    ~Transaction() noexcept(false);

 private:
    Database* mDatabase;
};

}  // namespace SQLite
