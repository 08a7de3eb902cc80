#include "Model/SubscriptionCore.h"

#include "Model/ClientCore.h"
#include "Model/FeedCore.h"
#include "Model/PublicObjects.h"

namespace Orvane {

using SQLite::column;

const char SubscriptionCore::kSchema[] =
    "rowID integer not null unique primary key, "
    "client integer references Clients(rowID) not null, feed integer references Feeds(rowID), "
    "refreshInterval real, expirationInterval real, expirationDate real, "
    "refreshesInBackground integer, downloadsEnclosures integer, maxEnclosureSize real, "
    "enclosureTypesString text, unreadCount integer";

const SQLite::Table::IndexSpec SubscriptionCore::kSchemaIndexes[] = {
    {"Subscriptions_feedandclient", "feed, client"},
    {"Subscriptions_nonbackground", "client, refreshesInBackground, refreshInterval"},
    {nullptr, nullptr},
};

const SQLite::ColumnList& SubscriptionCore::columnList() {
    static const SQLite::ColumnList sColumns = {
        column<&SubscriptionCore::mClient>("client"),
        column<&SubscriptionCore::mFeed>("feed"),
        column<&SubscriptionCore::mRefreshInterval>("refreshInterval"),
        column<&SubscriptionCore::mExpirationInterval>("expirationInterval"),
        column<&SubscriptionCore::mExpirationDate>("expirationDate"),
        column<&SubscriptionCore::mRefreshesInBackground>("refreshesInBackground"),
        column<&SubscriptionCore::mDownloadsEnclosures>("downloadsEnclosures"),
        column<&SubscriptionCore::mMaxEnclosureSize>("maxEnclosureSize"),
        column<&SubscriptionCore::mEnclosureTypesString>("enclosureTypesString"),
        column<&SubscriptionCore::mUnreadCount>("unreadCount"),
    };
    return sColumns;
}

OVObject* SubscriptionCore::createOVObject() {
    return PublicObjects::makeFor(this);
}

}  // namespace Orvane
