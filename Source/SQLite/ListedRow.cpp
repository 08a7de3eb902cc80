#include "SQLite/ListedRow.h"

#include "Foundation/Ref.h"
#include "SQLite/Column.h"
#include "SQLite/Cursor.h"
#include "SQLite/Query.h"
#include "SQLite/Statement.h"
#include "SQLite/Table.h"
#include "SQLite/UpdateQuery.h"

namespace SQLite {

using Foundation::Ref;

void ListedRow::unload() {
    for (const ColumnSpec& spec : columns()) {
        spec.unload(*this);
    }
    Row::unload();
}

void ListedRow::saveChanges() {
    const Ref<Row> self = this;
    for (const ColumnSpec& spec : columns()) {
        if (spec.kind->saveRows) spec.kind->saveRows(spec.in(*this));
    }
    if (!getTable()) addToTable(ownTable());
    Row::saveChanges();
    clearChangedColumns();
    for (const ColumnSpec& spec : columns().toManyColumns()) {
        spec.kind->saveRows(spec.in(*this));
    }
}

void ListedRow::clearChangedColumns() {
    for (const ColumnSpec& spec : columns()) {
        Column& column = spec.in(*this);
        if (spec.kind->clear) {
            spec.kind->clear(column);
        } else {
            column.clearChanged();
        }
    }
}

bool ListedRow::loadFrom(const Cursor& cursor) {
    if (!Row::loadFrom(cursor)) return false;
    const ColumnList& list = columns();
    const std::vector<int>& indexes = cursor.statement()->columnIndexes(list);
    for (std::size_t i = 0; i < list.count(); ++i) {
        const ColumnSpec& spec = list.at(i);
        // A result that lacks the column leaves it to be read later.
        if (indexes[i] >= 0) spec.load(*this, cursor, indexes[i]);
    }
    return true;
}

RowID ListedRow::doInsert() {
    const ColumnList& list = columns();
    Query& query = getTable()->_insertQuery(list);
    for (std::size_t i = 0; i < list.count(); ++i) {
        const ColumnSpec& spec = list.at(i);
        spec.kind->bind(spec.in(*this), query, static_cast<int>(i) + 1);
    }
    return query.execute();
}

void ListedRow::doUpdate() {
    UpdateQuery(this, columns()).execute();
}

ColumnMask ListedRow::_changedColumns() const {
    auto& self = const_cast<ListedRow&>(*this);
    ColumnMask mask = 0;
    ColumnMask bit = 1;
    for (const ColumnSpec& spec : columns()) {
        if (spec.in(self).isChanged()) mask |= bit;
        bit <<= 1;
    }
    return mask;
}

void ListedRow::_restoreColumns(ColumnMask changed) {
    for (const ColumnSpec& spec : columns()) {
        Column& column = spec.in(*this);
        // A row that is not in the file has nothing to be read.
        if (getRowID() == 0) column._restoreLoaded();
        if (changed & 1) column._restoreChanged();
        changed >>= 1;
    }
}

void ListedRow::_forgetLoaded() {
    for (const ColumnSpec& spec : columns()) {
        spec.in(*this)._forgetLoaded();
    }
    setLoaded(false);
}

}  // namespace SQLite
