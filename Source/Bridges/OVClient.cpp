#include <Orvane/OVClient.h>

#include "Bridges/Barriers.h"
#include "Bridges/ClientDelegates.h"
#include "Bridges/FeedSettings.h"
#include "Bridges/OVClientInternal.h"
#include "Bridges/PublicObject.h"
#include "Bridges/PublicSession.h"
#include "Bridges/PublicValues.h"
#include "Foundation/ApplicationIdentity.h"
#include "Foundation/AssertionFailure.h"
#include "Model/AgentLink.h"
#include "Model/SubscriptionCore.h"

#include <Orvane/OVFormat.h>

using namespace Foundation;
using namespace Orvane;

// Making clients, what they are, and what they are told.

namespace {

bool isAccessible(const ClientCore& client) {
    return !client.mPrivate ||
           String::view(client.mSignature.getValue()) == ApplicationIdentity::getIdentifier();
}

std::shared_ptr<OVClient> findClient(const std::string& bundleIdentifier) {
    PublicSession::open();
    OVInternal::catchUp();
    const Ref<String> signature = stringOf(bundleIdentifier);
    const Ref<ClientCore> core = ClientCore::createClient(signature.get());
    if (!isAccessible(*core)) {
        gWarn.log("Attempt to access private OVClient '%@'", signature);
        return nullptr;
    }
    gLog.log("+clientForBundleIdentifier = %@", core);
    core->markInUse();
    return publicObject<OVClient>(core.get());
}

/// Throws `AssertionFailure` without one.
Ref<SubscriptionCore> defaultSubscription(const OVClientInternal& client) {
    const Ref<SubscriptionCore> sub = client.core().getSubscriptionWithFeedRowID(0);
    OV_ASSERT_MESSAGE_AS(sub.get() != nullptr, "sub", "Missing default subscription for %@",
                         client.getOwner());
    return sub;
}

}  // namespace

OVClient::OVClient(std::unique_ptr<OVClientInternal> internal) : mInternal(std::move(internal)) {}

OVClient::~OVClient() = default;

void OVClient::setApplicationIdentifier(const std::string& identifier) {
    raising("+[OVClient setApplicationIdentifier:]",
            [&] { ApplicationIdentity::setIdentifier(identifier); });
}

std::shared_ptr<OVClient> OVClient::applicationClient(std::optional<OVError>* error) {
    std::shared_ptr<OVClient>& cached = OVClientInternal::applicationClient();
    if (error) error->reset();
    if (cached && !cached->mInternal->isLost()) return cached;
    // One that a new database does not know any more is found by its identifier, like any other.
    const std::string identifier = ApplicationIdentity::getIdentifier();
    if (identifier == ApplicationIdentity::kUnknown) {
        gWarn.log(
            "Call to [[PNBundle mainBundle] bundleIdentifier] resulted in nil.  Returning nil for "
            "applicationClient.");
        return nullptr;
    }
    cached = clientForBundleIdentifier(identifier, error);
    return cached;
}

std::shared_ptr<OVClient> OVClient::clientForBundleIdentifier(const std::string& bundleIdentifier,
                                                              std::optional<OVError>* error) {
    constexpr const char* kWhere = "+[OVClient clientForBundleIdentifier:]";
    requireParameter(!bundleIdentifier.empty(), kWhere, "bundleIdentifier");
    return reporting(
        kWhere, [&] { return findClient(bundleIdentifier); }, error);
}

std::vector<std::string> OVClient::allClientBundleIdentifiers() {
    return reporting("+[OVClient allClientBundleIdentifiers]", [] {
        PublicSession::open();
        OVInternal::catchUp();
        const auto query = SQLite::TableOf<ClientCore>::instance()->allRows();
        std::vector<std::string> all;
        for (SQLite::CursorOf<ClientCore> cursor(*query); cursor.hasRow(); cursor.nextRow()) {
            const AutoreleasePool pool;
            const Ref<ClientCore> client = cursor.row();
            if (isAccessible(*client)) all.push_back(client->mSignature.getValue()->utf8());
        }
        return all;
    });
}

bool OVClient::startSync() {
    gLog.log("+[OVClient startSync] called!");
    return reporting("+[OVClient startSync]", [] {
        PublicSession::connect();
        return AgentLink::current().startSync();
    });
}

void OVClient::_enableOVLogging(bool enabled) {
    gLog.setEnabled(enabled);
}

std::string OVClient::signature() const {
    return raising("-[OVClient signature]",
                   [&] { return textOf(mInternal->core().mSignature.getValue()).value_or(""); });
}

bool OVClient::isPrivate() const {
    return raising("-[OVClient isPrivate]", [&] { return mInternal->core().mPrivate.getValue(); });
}

void OVClient::setPrivate(bool value) {
    changing("setPrivate", [&] {
        mInternal->core().public_setPrivate(value);
        return true;
    });
}

OVFeedSettings OVClient::settings() const {
    return raising("-[OVClient settings]",
                   [&] { return settingsOf(defaultSubscription(*mInternal).get()); });
}

void OVClient::setSettings(const std::optional<OVFeedSettings>& settings) {
    raising("-[OVClient setSettings:]", [&] {
        const Ref<SubscriptionCore> sub = defaultSubscription(*mInternal);
        applySettings(settings.value_or(OVFeedSettings::defaultClientSettings()), *sub);
    });
}

OVClientDelegate* OVClient::delegate() const {
    return ClientDelegates::get(this);
}

void OVClient::setDelegate(OVClientDelegate* delegate) {
    ClientDelegates::set(this, delegate);
}

std::optional<OVDate> OVClient::dateLastUpdated() const {
    return dateOf(mInternal->dateLastUpdated.get());
}

bool OVClient::tracksEntryChanges() const {
    return mInternal->tracksEntryChanges;
}

void OVClient::setTracksEntryChanges(bool tracks) {
    mInternal->tracksEntryChanges = tracks;
}

void OVClient::sendChangesSinceDate(const std::optional<OVDate>& date) {
    raising("-[OVClient sendChangesSinceDate:]", [&] {
        const Ref<Date> since = dateOf(date);
        mInternal->sendChangesSinceDate(since.get());
    });
}

bool OVClient::_usesExtensionXML() const {
    return raising("-[OVClient _usesExtensionXML]", [&] { return mInternal->core().mUsesXML; });
}

void OVClient::_setUsesExtensionXML(bool uses) {
    raising("-[OVClient _setUsesExtensionXML:]", [&] { mInternal->core().mUsesXML = uses; });
}

bool OVClient::isEqual(const OVObject* other) const {
    const auto* client = dynamic_cast<const OVClient*>(other);
    return client && IsEqual(mInternal->peek(), client->mInternal->peek());
}

std::size_t OVClient::hash() const {
    return mInternal->peek()->getPFHashCode();
}

std::string OVClient::description() const {
    return OVFormat("%s[%s]", "OVClient", mInternal->getSignature());
}
