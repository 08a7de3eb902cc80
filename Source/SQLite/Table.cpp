#include "SQLite/Table.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Guard.h"
#include "Foundation/Logger.h"
#include "SQLite/ColumnList.h"
#include "SQLite/Cursor.h"
#include "SQLite/Database.h"
#include "SQLite/Exception.h"
#include "SQLite/Row.h"
#include "SQLite/Statement.h"
#include "SQLite/Transaction.h"

#include <sqlite3.h>

#include <algorithm>
#include <utility>
#include <vector>

namespace SQLite {

using Foundation::AutoreleasePool;
using Foundation::Ref;
using Foundation::Returner;

Table::Table(Database* database, const char* name, bool cacheAllRows, bool retainRows)
    : mDatabase(database),
      mName(name),
      mCacheAllRows(cacheAllRows),
      mRetainRows(cacheAllRows && retainRows) {
    OV_ASSERT_MESSAGE_AS(database != nullptr, "db", "NULL db in Table constructor");
    OV_ASSERT_MESSAGE_AS(name != nullptr, "name", "NULL name in Table constructor");
    mDatabase->_addTable(this);
}

Table::~Table() {
    mDatabase->_removeTable(this);
    Foundation::callGuarded("virtual SQLite::Table::~Table()", [this] { uncacheRows(); });
}

void Table::create(const char* columns, const IndexSpec* indexes, const TriggerSpec* triggers) {
    if (mDatabase->execScalar("select count(*) from sqlite_master where type='table' and name='%q'",
                              mName) > 0) {
        return;
    }
    requireChangeable();
    mDatabase->execute("CREATE TABLE %s (%s)", mName, columns);
    for (const IndexSpec* index = indexes; index && index->name; ++index) {
        addIndex(index->name, index->columns);
    }
    for (const TriggerSpec* trigger = triggers; trigger && trigger->name; ++trigger) {
        mDatabase->execute("CREATE TRIGGER %s %s ON %s %s", trigger->name, trigger->when, mName,
                           trigger->body);
    }
}

void Table::addIndex(const char* name, const char* columns) {
    requireChangeable();
    mDatabase->execute("CREATE INDEX IF NOT EXISTS %s ON %s(%s)", name, mName, columns);
}

void Table::addColumn(const char* name, const char* declaration) {
    requireChangeable();
    mDatabase->execute("ALTER TABLE %s ADD COLUMN %s %s", mName, name, declaration);
}

void Table::requireChangeable() const {
    if (!mDatabase->isWriteable()) {
        throw Exception(SQLITE_AUTH, "Cannot change row: database is not writeable");
    }
}

std::unique_ptr<Query> Table::queryWhereText(const SQLText& condition) {
    return std::make_unique<Query>(this, SQLText::format("SELECT %s FROM %s WHERE %s",
                                                         _colsToFetch(), mName, condition.c_str()));
}

const char* Table::_colsToFetch() const {
    return mRetainRows && mRows.size() >= kWarmRows ? "rowID" : "*";
}

Query& Table::_rowQuery() {
    if (!mRowQuery) {
        mRowQuery =
            std::make_unique<Query>(this, SQLText::format("SELECT * FROM %s WHERE rowID=?", mName));
    }
    return *mRowQuery;
}

Query& Table::_insertQuery(const ColumnList& columns) {
    if (!mInsertQuery) {
        mInsertQuery = std::make_unique<Query>(this, SQLText(columns.insertText(mName)));
    }
    return *mInsertQuery;
}

Returner<Row> Table::_rowWithID(RowID rowID) {
    OV_ASSERT_AS(rowID > 0, "rowID>0");
    mDatabase->_checkThread();
    if (Row* const known = _cachedRowWithID(rowID)) return Returner<Row>::retained(known);
    Ref<Row> row = _allocRowWithID(rowID);
    if (mCacheAllRows) {
        mRows.emplace(rowID, row.get());
        row->setCached(true, mRetainRows);
        gLogPersist.log("Table %s: mCacheAllRows is set.  Caching row #%lli [%p]", mName, rowID,
                        row.get());
    }
    return Returner<Row>(std::move(row));
}

Returner<Row> Table::_rowForCursor(Cursor& cursor) {
    if (!cursor.hasRow()) return nullptr;
    const RowID rowID = cursor.rowID();
    OV_ASSERT_MESSAGE_AS(rowID > 0, "rowID>0", "Cursor has no rowID column");
    Ref<Row> row = _rowWithID(rowID);
    if (cursor.columnCount() >= 2) row->doLoad(cursor);
    return Returner<Row>(std::move(row));
}

Row* Table::_cachedRowWithID(RowID rowID) const {
    const auto found = mRows.find(rowID);
    return found == mRows.end() ? nullptr : found->second;
}

bool Table::isChanged() {
    if (!mChanged) return false;
    if (!mNewRows.empty()) return true;
    mChanged = std::ranges::any_of(mChangedRows, [this](RowID rowID) { return changedRow(rowID); });
    return mChanged;
}

Row* Table::changedRow(RowID rowID) const {
    Row* const row = _cachedRowWithID(rowID);
    return row && row->mChanged ? row : nullptr;
}

void Table::saveRows() {
    if (!mChanged) return;
    gLogPersist.log("Table %s: Saving rows...", mName);
    const Transaction transaction(mDatabase, true);
    // A save may change further rows, which sets the flag again.
    mChanged = false;
    try {
        saveNewRows();
        saveChangedRows();
    } catch (...) {
        mChanged = true;
        throw;
    }
}

void Table::saveNewRows() {
    while (!mNewRows.empty()) {
        const AutoreleasePool pool;
        const Ref<Row> row = mNewRows.front();
        if (row->mChanged) row->saveChanges();
        // The row has left the list by its save, unless it was not changed.
        if (row->mNew && !row->mChanged) _uncacheNewRow(row.get());
    }
}

void Table::saveChangedRows() {
    // A save may change rows further on, which are then saved as well.
    for (auto next = mChangedRows.begin(); next != mChangedRows.end();) {
        const RowID rowID = *next;
        if (Row* const row = changedRow(rowID)) {
            const AutoreleasePool pool;
            const Ref<Row> held = row;
            held->saveChanges();
        }
        next = mChangedRows.upper_bound(rowID);
    }
}

}  // namespace SQLite
