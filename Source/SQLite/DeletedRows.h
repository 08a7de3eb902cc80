#pragma once

#include "SQLite/Types.h"

#include <utility>
#include <vector>

namespace SQLite {

class Table;

/// Which rows a transaction has deleted, until it ends. A commit that fails leaves the changes to
/// be announced although they are undone: meanwhile this knows which rows are not gone after all.
class DeletedRows {
 public:
    /// The open transaction has deleted a row.
    void note(const Table* table, RowID rowID);
    /// It is over.
    void endTransaction() { mDeleted.clear(); }
    /// Its commit has failed: what it has deleted is there again, and is still to be announced as
    /// deleted.
    void failCommit();

    /// Whether a delete that is still to be announced was undone.
    bool isUndone(const Table* table, RowID rowID) const;
    /// A row of the table of that name is gone, whatever became of earlier deletes.
    void forgetUndone(const char* tableName, RowID rowID);
    /// The changes are announced, or will never be.
    void forgetAllUndone() { mUndone.clear(); }

 private:
    using Rows = std::vector<std::pair<const Table*, RowID>>;

    Rows mDeleted;
    Rows mUndone;
};

}  // namespace SQLite
