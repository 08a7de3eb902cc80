#include "SQLite/RowJournal.h"

#include "Foundation/Guard.h"
#include "SQLite/BasicToManyColumn.h"
#include "SQLite/BasicToOneColumn.h"
#include "SQLite/Row.h"
#include "SQLite/Table.h"

namespace SQLite {

using Foundation::callGuarded;

namespace {
constexpr const char* kRollBack = "void SQLite::RowJournal::rollBack(const vector<Table *> &)";
}

void RowJournal::noteSave(Row& row) {
    const bool isNew = row.getRowID() == 0;
    mSaves.push_back({&row, row.getTable(), isNew, row._changedColumns()});
    if (isNew) row._setProvisional(true);
}

RowJournal::Link* RowJournal::noteLink(BasicToOneColumn& column, Row& target, bool retains) {
    mLinks.push_back({&column, &target, target.getRowID(), retains});
    return &mLinks.back();
}

void RowJournal::noteChildren(Row& owner, BasicToManyColumn& column) {
    mChildren.push_back({&owner, &column, column.getNewRows()});
}

void RowJournal::noteChild(Row& owner, BasicToManyColumn& column, Row& child) {
    mChildren.push_back({&owner, &column, {&child}});
}

void RowJournal::clear() {
    for (Link& link : mLinks) {
        if (link.column) link.column->_forgetLink();
    }
    mLinks.clear();
    mChildren.clear();
    for (Save& save : mSaves) {
        save.row->_setProvisional(false);
    }
    // The last reference to a row may go with its entry, and rows come back here when they end.
    std::vector<Save> saves;
    saves.swap(mSaves);
}

void RowJournal::rollBack(const std::vector<Table*>& tables) {
    restoreRows();
    restoreLinks();
    restoreChildren();
    for (Table* table : tables) {
        callGuarded(kRollBack, [&] { table->_rolledBack(); });
    }
    clear();
}

void RowJournal::restoreRows() {
    // Last first, so that a row that was inserted and then updated ends as a new one, and new rows
    // stand in their table's list in the order in which they were added.
    for (auto save = mSaves.rbegin(); save != mSaves.rend(); ++save) {
        // A row that was deleted since stays a free object.
        if (save->row->getTable() != save->table) continue;
        callGuarded(kRollBack,
                    [&] { save->table->_unsave(save->row.get(), save->wasNew, save->changed); });
    }
}

void RowJournal::restoreLinks() {
    for (auto link = mLinks.rbegin(); link != mLinks.rend(); ++link) {
        if (!link->column || link->target->getRowID() != 0) continue;
        callGuarded(kRollBack, [&] { link->column->_restoreLink(*link); });
    }
}

void RowJournal::restoreChildren() {
    // Each puts its rows first, so the last comes first.
    for (auto children = mChildren.rbegin(); children != mChildren.rend(); ++children) {
        callGuarded(kRollBack, [&] { children->column->_restore(children->rows); });
    }
}

}  // namespace SQLite
