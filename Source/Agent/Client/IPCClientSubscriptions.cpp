#include "Agent/Client/IPCClient.h"
#include "Agent/Client/InClientCall.h"
#include "Agent/RPC/Routines.h"
#include "Foundation/Dictionary.h"
#include "Foundation/Number.h"
#include "Model/ClientCore.h"
#include "Model/SubscriptionCore.h"

#include <cmath>
#include <limits>

// What a client asks for its subscriptions.

namespace Orvane {

using Foundation::Dictionary;
using Foundation::Number;
using Foundation::Ref;

namespace {

/// Cut towards 0, and to the range; what is no number is 0.
template <class Integer>
Integer cut(double value) {
    using Limits = std::numeric_limits<Integer>;
    if (std::isnan(value)) return 0;
    if (value <= static_cast<double>(Limits::min())) return Limits::min();
    if (value >= static_cast<double>(Limits::max())) return Limits::max();
    return static_cast<Integer>(value);
}

double real(const Dictionary* settings, const char* key) {
    return Number::getReal(settings->getAs<Number>(key));
}

bool truth(const Dictionary* settings, const char* key) {
    return Number::getBool(settings->getAs<Number>(key));
}

}  // namespace

SubscriptionCore* IPCClient::createSubscription(ClientCore* client, URL* url,
                                                Dictionary* settings) {
    std::int64_t row = 0;
    {
        const InClientCall guard("Calling ipc_subscription_create, url=%@", url);
        using None = std::span<const std::uint8_t>;
        call(RPC::ipc_subscription_create, client->getRowID(), std::uint8_t{0}, miggify(url),
             None(), None(), None(), row);
    }
    if (row <= 0) return nullptr;
    SubscriptionCore* made = SubscriptionCore::getRow(row);
    if (settings) updateSubscription(made, settings);
    return made;
}

void IPCClient::updateSubscription(SubscriptionCore* subscription, Dictionary* settings) {
    setSettings(subscription, real(settings, "refreshInterval"),
                real(settings, "expirationInterval"), truth(settings, "refreshesInBackground"),
                truth(settings, "downloadsEnclosures"), real(settings, "maxEnclosureSize"),
                settings->getAs<String>("enclosureTypesString"));
}

void IPCClient::updateSubscription(SubscriptionCore* subscription, double refreshInterval,
                                   double expirationInterval, bool refreshesInBackground,
                                   bool downloadsEnclosures, double maxEnclosureSize,
                                   Foundation::ArrayOf<String>* enclosureTypes) {
    const Ref<String> types = SubscriptionCore::serializeEnclosureTypes(enclosureTypes);
    setSettings(subscription, refreshInterval, expirationInterval, refreshesInBackground,
                downloadsEnclosures, maxEnclosureSize, types);
}

void IPCClient::setSettings(SubscriptionCore* subscription, double refreshInterval,
                            double expirationInterval, bool refreshesInBackground,
                            bool downloadsEnclosures, double maxEnclosureSize,
                            const String* enclosureTypes) {
    const InClientCall guard("Calling ipc_subscription_set, rowID=%lld", subscription->getRowID());
    call(RPC::ipc_subscription_set, subscription->getRowID(), cut<std::int64_t>(refreshInterval),
         cut<std::int64_t>(expirationInterval), refreshesInBackground, downloadsEnclosures,
         cut<std::uint64_t>(maxEnclosureSize), miggify(enclosureTypes));
}

void IPCClient::deleteSubscription(SubscriptionCore* subscription) {
    const InClientCall guard("Calling ipc_subscription_delete, rowID=%lld",
                             subscription->getRowID());
    call(RPC::ipc_subscription_delete, subscription->getRowID());
}

}  // namespace Orvane
