#pragma once

#include "Foundation/RefCounted.h"
#include "Foundation/Returner.h"
#include "SQLite/Types.h"

namespace SQLite {

class Column;
class Cursor;
class Table;

/// One row of a table. While it lives, its table hands out no other object for it.
///
/// A new row is free until it is added to a table, and has no ID until it is saved. A row of the
/// file may exist with its ID alone; its columns are then read when the first of them is asked for.
/// Changes stay in memory until they are saved; a changed row is kept alive by its table.
class Row : public Foundation::RefCounted {
 public:
    /// A new row. The table may be null.
    explicit Row(Table* table);
    /// The row of that ID, not read yet. Throws `AssertionFailure` for a null table and an ID below
    /// 1.
    Row(Table* table, RowID rowID);
    /// Warns if changes are lost.
    ~Row() override;

    std::size_t getPFHashCode() const override;
    /// Rows with IDs are equal by table and ID, others only to themselves.
    bool isEqual(const Foundation::RefCounted* other) const override;
    /// "Class[Table #id] address"
    Foundation::StringReturner toString() const override;

    /// Forgets what was read, and changes too: the next access reads the row anew. The row is then
    /// not to be saved, and its table gives up a reference that it had for that.
    virtual void unload();
    /// Writes the row, if it is changed. Throws `Exception`, and `AssertionFailure` for a changed
    /// row in no table. May give up the last reference to the row.
    virtual void saveChanges();
    /// Takes the row out of file and table; it is a free object then. Throws `Exception` if it may
    /// not be changed.
    virtual void deleteRow();
    /// Reads what a column needs: the whole row.
    virtual void loadColumn(const Column* column) const;
    /// Takes over what a cursor that stands on the row has of its columns. Whether the row then
    /// counts as read. Overriders call it first.
    virtual bool loadFrom(const Cursor& cursor);
    /// Writes a new row and gives its ID.
    virtual RowID doInsert() = 0;
    virtual void doUpdate() = 0;

    /// Puts a free row into a table, as a changed one. Throws `AssertionFailure` for a row of
    /// another table, `Exception` if the table may not be changed.
    void addToTable(Table* table);
    /// Marks the row as changed. Throws `Exception` if it may not be.
    void setChanged();
    /// Tells whether the table's map has the row and owns a reference to it. Giving that up can
    /// end the row.
    void setCached(bool cached, bool retained);
    bool isChangeable() const;
    /// Throws `Exception` with the code 23 unless the row may be changed.
    void requireChangeable() const;
    /// Reads the row from the file. Throws `AssertionFailure` if it is not there.
    void doLoad() const;
    /// Reads the row from a cursor that stands on it.
    void doLoad(const Cursor& cursor) const;

    RowID getRowID() const { return mRowID; }
    Table* getTable() const { return mTable; }
    bool isChanged() const { return mChanged; }
    bool isLoaded() const { return mLoaded; }
    bool isCached() const { return mCached; }
    bool isRetained() const { return mRetained; }

    // For the journal.

    /// The changed columns; none where a class lists none.
    virtual ColumnMask _changedColumns() const { return 0; }
    /// Marks them as changed again.
    virtual void _restoreColumns(ColumnMask) {}
    /// Forgets what was read, but no changes.
    virtual void _forgetLoaded();
    /// Whether the row's ID was given in the transaction that is open.
    bool _isProvisional() const { return mProvisional; }
    void _setProvisional(bool provisional) { mProvisional = provisional; }

 protected:
    void setLoaded(bool loaded) { mLoaded = loaded; }

 private:
    friend class Table;

    void warnOfDealloc();

    Table* mTable;
    RowID mRowID;
    bool mChanged : 1;
    mutable bool mLoaded : 1;
    bool mCached : 1;
    bool mRetained : 1;
    bool mNew : 1;  ///< in the table's list of new rows
    bool mProvisional : 1;
};

}  // namespace SQLite
