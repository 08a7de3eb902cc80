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

constexpr std::size_t kMany = 32;

auto find(const std::vector<Ref<Row>>& rows, const Row* row) {
    return std::find_if(rows.begin(), rows.end(),
                        [&](const Ref<Row>& item) { return item.get() == row; });
}

}  // namespace

bool BasicToManyColumn::has(const Row* row) const {
    return mIndex ? mIndex->contains(row) : find(mNewRows, row) != mNewRows.end();
}

void BasicToManyColumn::makeIndexIfMany() {
    if (mIndex || mNewRows.size() < kMany) return;
    mIndex = std::make_unique<Index>();
    for (const Ref<Row>& row : mNewRows) {
        mIndex->insert(row.get());
    }
}

void BasicToManyColumn::add(Row* row) {
    if (has(row)) return;
    makeIndexIfMany();
    if (mIndex) mIndex->insert(row);
    mNewRows.emplace_back(row);
}

bool BasicToManyColumn::remove(Row* row) {
    if (!has(row)) return false;
    const auto place = mNewRows.begin() + (find(mNewRows, row) - mNewRows.cbegin());
    // What goes is released at once, when this is in order again.
    const Ref<Row> leaving = std::move(*place);
    mNewRows.erase(place);
    if (mIndex) mIndex->erase(row);
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
    mIndex.reset();
}

void BasicToManyColumn::_restore(const std::vector<Ref<Row>>& rows) {
    std::vector<Ref<Row>> restored;
    for (const Ref<Row>& row : rows) {
        if (row->getRowID() != 0 || !row->getTable()) continue;
        remove(row.get());
        restored.push_back(row);
    }
    mNewRows.insert(mNewRows.begin(), restored.begin(), restored.end());
    makeIndexIfMany();
    if (!mIndex) return;
    for (const Ref<Row>& row : restored) {
        mIndex->insert(row.get());
    }
}

}  // namespace SQLite
