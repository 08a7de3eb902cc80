#pragma once

#include "Foundation/ProcessInfo.h"
#include "Model/CoreOf.h"
#include "SQLite/ScalarColumn.h"
#include "SQLite/ToManyColumn.h"

#include <optional>

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

    /// Whether the application runs.
    bool isProcessRunning() const;
    /// Whether the client has not been in use for so long that nothing is done for it.
    bool isDormant() const;
    /// The client's subscription of a feed, or its settings for ID 0; null if there is none.
    Foundation::Returner<SubscriptionCore> _getSubscription(SQLite::RowID feedRowID) const;

    OVObject* createOVObject() override;

    SQLite::ScalarColumn<Foundation::String> mSignature{this};  ///< the bundle identifier
    SQLite::ScalarColumn<bool> mPrivate{this};                  ///< only it itself may open it
    SQLite::ScalarColumn<Foundation::Date> mDateUsed{this};
    SQLite::ToManyColumn<SubscriptionCore> mSubscriptions{this, "Client"};

 private:
    static constexpr double kDormantAfterSeconds = 1209600.0;

    mutable std::optional<Foundation::ProcessInfo> mProcessInfo;  ///< made on first use
};

}  // namespace Orvane
