#include "SQLite/Column.h"

#include "SQLite/Row.h"

namespace SQLite {

Column::Column(Row* row) : mRow(row), mLoaded(row->getTable() == nullptr) {}

void Column::setChanged() {
    if (mChanged) return;
    // The row first: it refuses where it may not be changed, and then nothing is.
    mRow->setChanged();
    mChanged = true;
}

}  // namespace SQLite
