#pragma once

#include "Foundation/Ref.h"
#include "SQLite/Column.h"
#include "SQLite/ColumnList.h"
#include "SQLite/Row.h"

#include <memory>
#include <unordered_set>
#include <vector>

namespace SQLite {

/// The rows of another table that point at this one by a column there. Those of the file are found
/// by a query, see `RowIterator`; here are the ones that were added in memory and not saved yet.
class BasicToManyColumn : public Column {
 public:
    /// `foreignKey` is the column of the other table; it must outlive this.
    BasicToManyColumn(Row* row, const char* foreignKey) : Column(row), mForeignKey(foreignKey) {}

    /// Adds a row behind the others, once.
    void add(Row* row);
    /// Whether the row was there.
    bool remove(Row* row);
    /// Takes a row out that has been saved by itself. It comes back if that save is rolled back.
    void removeSaved(Row* row);
    /// Saves the rows into that table, each of which needs its owner's ID: behind the owner's save.
    void saveChanges(Table* destination);

    const char* getForeignKey() const { return mForeignKey; }
    const std::vector<Foundation::Ref<Row>>& getNewRows() const { return mNewRows; }

    /// For the journal: takes those of the rows back that are new again, in front of the others.
    void _restore(const std::vector<Foundation::Ref<Row>>& rows);

 protected:
    const char* mForeignKey;
    std::vector<Foundation::Ref<Row>> mNewRows;

 private:
    using Index = std::unordered_set<const Row*>;

    bool has(const Row* row) const;
    void makeIndexIfMany();

    /// The rows of `mNewRows`, once there are so many that looking through them takes long.
    std::unique_ptr<Index> mIndex;
};

}  // namespace SQLite
