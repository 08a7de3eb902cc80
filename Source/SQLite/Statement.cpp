#include "SQLite/Statement.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Logger.h"
#include "SQLite/ColumnList.h"
#include "SQLite/Database.h"
#include "SQLite/Exception.h"

#include <sqlite3.h>
#include <strings.h>

#include <utility>

namespace SQLite {

Statement::Statement(Database* database, sqlite3_stmt* vm)
    : mDatabase(database),
      mGeneration(database->getGeneration()),
      mVM(vm),
      mCols(sqlite3_column_count(vm)) {
    mDatabase->_addStatement(this);
}

Statement::~Statement() {
    invalidate();
}

void Statement::reset() {
    if (mVM) sqlite3_reset(mVM);
}

void Statement::invalidate() {
    mGeneration = 0;
    mCols = 0;
    mIndexedList = nullptr;
    mRowIDColumn = kUnknown;
    if (!mVM) return;
    mDatabase->_removeStatement(this);
    sqlite3_stmt* vm = std::exchange(mVM, nullptr);
    if (const int result = sqlite3_finalize(vm)) {
        Foundation::gWarn.log("Error from sqlite3_finalize(%p): %i / %s",
                              static_cast<const void*>(vm), result,
                              Exception::errorCodeAsString(result));
    }
}

bool Statement::isCurrent() const {
    return mVM && mGeneration == mDatabase->getGeneration() && !sqlite3_expired(mVM);
}

int Statement::step() {
    const int result = sqlite3_step(mVM);
    // Another process may have changed the schema: sqlite3 has then compiled the text again.
    if (mVM && sqlite3_stmt_status(mVM, SQLITE_STMTSTATUS_REPREPARE, 1) > 0) noteReprepared();
    return result;
}

void Statement::noteReprepared() {
    gLogSQL.log("Recompiled statement %p", getAddress());
    mCols = sqlite3_column_count(mVM);
    mIndexedList = nullptr;
    mRowIDColumn = kUnknown;
}

int Statement::columnIndex(const char* name) const {
    if (!name) return -1;
    for (int i = 0; i < mCols; ++i) {
        const char* column = sqlite3_column_name(mVM, i);
        if (column && strcasecmp(column, name) == 0) return i;
    }
    return -1;
}

int Statement::rowIDColumn() const {
    if (mRowIDColumn == kUnknown) mRowIDColumn = columnIndex("rowID");
    return mRowIDColumn;
}

const std::vector<int>& Statement::columnIndexes(const ColumnList& list) const {
    if (mIndexedList != &list) {
        mIndexes.clear();
        for (const ColumnSpec& column : list) {
            mIndexes.push_back(columnIndex(column.name));
        }
        mIndexedList = &list;
    }
    return mIndexes;
}

void Statement::failColumn() {
    Foundation::AssertionFailure::failed("int SQLite::Statement::checkColumn(int) const",
                                         "column >= 0 && column < mCols",
                                         "Invalid column index requested");
}

const char* Statement::sql() const {
    return mVM ? sqlite3_sql(mVM) : nullptr;
}

}  // namespace SQLite
