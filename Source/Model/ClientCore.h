#pragma once

#include "Model/CoreOf.h"
#include "SQLite/ScalarColumn.h"
#include "SQLite/ToManyColumn.h"

namespace Orvane {

class SubscriptionCore;

/// An application that uses the store: a row of "Clients".
class ClientCore : public CoreOf<ClientCore> {
 public:
    static constexpr const char* kTableName = "Clients";
    static constexpr bool kRetainRows = true;
    static const char kSchema[];
    static const SQLite::Table::IndexSpec kSchemaIndexes[];

    /// The positions of the columns, behind "rowID".
    enum ColumnID : int {
        Signature = 0,
        Private,
        DateUsed,
    };

    using CoreOf::CoreOf;

    /// The columns in the order of the table.
    static const SQLite::ColumnList& columnList();

    OVObject* createOVObject() override;

    SQLite::ScalarColumn<Foundation::String> mSignature{this};  ///< the bundle identifier
    SQLite::ScalarColumn<bool> mPrivate{this};                  ///< only it itself may open it
    SQLite::ScalarColumn<Foundation::Date> mDateUsed{this};
    SQLite::ToManyColumn<SubscriptionCore> mSubscriptions{this, "Client"};
};

}  // namespace Orvane
