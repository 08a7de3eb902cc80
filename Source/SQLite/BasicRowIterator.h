#pragma once

#include "Foundation/ArrayOf.h"
#include "Foundation/Ref.h"
#include "Foundation/Uncopyable.h"
#include "SQLite/Row.h"
#include "SQLite/Types.h"

#include <cstdint>
#include <memory>
#include <vector>

namespace SQLite {

class Cursor;

/// Walks the rows that a cursor gives, and then rows that are only in memory yet. It stands on the
/// first one from the start. What goes for a cursor goes for it.
class BasicRowIterator : Foundation::Uncopyable {
 public:
    using NewRows = std::vector<Foundation::Ref<Row>>;

    /// The cursor, which must be that of a table's query, may be null.
    BasicRowIterator(std::unique_ptr<Cursor> cursor, const NewRows& newRows);
    /// The rows of `table` whose column `key` is `id`, which is 0 for an owner that is not saved,
    /// and that meet `condition`, which may be null. Throws `std::logic_error` for a condition
    /// together with new rows, which it cannot be tested on.
    BasicRowIterator(Table* table, const char* key, RowID id, const char* condition,
                     const NewRows& newRows);
    virtual ~BasicRowIterator();

    /// Null at the end.
    Row* _getRow() const { return mRow.get(); }
    bool hasRow() const { return mRow.get() != nullptr; }
    /// Whether there is a next row, on which it then stands.
    bool nextRow();
    /// The row that it stands on and all that follow.
    Foundation::Returner<Foundation::ArrayOf<Row>> _allRows();
    /// How many rows it has stood on.
    int getIndex() const { return mIndex; }
    /// Whether it reads from the file.
    bool hasCursor() const { return mCursor != nullptr; }

 private:
    bool takeFromCursor();

    std::unique_ptr<Cursor> mCursor;
    NewRows mNewRows;
    std::size_t mNext = 0;
    Foundation::Ref<Row> mRow;
    std::int32_t mIndex = 0;
};

}  // namespace SQLite
