#include "Foundation/AssertionFailure.h"
#include "Foundation/DictionaryOf.h"
#include "Foundation/Guard.h"
#include "Foundation/Logger.h"
#include "Foundation/NotificationCenter.h"
#include "Foundation/Number.h"
#include "SQLite/ChangeSet.h"
#include "SQLite/Database.h"
#include "SQLite/Row.h"
#include "SQLite/Table.h"

#include <algorithm>
#include <charconv>
#include <string_view>
#include <utility>

namespace SQLite {

using Foundation::AutoreleasePool;
using Foundation::Dictionary;
using Foundation::Number;
using Foundation::Ref;
using Foundation::String;

void Table::_rowAdded(Row* row) {
    _cacheRow(row, true);
    mChanged = true;
}

void Table::_rowChanged(Row* row) {
    _cacheRow(row, true);
    if (row->mRowID != 0) mChangedRows.insert(row->mRowID);
    mChanged = true;
}

void Table::_rowSaved(Row* row, bool wasNew) {
    // A new row is still in the list and so outlives this; the map's reference can be the last one
    // of an old row.
    _rowUnchanged(row);
    if (wasNew) _uncacheNewRow(row);
}

void Table::_rowUnchanged(Row* row) {
    if (mCacheAllRows) {
        mChangedRows.erase(row->mRowID);
        _cacheRow(row, false);
    } else {
        _uncacheRow(row);
    }
}

void Table::_deleteRow(Row* row) {
    if (row->mRowID != 0) {
        gLogPersist.log("Table %s: Deleting %@", mName, row);
        if (!mDeleteQuery) {
            mDeleteQuery = std::make_unique<Query>(
                this, SQLText::format("DELETE FROM %s WHERE rowID=?", mName));
        }
        mDeleteQuery->bindRowID(1, row->mRowID);
        mDeleteQuery->execute();
        if (mDatabase->isInTransaction()) mDatabase->deletedRows().note(this, row->mRowID);
    }
    _uncacheRow(row);
}

void Table::_cacheRow(Row* row, bool retained) {
    if (row->mRowID == 0) return _cacheNewRow(row);
    gLogPersist.log("Table %s: Caching row #%lli [%p]", mName, row->mRowID, row);
    Row* const before = std::exchange(mRows[row->mRowID], row);
    // One object stands for a row: if this one was let go of and lived on, another leaves.
    if (before && before != row) before->setCached(false, false);
    row->setCached(true, retained || mRetainRows);
}

void Table::_cacheNewRow(Row* row) {
    if (row->mNew) return;
    gLogPersist.log("Table %s: Caching new row [%p]", mName, row);
    mNewRows.emplace_back(row);
    row->mNew = true;
}

void Table::_uncacheRow(Row* row) {
    if (row->mRowID == 0) return _uncacheNewRow(row);
    gLogPersist.log("Table %s: Uncaching row #%lli [%p]", mName, row->mRowID, row);
    const auto entry = mRows.find(row->mRowID);
    // The map may know another object by now, if this one was let go of and lived on.
    if (entry != mRows.end() && entry->second == row) {
        mRows.erase(entry);
        mChangedRows.erase(row->mRowID);
    }
    row->setCached(false, false);
}

void Table::_uncacheNewRow(Row* row) {
    if (!row->mNew) return;
    gLogPersist.log("Table %s: Uncaching new row [%p]", mName, row);
    row->mNew = false;
    const auto entry = std::find_if(mNewRows.begin(), mNewRows.end(),
                                    [&](const Ref<Row>& item) { return item.get() == row; });
    // The row may end with this reference, which must not find itself in the list.
    std::list<Ref<Row>> leaving;
    leaving.splice(leaving.begin(), mNewRows, entry);
}

void Table::uncacheRows() {
    const AutoreleasePool pool;
    gLogPersist.log("Table %s: Clearing row cache", mName);
    std::list<Ref<Row>> newRows;
    newRows.swap(mNewRows);
    mChangedRows.clear();
    mChanged = false;
    for (const Ref<Row>& row : newRows) {
        row->mNew = false;
    }
    while (!mRows.empty()) {
        // A row that ends may take others with it, which then leave the map by themselves.
        Row* row = mRows.extract(mRows.begin()).mapped();
        row->setCached(false, false);
    }
}

void Table::databaseClosing() {
    const bool cacheAllRows = std::exchange(mCacheAllRows, false);
    uncacheRows();
    mCacheAllRows = cacheAllRows;
}

void Table::_unsave(Row* row, bool wasNew, ColumnMask changed) {
    if (wasNew && row->mRowID != 0) {
        if (row->mCached) _uncacheRow(row);
        row->mRowID = 0;
        row->mLoaded = true;
        if (!row->mNew) {
            gLogPersist.log("Table %s: Caching new row [%p]", mName, row);
            mNewRows.emplace_front(row);
            row->mNew = true;
        }
    }
    row->_restoreColumns(changed);
    row->mChanged = true;
    _rowChanged(row);
}

void Table::_rolledBack() {
    for (const auto& entry : mRows) {
        entry.second->_forgetLoaded();
    }
}

void Table::_applyChangeNotification(const Dictionary* changes, bool unloadUpdated) {
    if (mRows.empty()) return;
    for (const auto& [key, value] : *changes) {
        const std::int64_t action = Number::getInteger(dynamic_cast<const Number*>(value));
        const bool isUpdate = action == ChangeAction::kUpdate && unloadUpdated;
        if (action != ChangeAction::kDelete && !isUpdate) continue;
        const auto* rowID = dynamic_cast<const String*>(key);
        Foundation::callGuarded(
            "void SQLite::Table::_applyChangeNotification(Database::TableChangeDict *, bool)",
            [&] { applyChange(rowID, action, unloadUpdated); });
    }
}

void Table::applyChange(const String* key, std::int64_t action, bool unloadUpdated) {
    RowID rowID = 0;
    if (key) {
        const std::string_view text = key->view();
        std::from_chars(text.data(), text.data() + text.size(), rowID);
    }
    OV_ASSERT_MESSAGE_AS(rowID > 0, "rowID>0", "Bad rowID '%@'", key);
    const auto entry = mRows.find(rowID);
    if (entry == mRows.end()) return;
    if (action == ChangeAction::kUpdate) return unloadRow(entry->second);
    if (!unloadUpdated && mDatabase->deletedRows().isUndone(this, rowID)) return;
    forgetRow(entry);
}

void Table::unloadRow(Row* row) {
    gLogPersist.log("    ...unloaded columns of row %lli", row->mRowID);
    row->unload();
}

void Table::forgetRow(Rows::iterator entry) {
    gLogPersist.log("    ...uncached deleted row %lli", entry->first);
    Row* row = entry->second;
    mChangedRows.erase(entry->first);
    mRows.erase(entry);
    row->setCached(false, false);
}

void Table::_receiveChangeNotification(Dictionary* changes) {
    gLogPersist.log("Table '%s' changed externally!", mName);
    _applyChangeNotification(changes, true);
}

void Table::_postLocalChangeNotification(Dictionary* changes) {
    _applyChangeNotification(changes, false);
    Foundation::NotificationCenter::getLocal()->post(kRowsChangedNotification, this, changes);
}

}  // namespace SQLite
