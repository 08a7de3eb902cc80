#pragma once

#include "Model/CoreOf.h"
#include "SQLite/ScalarColumn.h"

namespace Orvane {

/// A person, whom entries share: a row of "Authors".
class AuthorCore : public CoreOf<AuthorCore> {
 public:
    static constexpr const char* kTableName = "Authors";
    static const char kSchema[];

    /// The positions of the columns, behind "rowID".
    enum ColumnID : int {
        Name = 0,
        Email,
        URL,
        ContactBookUID,
    };

    using CoreOf::CoreOf;

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
