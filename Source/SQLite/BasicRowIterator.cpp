#include "SQLite/BasicRowIterator.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/AutoreleasePool.h"
#include "SQLite/Cursor.h"
#include "SQLite/Statement.h"
#include "SQLite/Table.h"

#include <stdexcept>
#include <utility>

namespace SQLite {

using Foundation::AutoreleasePool;
using Foundation::MutableArrayOf;
using Foundation::Ref;
using Foundation::Returner;

namespace {

std::unique_ptr<Cursor> openCursor(Table* table, const char* key, RowID id, const char* condition) {
    OV_ASSERT_AS(key && key[0], "key && key[0]");
    std::unique_ptr<Query> query = condition ? table->queryWhere("%s=? and (%s)", key, condition)
                                             : table->queryWhere("%s=?", key);
    query->bind(1, id);
    return std::make_unique<Cursor>(query.release(), true);
}

}  // namespace

BasicRowIterator::BasicRowIterator(std::unique_ptr<Cursor> cursor, const NewRows& newRows)
    : mCursor(std::move(cursor)), mNewRows(newRows) {
    nextRow();
}

BasicRowIterator::BasicRowIterator(Table* table, const char* key, RowID id, const char* condition,
                                   const NewRows& newRows)
    : mNewRows(newRows) {
    const AutoreleasePool pool;
    if (condition && !newRows.empty()) {
        throw std::logic_error("Row iterator can't apply condition to unsaved rows");
    }
    if (id != 0) mCursor = openCursor(table, key, id, condition);
    nextRow();
}

BasicRowIterator::~BasicRowIterator() = default;

bool BasicRowIterator::nextRow() {
    const AutoreleasePool pool;
    mRow = nullptr;
    if (mCursor && mCursor->hasRow()) return takeFromCursor();
    if (mNext < mNewRows.size()) mRow = mNewRows[mNext++];
    if (mRow.get()) ++mIndex;
    return hasRow();
}

bool BasicRowIterator::takeFromCursor() {
    mRow = mCursor->getQuery().getTable()->_rowForCursor(*mCursor);
    mCursor->nextRow();
    if (mRow.get()) ++mIndex;
    return hasRow();
}

Returner<Foundation::ArrayOf<Row>> BasicRowIterator::_allRows() {
    Ref<MutableArrayOf<Row>> rows{MutableArrayOf<Row>::array()};
    for (; hasRow(); nextRow()) {
        rows->add(mRow.get());
    }
    return Returner<MutableArrayOf<Row>>(std::move(rows));
}

}  // namespace SQLite
