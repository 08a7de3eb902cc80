#pragma once

#include "Foundation/AssertionFailure.h"
#include "SQLite/Cursor.h"
#include "SQLite/Database.h"
#include "SQLite/QueryOf.h"
#include "SQLite/Row.h"
#include "SQLite/Table.h"

namespace SQLite {

/// The table of a row class, which has the constants `kTableName`, `kCacheAllRows` and
/// `kRetainRows` and a constructor that takes a table and an ID.
template <class T>
class TableOf : public Table {
 public:
    using Table::Table;

    /// The table in the database of the process, made on first use and never destroyed. So tables
    /// are saved in the order of their first use.
    static TableOf* instance() {
        static auto* const sInstance =
            new TableOf(gDatabase, T::kTableName, T::kCacheAllRows, T::kRetainRows);
        return sInstance;
    }

    /// As `_rowWithID`.
    virtual Foundation::Returner<T> rowWithID(RowID rowID) {
        return typed(_rowWithID(rowID).detach());
    }
    /// The row if it is in memory, or null.
    virtual T* cachedRowWithID(RowID rowID) { return static_cast<T*>(_cachedRowWithID(rowID)); }
    /// A query of the rows that meet a condition.
    virtual std::unique_ptr<QueryOf<T>> rowsWhere(const char* where) {
        return std::make_unique<QueryOf<T>>(
            this, SQLText::format("SELECT %s FROM %s WHERE %s", _colsToFetch(), getName(), where));
    }
    /// A query of all rows, always with all columns.
    virtual std::unique_ptr<QueryOf<T>> allRows() {
        return std::make_unique<QueryOf<T>>(this, SQLText::format("SELECT * FROM %s", getName()));
    }

    Foundation::Returner<Row> _allocRowWithID(RowID rowID) override {
        return Foundation::Returner<Row>::adopted(new T(this, rowID));
    }

 private:
    static Foundation::Returner<T> typed(Row* owned) {
        return Foundation::Returner<T>(static_cast<T*>(owned));
    }
};

template <class ROW>
bool Cursor::getObject(int column, Foundation::Ref<ROW>& result) const {
    const RowID rowID = int64Column(column);
    if (rowID == 0) return false;
    TableOf<ROW>* table = TableOf<ROW>::instance();
    OV_ASSERT_AS(table != nullptr, "table!=NULL");
    result = table->rowWithID(rowID);
    return true;
}

}  // namespace SQLite
