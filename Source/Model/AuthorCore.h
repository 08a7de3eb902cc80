#pragma once

#include "Model/CoreOf.h"
#include "SQLite/ScalarColumn.h"

namespace Orvane {

/// A person, whom entries share: a row of "Authors".
class AuthorCore : public CoreOf<AuthorCore> {
 public:
    static constexpr const char* kTableName = "Authors";
    static constexpr bool kCacheAllRows = true;
    static constexpr bool kRetainRows = false;
    static const char kSchema[];
    static const SQLite::Table::IndexSpec kSchemaIndexes[];
    static const SQLite::Table::TriggerSpec kSchemaTriggers[];

    /// The positions of the columns, behind "rowID".
    enum ColumnID : int {
        Name = 0,
        Email,
        URL,
        ContactBookUID,
    };

    explicit AuthorCore(SQLite::Table* table = nullptr) : CoreOf(table) {}
    AuthorCore(SQLite::Table* table, SQLite::RowID rowID) : CoreOf(table, rowID) {}

    /// The columns in the order of the table.
    static const SQLite::ColumnList& columnList();

    OVObject* createOVObject() override;

    SQLite::ScalarColumn<Foundation::String> mName{this};
    SQLite::ScalarColumn<Foundation::String> mEmail{this};
    SQLite::ScalarColumn<Foundation::URL> mURL{this};
    /// A contact of the contacts service.
    SQLite::ScalarColumn<Foundation::String> mContactBookUID{this};
};

}  // namespace Orvane
