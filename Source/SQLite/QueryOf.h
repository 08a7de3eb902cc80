#pragma once

#include "Foundation/ArrayOf.h"
#include "SQLite/CursorOf.h"
#include "SQLite/Query.h"

namespace SQLite {

/// A query whose rows are T.
template <class T>
class QueryOf : public Query {
 public:
    template <class... Args>
    QueryOf(TableOf<T>* table, SQLFormatString<Args...> format, const Args&... arguments)
        : QueryOf(table, SQLText::format(format, arguments...)) {}
    QueryOf(TableOf<T>* table, SQLText whole) : Query(table, std::move(whole)) {}

    /// The first row, or null.
    Foundation::Returner<T> firstRow() {
        return Foundation::Returner<T>(static_cast<T*>(_firstRow().detach()));
    }
    /// All rows, in order.
    Foundation::Returner<Foundation::ArrayOf<T>> allRows() {
        Foundation::Ref<Foundation::MutableArrayOf<T>> rows{Foundation::MutableArrayOf<T>::array()};
        for (CursorOf<T> cursor(*this); cursor.hasRow(); cursor.nextRow()) {
            rows->add(cursor.row());
        }
        return Foundation::Returner<Foundation::MutableArrayOf<T>>(std::move(rows));
    }
};

}  // namespace SQLite
