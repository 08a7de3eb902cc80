#pragma once

#include "Foundation/Uncopyable.h"
#include "SQLite/Row.h"

namespace SQLite {

/// A persistent field of a row class, a member of the row that it belongs to. It knows whether it
/// has been read from the file and whether it has changes that are not saved.
class Column : Foundation::Uncopyable {
 public:
    Row* getRow() const { return mRow; }
    bool isLoaded() const { return mLoaded; }
    bool isChanged() const { return mChanged; }

    /// Marks the column and its row as changed. Throws `Exception` if the row may not be.
    void setChanged();
    /// The changes are saved, or given up.
    void clearChanged() { mChanged = false; }
    /// Forgets that it was read; changes are given up.
    void unload() { mLoaded = mChanged = false; }
    /// The next access reads it anew, unless it is changed.
    void _forgetLoaded() { mLoaded = mLoaded && mChanged; }
    /// The value in memory is one that the file does not have.
    void _restoreChanged() { mLoaded = mChanged = true; }
    void _restoreLoaded() { mLoaded = true; }

 protected:
    /// A column of a row without a table has nothing to be read.
    explicit Column(Row* row) : mRow(row), mLoaded(row->getTable() == nullptr) {}

    Row* mRow;
    bool mLoaded;
    bool mChanged = false;
};

}  // namespace SQLite
