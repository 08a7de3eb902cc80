#pragma once

#include "SQLite/BasicRowIterator.h"
#include "SQLite/BasicToManyColumn.h"
#include "SQLite/CursorOf.h"
#include "SQLite/TableOf.h"

namespace SQLite {

/// An iterator whose rows are T.
template <class T>
class RowIterator : public BasicRowIterator {
 public:
    using BasicRowIterator::BasicRowIterator;
    /// The rows of a to-many column, all or those that meet a condition.
    explicit RowIterator(const BasicToManyColumn& column, const char* condition = nullptr)
        : BasicRowIterator(TableOf<T>::instance(), column.getForeignKey(),
                           column.getRow()->getRowID(), condition, column.getNewRows()) {}

    /// Null at the end.
    T* getRow() const { return static_cast<T*>(_getRow()); }
    T* operator->() const { return getRow(); }
    /// The row that it stands on and all that follow.
    Foundation::Returner<Foundation::ArrayOf<T>> allRows() {
        Foundation::Ref<Foundation::MutableArrayOf<T>> rows{Foundation::MutableArrayOf<T>::array()};
        for (; hasRow(); nextRow()) {
            rows->add(getRow());
        }
        return Foundation::Returner<Foundation::MutableArrayOf<T>>(std::move(rows));
    }
};

}  // namespace SQLite
