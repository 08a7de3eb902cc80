#pragma once

#include "Model/CoreOf.h"
#include "SQLite/ScalarColumn.h"

namespace Orvane {

/// A text or other data with its type: a row of "Contents".
class ContentCore : public CoreOf<ContentCore> {
 public:
    static constexpr const char* kTableName = "Contents";
    static const char kSchema[];

    /// The positions of the columns, behind "rowID".
    enum ColumnID : int {
        Data = 0,
        MIMEType,
    };

    using CoreOf::CoreOf;

    /// The columns in the order of the table.
    static const SQLite::ColumnList& columnList();

    OVObject* createOVObject() override;

    SQLite::ScalarColumn<Foundation::Data> mData{this};  ///< UTF-8 of a text, or raw
    SQLite::ScalarColumn<Foundation::String> mMIMEType{this};
};

}  // namespace Orvane
