#include "SQLite/Column.h"

namespace SQLite {

void Column::setChanged() {
    if (mChanged) return;
    // The row first: it refuses where it may not be changed, and then nothing is.
    mRow->setChanged();
    mChanged = true;
}

}  // namespace SQLite
