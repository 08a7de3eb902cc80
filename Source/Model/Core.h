#pragma once

#include "SQLite/ListedRow.h"
#include "SQLite/Table.h"

class OVObject;

namespace Orvane {

/// A row of the model. At most one public object stands for it at a time: that holds a reference
/// to the row, and the row only points back.
class Core : public SQLite::ListedRow {
 public:
    explicit Core(SQLite::Table* table) : ListedRow(table) {}
    Core(SQLite::Table* table, SQLite::RowID rowID) : ListedRow(table, rowID) {}
    /// Warns if the public object is still there.
    ~Core() override;

    /// The agent has read the row as it started.
    virtual void preloaded() {}
    /// Makes the public object, which the current pool keeps; null if that cannot be.
    virtual OVObject* createOVObject() = 0;
    /// A client is about to change a column, by its position behind "rowID". Refuses by throwing.
    virtual void ipcWillChangeColumn(int) {}
    /// A client has changed it.
    virtual void ipcDidChangeColumn(int) {}

    /// The row of a table of the model, which the current pool keeps. Throws `NetException` with
    /// `OVInvalidRowIDError` if there is none of that ID, `AssertionFailure` for an ID below 1.
    static Core* _getRow(SQLite::Table* table, SQLite::RowID rowID);
    /// Whether the file has the row. What a table hands out says nothing of that, as a row is read
    /// only when it is used. Throws `SQLite::Exception`.
    static bool _isInFile(SQLite::Table* table, SQLite::RowID rowID);

    /// Takes a new row out of its table, behind a failure of what was to save it: it would be saved
    /// with whatever is saved next, and could make all of that fail. Does nothing for null and for
    /// a row that is in the file.
    static void giveUpNewRow(Core* row);

    /// The public object of a row, made on first use; null for null. Throws `AssertionFailure` if
    /// it cannot be made. The result is not the caller's own.
    static OVObject* getOVObject(Core* core);
    /// The one that there is, or null.
    OVObject* getExistingOVObject() const { return mOVObject; }
    /// For the public object: stands for the row from now on. Throws `AssertionFailure` if another
    /// one does.
    void setOVObject(OVObject* object);
    /// For the public object: stands for the row no longer. Throws `AssertionFailure` if it did
    /// not.
    void clearOVObject(const OVObject* object);

 private:
    OVObject* mOVObject = nullptr;  ///< not owned
};

}  // namespace Orvane
