#pragma once

#include "Model/Core.h"
#include "SQLite/TableOf.h"

namespace Orvane {

/// What the row classes have in common: T lists its columns in `columnList()`, and says in
/// `kTableName`, `kSchema`, `kSchemaIndexes` and `kSchemaTriggers` what its table is.
template <class T>
class CoreOf : public Core {
 public:
    using Core::Core;

    /// As `_getRow`, from the class's own table.
    static T* getRow(SQLite::RowID rowID) {
        return static_cast<T*>(_getRow(SQLite::TableOf<T>::instance(), rowID));
    }

 protected:
    const SQLite::ColumnList& columns() const override { return T::columnList(); }
    SQLite::Table* ownTable() const override { return SQLite::TableOf<T>::instance(); }
};

}  // namespace Orvane
