#include "SQLite/UpdateQuery.h"

#include "Foundation/Logger.h"
#include "SQLite/Column.h"
#include "SQLite/Row.h"
#include "SQLite/Table.h"

#include <string>

namespace SQLite {

UpdateQuery::UpdateQuery(Row* row, const ColumnList& columns)
    : Query(row->getTable()), mRow(row), mColumns(columns) {
    std::string changes;
    for (const ColumnSpec& spec : columns) {
        if (!spec.in(*row).isChanged()) continue;
        if (!changes.empty()) changes += ", ";
        changes.append(spec.name).append("=?");
    }
    setSQL(SQLText::format("update %s set %s where rowID=%lld", getTable()->getName(), changes,
                           row->getRowID()));
}

void UpdateQuery::bindNextParam(const ColumnSpec& spec) {
    const Column& column = spec.in(*mRow);
    if (!column.isChanged()) return;
    const int index = mNextParam++;
    if (!column.isLoaded()) mRow->loadColumn(&column);
    spec.kind->bind(column, *this, index);
}

long long UpdateQuery::execute() {
    mNextParam = 1;
    for (const ColumnSpec& spec : mColumns) {
        bindNextParam(spec);
    }
    if (mNextParam < 2) {
        gLogPersist.log("UpdateQuery found no changed columns; no-op");
        return 0;
    }
    return Query::execute();
}

}  // namespace SQLite
