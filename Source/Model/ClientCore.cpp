#include "Model/ClientCore.h"

#include "Foundation/Date.h"
#include "Model/PublicObjects.h"
#include "Model/SubscriptionCore.h"
#include "SQLite/QueryOf.h"

namespace Orvane {

using SQLite::column;

const char ClientCore::kSchema[] =
    "rowID integer not null unique primary key, signature text unique not null, "
    "private integer, dateUsed real";

const SQLite::Table::IndexSpec ClientCore::kSchemaIndexes[] = {
    {"Clients_signature", "signature"},
    {nullptr, nullptr},
};

const SQLite::ColumnList& ClientCore::columnList() {
    static const SQLite::ColumnList sColumns = {
        column<&ClientCore::mSignature>("signature"),
        column<&ClientCore::mPrivate>("private"),
        column<&ClientCore::mDateUsed>("dateUsed"),
        SQLite::toMany<&ClientCore::mSubscriptions>(),
    };
    return sColumns;
}

bool ClientCore::isProcessRunning() const {
    if (!mProcessInfo) mProcessInfo.emplace(mSignature.getValue());
    return mProcessInfo->isRunning();
}

bool ClientCore::isDormant() const {
    const Foundation::Date* used = mDateUsed.getValue();
    return !used || used->getTimeAgo() >= kDormantAfterSeconds;
}

Foundation::Returner<SubscriptionCore> ClientCore::_getSubscription(SQLite::RowID feedRowID) const {
    static auto* const sQuery = new SQLite::QueryOf<SubscriptionCore>(
        SQLite::TableOf<SubscriptionCore>::instance(),
        "select rowID from Subscriptions  where feed=? and client=?  limit 1");
    sQuery->bindRowID(1, feedRowID);
    sQuery->bind(2, this);
    return sQuery->firstRow();
}

OVObject* ClientCore::createOVObject() {
    return PublicObjects::makeFor(this);
}

}  // namespace Orvane
