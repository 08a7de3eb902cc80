#pragma once

#include "SQLite/Cursor.h"
#include "SQLite/Table.h"

namespace SQLite {

template <class T>
class QueryOf;
template <class T>
class TableOf;

/// A cursor whose rows are T.
template <class T>
class CursorOf : public Cursor {
 public:
    explicit CursorOf(QueryOf<T>& query) : Cursor(query), mTable(query.getTable()) {}
    /// Takes the query over.
    explicit CursorOf(std::unique_ptr<QueryOf<T>> query)
        : Cursor(query.release(), true), mTable(getQuery().getTable()) {}
    template <class... Args>
    CursorOf(TableOf<T>* table, SQLFormatString<Args...> format, const Args&... arguments)
        : CursorOf(std::make_unique<QueryOf<T>>(table, SQLText::format(format, arguments...))) {}

    /// The row that the cursor stands on, or null.
    Foundation::Returner<T> row() {
        return Foundation::Returner<T>(static_cast<T*>(mTable->_rowForCursor(*this).detach()));
    }

 private:
    Table* mTable;
};

}  // namespace SQLite
