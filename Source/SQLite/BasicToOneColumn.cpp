#include "SQLite/BasicToOneColumn.h"

#include "Foundation/AssertionFailure.h"
#include "SQLite/Database.h"
#include "SQLite/Table.h"

#include <utility>

namespace SQLite {

using Foundation::Ref;

BasicToOneColumn::~BasicToOneColumn() {
    unlink();
    dropUnsavedRow();
}

BasicToOneColumn::operator bool() const {
    return mUnsavedRow || getRowID() != 0;
}

void BasicToOneColumn::setValue(Row* row, bool retain) {
    const RowID id = row ? row->getRowID() : 0;
    ScalarColumn::setValue(id);
    Row* pending = id == 0 ? row : nullptr;
    if (pending != mUnsavedRow) {
        Column::setChanged();
        point(pending, retain);
    }
    unlink();
    // A row that loses its ID again must not leave it here.
    if (row && id != 0 && row->_isProvisional()) noteLink(*row, retain);
}

void BasicToOneColumn::saveChanges(Table* destination) {
    if (!mChanged || !mUnsavedRow) return;
    const Ref<Row> row = mUnsavedRow;
    const bool retains = mRetainsRow;
    if (row->getRowID() == 0) {
        row->addToTable(destination);
        row->saveChanges();
    }
    const RowID id = row->getRowID();
    OV_ASSERT_MESSAGE_AS(id != 0, "rowID", "BasicToOneColumn can't get dst rowID");
    mValue = id;
    dropUnsavedRow();
    unlink();
    if (row->_isProvisional()) noteLink(*row, retains);
}

void BasicToOneColumn::clearChanged() {
    Column::clearChanged();
    dropUnsavedRow();
}

void BasicToOneColumn::bindTo(Query& query, int index) const {
    if (mUnsavedRow) {
        query.bind(index, mUnsavedRow);
    } else {
        query.bindRowID(index, mValue);
    }
}

void BasicToOneColumn::point(Row* pending, bool retain) {
    if (pending && retain) pending->retain();
    dropUnsavedRow();
    mUnsavedRow = pending;
    mRetainsRow = pending && retain;
}

void BasicToOneColumn::dropUnsavedRow() {
    Row* old = std::exchange(mUnsavedRow, nullptr);
    if (std::exchange(mRetainsRow, false)) old->release();
}

void BasicToOneColumn::noteLink(Row& row, bool retains) {
    mLink = row.getTable()->getDatabase()->journal().noteLink(*this, row, retains);
}

void BasicToOneColumn::unlink() {
    if (mLink) mLink->column = nullptr;
    mLink = nullptr;
}

void BasicToOneColumn::_restoreLink(const RowJournal::Link& link) {
    if (mUnsavedRow || mValue != link.id) return;
    mValue = 0;
    mLoaded = true;
    point(link.target.get(), link.retains);
    Column::setChanged();
}

}  // namespace SQLite
