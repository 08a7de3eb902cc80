#pragma once

#include "SQLite/BasicToManyColumn.h"
#include "SQLite/TableOf.h"

namespace SQLite {

/// A to-many column whose rows are T.
template <class T>
class ToManyColumn : public BasicToManyColumn {
 public:
    static const ColumnKind kKind;

    using BasicToManyColumn::BasicToManyColumn;

    void add(T* row) { BasicToManyColumn::add(row); }
    bool remove(T* row) { return BasicToManyColumn::remove(row); }
};

template <class T>
const ColumnKind ToManyColumn<T>::kKind = {
    nullptr,
    [](Column& column) { static_cast<ToManyColumn&>(column).saveChanges(TableOf<T>::instance()); },
    nullptr};

}  // namespace SQLite
