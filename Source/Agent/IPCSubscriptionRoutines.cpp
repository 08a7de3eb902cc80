// What clients ask for themselves and their subscriptions.

#include "Agent/IPCRoutines.h"
#include "Agent/IPCServer.h"
#include "Agent/IPCValues.h"
#include "Agent/PeerNamespace.h"
#include "Agent/SetColumn.h"
#include "FeedParser/Text/FeedURLUtilsCore.h"
#include "Foundation/AssertionFailure.h"
#include "Foundation/Logger.h"
#include "Foundation/NetException.h"
#include "Model/ClientCore.h"
#include "Model/SubscriptionCore.h"
#include "SQLite/Database.h"

namespace Orvane {

using Foundation::NetError;
using Foundation::Ref;
using Foundation::String;
using Foundation::URL;

namespace {

/// The path of a caller that sees other files would make the agent read files that the caller may
/// not see.
void requireOwnFiles(URL* url) {
    Ref<URL> source = url;
    if (FeedURLUtilsCore::isFeedProtocolURL(url)) {
        source = FeedURLUtilsCore::sourceURLForFeedURL(url);
    }
    if (!source.get() || !source->isScheme("file")) return;
    if (PeerNamespace::sharesFiles(IPCServer::getCaller())) return;
    Foundation::gWarn.log("IPCServer: %s sees other files than the agent; <%@> is not for it",
                          IPCServer::getCaller(), url);
    throw Foundation::NetException(NetError::kOrvane, OVIPCError);
}

}  // namespace

void ipc_impl_client_create(const std::string& signature, std::int64_t& client) {
    const Ref<String> text = getCString255(signature);
    const Ref<ClientCore> made = ClientCore::createClient(text);
    client = made->getRowID();
}

void ipc_impl_client_markInUse(std::int64_t client) {
    ClientCore::getRow(client)->markInUse();
}

void ipc_impl_client_expireAll(std::int64_t client) {
    ClientCore::getRow(client)->expireAllEntries();
}

void ipc_impl_subscription_create(std::int64_t client, std::uint8_t publishingProtocol,
                                  IPCBytes url, IPCBytes, IPCBytes, IPCBytes,
                                  std::int64_t& subscription) {
    OV_ASSERT_AS(!publishingProtocol, "!publishingProtocol");
    const Ref<URL> source = getURL(url);
    gLogIPC.log("Create new Subscription on <%@>", source);
    ClientCore* subscriber = ClientCore::getRow(client);
    requireOwnFiles(source);
    const Ref<SubscriptionCore> made = subscriber->createSubscription(source.get(), nullptr);
    subscriber->markInUse();
    SQLite::gDatabase->saveRows();
    subscription = made.get() ? made->getRowID() : 0;
}

void ipc_impl_subscription_set(std::int64_t subscription, std::int64_t refreshInterval,
                               std::int64_t expirationInterval, bool refreshesInBackground,
                               bool downloadsEnclosures, std::uint64_t maxEnclosureSize,
                               IPCBytes enclosureTypes) {
    SubscriptionCore* row = SubscriptionCore::getRow(subscription);
    const Ref<String> types = getLongString(enclosureTypes);
    row->setSettingsActual(static_cast<double>(refreshInterval),
                           static_cast<double>(expirationInterval), refreshesInBackground,
                           downloadsEnclosures, static_cast<double>(maxEnclosureSize), types);
}

void ipc_impl_subscription_delete(std::int64_t subscription) {
    SubscriptionCore* row = SubscriptionCore::getRow(subscription);
    OV_ASSERT_MESSAGE_AS(!row->isClientSettings(), "sub->hasFeed()",
                         "Can't delete magic client-settings Subscription");
    if (ClientCore* client = row->getClient()) client->markInUse();
    row->deleteRow();
}

void ipc_impl_client_setPrivate(std::int64_t client, bool value) {
    setColumn<ClientCore>(client, ClientCore::Private,
                          [&](ClientCore& row) { row.mPrivate.setValue(value); });
}

void ipc_impl_subscription_setRefreshInterval(std::int64_t subscription, std::int64_t seconds) {
    setColumn<SubscriptionCore>(
        subscription, SubscriptionCore::RefreshInterval,
        [&](SubscriptionCore& row) { row.setRefreshInterval(static_cast<double>(seconds)); });
}

void ipc_impl_subscription_setExpirationInterval(std::int64_t subscription, std::int64_t seconds) {
    setColumn<SubscriptionCore>(
        subscription, SubscriptionCore::ExpirationInterval,
        [&](SubscriptionCore& row) { row.setExpirationInterval(static_cast<double>(seconds)); });
}

void ipc_impl_subscription_setRefreshesInBackground(std::int64_t subscription, bool value) {
    setColumn<SubscriptionCore>(
        subscription, SubscriptionCore::RefreshesInBackground,
        [&](SubscriptionCore& row) { row.mRefreshesInBackground.setValue(value); });
}

void ipc_impl_subscription_setDownloadsEnclosures(std::int64_t subscription, bool value) {
    setColumn<SubscriptionCore>(
        subscription, SubscriptionCore::DownloadsEnclosures,
        [&](SubscriptionCore& row) { row.mDownloadsEnclosures.setValue(value); });
}

void ipc_impl_subscription_setMaxEnclosureSize(std::int64_t subscription, std::int64_t bytes) {
    setColumn<SubscriptionCore>(
        subscription, SubscriptionCore::MaxEnclosureSize,
        [&](SubscriptionCore& row) { row.setMaxEnclosureSize(static_cast<double>(bytes)); });
}

}  // namespace Orvane
