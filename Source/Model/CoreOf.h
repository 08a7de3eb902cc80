#pragma once

#include "Model/Core.h"
#include "SQLite/TableOf.h"

namespace Orvane {

/// What the row classes have in common: T lists its columns in `columnList()`, and says in
/// `kTableName` and `kSchema` what its table is. Where its table differs from most, T says so by a
/// constant of its own in place of the one here.
template <class T>
class CoreOf : public Core {
 public:
    static constexpr bool kCacheAllRows = true;
    static constexpr bool kRetainRows = false;
    static constexpr SQLite::Table::IndexSpec kSchemaIndexes[] = {{nullptr, nullptr}};
    static constexpr SQLite::Table::TriggerSpec kSchemaTriggers[] = {{nullptr, nullptr, nullptr}};

    explicit CoreOf(SQLite::Table* table = nullptr) : Core(table) {}
    CoreOf(SQLite::Table* table, SQLite::RowID rowID) : Core(table, rowID) {}

    /// As `_getRow`, from the class's own table.
    static T* getRow(SQLite::RowID rowID) {
        return static_cast<T*>(_getRow(SQLite::TableOf<T>::instance(), rowID));
    }

 protected:
    const SQLite::ColumnList& columns() const override { return T::columnList(); }
    SQLite::Table* ownTable() const override { return SQLite::TableOf<T>::instance(); }
};

}  // namespace Orvane
