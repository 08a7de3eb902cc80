#pragma once

#include "SQLite/ColumnList.h"
#include "SQLite/Query.h"

#include <cstdint>

namespace SQLite {

/// Writes a row's changed columns, and no others.
class UpdateQuery : public Query {
 public:
    /// REQUIRES: the row has an ID and a table; `columns` is its class's list.
    UpdateQuery(Row* row, const ColumnList& columns);

    /// Binds the changed columns and runs. How many rows changed; 0, without any SQL, if no column
    /// has.
    long long execute();

 private:
    void bindNextParam(const ColumnSpec& spec);

    Row* mRow;
    const ColumnList& mColumns;
    std::int32_t mNextParam = 1;
};

}  // namespace SQLite
