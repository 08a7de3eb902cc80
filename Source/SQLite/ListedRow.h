#pragma once

#include "SQLite/ColumnList.h"
#include "SQLite/Row.h"

namespace SQLite {

/// A row whose class lists its columns, by which it is read and written.
class ListedRow : public Row {
 public:
    using Row::Row;

    void unload() override;
    /// Saves what the row points at, the row, and then what points at it.
    void saveChanges() override;
    bool loadFrom(const Cursor& cursor) override;
    RowID doInsert() override;
    void doUpdate() override;

    ColumnMask _changedColumns() const override;
    void _restoreColumns(ColumnMask changed) override;
    void _forgetLoaded() override;

 protected:
    /// The columns of the class: always the same list.
    virtual const ColumnList& columns() const = 0;
    /// The table that a free row is saved into.
    virtual Table* ownTable() const = 0;

 private:
    void clearChangedColumns();
};

}  // namespace SQLite
