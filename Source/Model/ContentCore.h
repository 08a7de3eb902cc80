#pragma once

#include "Model/CoreOf.h"
#include "SQLite/ScalarColumn.h"

namespace Orvane {

/// A text or other data with its type: a row of "Contents".
class ContentCore : public CoreOf<ContentCore> {
 public:
    static constexpr const char* kTableName = "Contents";
    static constexpr bool kCacheAllRows = true;
    static constexpr bool kRetainRows = false;
    static const char kSchema[];
    static const SQLite::Table::IndexSpec kSchemaIndexes[];
    static const SQLite::Table::TriggerSpec kSchemaTriggers[];

    /// The positions of the columns, behind "rowID".
    enum ColumnID : int {
        Data = 0,
        MIMEType,
    };

    explicit ContentCore(SQLite::Table* table = nullptr) : CoreOf(table) {}
    ContentCore(SQLite::Table* table, SQLite::RowID rowID) : CoreOf(table, rowID) {}

    /// The columns in the order of the table.
    static const SQLite::ColumnList& columnList();

    OVObject* createOVObject() override;

    SQLite::ScalarColumn<Foundation::Data> mData{this};  ///< UTF-8 of a text, or raw
    SQLite::ScalarColumn<Foundation::String> mMIMEType{this};
};

}  // namespace Orvane
