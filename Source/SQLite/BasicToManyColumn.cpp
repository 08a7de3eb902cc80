#include "SQLite/BasicToManyColumn.h"

#include "Foundation/AutoreleasePool.h"
#include "SQLite/Database.h"
#include "SQLite/Table.h"

#include <algorithm>
#include <utility>

namespace SQLite {

using Foundation::AutoreleasePool;
using Foundation::Ref;

namespace {

auto find(std::vector<Ref<Row>>& rows, const Row* row) {
    return std::find_if(rows.begin(), rows.end(),
                        [&](const Ref<Row>& item) { return item.get() == row; });
}

}  // namespace

void BasicToManyColumn::add(Row* row) {
    if (find(mNewRows, row) == mNewRows.end()) mNewRows.emplace_back(row);
}

bool BasicToManyColumn::remove(Row* row) {
    const auto found = find(mNewRows, row);
    if (found == mNewRows.end()) return false;
    std::vector<Ref<Row>> kept;
    for (Ref<Row>& item : mNewRows) {
        if (item.get() != row) kept.push_back(std::move(item));
    }
    // What goes is released at once, when this is in order again.
    mNewRows.swap(kept);
    return true;
}

void BasicToManyColumn::removeSaved(Row* row) {
    const Ref<Row> kept = row;
    if (!remove(row)) return;
    Database* database = row->getTable()->getDatabase();
    if (database->isInTransaction()) database->journal().noteChild(*mRow, *this, *row);
}

void BasicToManyColumn::saveChanges(Table* destination) {
    if (mNewRows.empty()) return;
    Database* database = destination->getDatabase();
    if (database->isInTransaction()) database->journal().noteChildren(*mRow, *this);
    const std::vector<Ref<Row>> rows = mNewRows;
    for (const Ref<Row>& item : rows) {
        const AutoreleasePool pool;
        const Ref<Row> row = item;
        row->addToTable(destination);
        row->saveChanges();
    }
    std::vector<Ref<Row>> done;
    done.swap(mNewRows);
}

void BasicToManyColumn::_restore(const std::vector<Ref<Row>>& rows) {
    std::vector<Ref<Row>> restored;
    for (const Ref<Row>& row : rows) {
        if (row->getRowID() == 0 && row->getTable()) restored.push_back(row);
    }
    for (const Ref<Row>& row : mNewRows) {
        if (find(restored, row.get()) == restored.end()) restored.push_back(row);
    }
    mNewRows.swap(restored);
}

}  // namespace SQLite
