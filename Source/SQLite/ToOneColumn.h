#pragma once

#include "SQLite/BasicToOneColumn.h"
#include "SQLite/TableOf.h"

namespace SQLite {

/// A to-one column that points at a T. WEAK makes it leave an unsaved T to others: a link up to a
/// parent, which the parent's own links keep.
template <class T, bool WEAK>
class ToOneColumn : public BasicToOneColumn {
 public:
    static const ColumnKind kKind;

    explicit ToOneColumn(Row* row) : BasicToOneColumn(row) {}

    /// The row, which the current pool or its other owners keep; null if there is none.
    T* getValue() const {
        if (!mLoaded) mRow->loadColumn(this);
        if (mUnsavedRow) return static_cast<T*>(mUnsavedRow);
        if (mValue == 0) return nullptr;
        return TableOf<T>::instance()->rowWithID(mValue);
    }
    operator T*() const { return getValue(); }
    T* operator->() const { return getValue(); }
    void setValue(T* row) { BasicToOneColumn::setValue(row, !WEAK); }
};

template <class T, bool WEAK>
const ColumnKind ToOneColumn<T, WEAK>::kKind = {
    [](const Column& column, Query& query, int index) {
        static_cast<const ToOneColumn&>(column).bindTo(query, index);
    },
    [](Column& column) { static_cast<ToOneColumn&>(column).saveChanges(TableOf<T>::instance()); },
    [](Column& column) { static_cast<ToOneColumn&>(column).clearChanged(); }};

}  // namespace SQLite
