#include "Model/ClientCore.h"

#include "Model/PublicObjects.h"
#include "Model/SubscriptionCore.h"

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

OVObject* ClientCore::createOVObject() {
    return PublicObjects::makeFor(this);
}

}  // namespace Orvane
