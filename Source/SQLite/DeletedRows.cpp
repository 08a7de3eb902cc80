#include "SQLite/DeletedRows.h"

#include "SQLite/Table.h"

#include <algorithm>
#include <cstring>

namespace SQLite {

void DeletedRows::note(const Table* table, RowID rowID) {
    mDeleted.emplace_back(table, rowID);
}

void DeletedRows::failCommit() {
    mUndone.insert(mUndone.end(), mDeleted.begin(), mDeleted.end());
    mDeleted.clear();
}

bool DeletedRows::isUndone(const Table* table, RowID rowID) const {
    return std::find(mUndone.begin(), mUndone.end(), std::pair(table, rowID)) != mUndone.end();
}

void DeletedRows::forgetUndone(const char* tableName, RowID rowID) {
    std::erase_if(mUndone, [&](const auto& undone) {
        return undone.second == rowID && std::strcmp(undone.first->getName(), tableName) == 0;
    });
}

}  // namespace SQLite
