#pragma once

#include "SQLite/RowJournal.h"
#include "SQLite/ScalarColumn.h"

namespace SQLite {

/// A column that points at a row of another table by its ID, 0 for none. While that row has no ID,
/// it points at the object; a column that retains owns a reference to it meanwhile.
class BasicToOneColumn : public ScalarColumn<long long> {
 public:
    explicit BasicToOneColumn(Row* row) : ScalarColumn(row) {}
    ~BasicToOneColumn();

    /// Whether it points at a row.
    explicit operator bool() const;
    /// Points at a row, or at none for null.
    void setValue(Row* row, bool retain);
    /// The ID of the row, 0 for one without an ID.
    RowID getRowID() const { return ScalarColumn::getValue(); }
    /// Gives the row that it points at an ID, by saving it into that table. For the owner's save.
    void saveChanges(Table* destination);
    /// The owner is saved.
    void clearChanged();
    /// As any column; what it points at in memory is a change too.
    void unload() {
        if (mUnsavedRow) dropUnsavedRow();
        Column::unload();
    }

    void bindTo(Query& query, int index) const;

    // For the journal.

    void _forgetLink() { mLink = nullptr; }
    void _restoreLink(const RowJournal::Link& link);

 protected:
    void unlink();
    void dropUnsavedRow();
    void point(Row* pending, bool retain);
    void noteLink(Row& row, bool retains);

    Row* mUnsavedRow = nullptr;
    bool mRetainsRow = false;  ///< whether mUnsavedRow holds a reference
    RowJournal::Link* mLink = nullptr;
};

}  // namespace SQLite
