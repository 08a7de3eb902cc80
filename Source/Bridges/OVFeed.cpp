#include <Orvane/OVFeed.h>

#include "Bridges/Barriers.h"
#include "Bridges/OVFeedInternal.h"
#include "Bridges/OVObjectMaker.h"
#include "Bridges/PublicSession.h"
#include "Bridges/PublicValues.h"

#include <Orvane/OVClient.h>
#include <Orvane/OVFormat.h>

using namespace Foundation;
using namespace Orvane;

namespace {

/// Null for null.
std::shared_ptr<OVFeed> makeInMemory(FeedCore* core) {
    if (!core) return nullptr;
    return OVObjectMaker::make<OVFeed, OVFeedInternal>(
        [core](OVFeedInternal& state, OVObject* object) {
            state._initWithFeedCore(core, nullptr, object);
        });
}

}  // namespace

OVFeed::OVFeed(std::unique_ptr<OVFeedInternal> internal) : mInternal(std::move(internal)) {}

OVFeed::~OVFeed() = default;

std::shared_ptr<OVFeed> OVFeed::create(const std::string& url) {
    constexpr const char* kWhere = "-[OVFeed initWithURL:]";
    requireParameter(!url.empty(), kWhere, "url");
    return reporting(kWhere, [&] {
        PublicSession::open();
        const Ref<FeedCore> core = FeedCore::createFeed(urlOf(url).get(), false);
        return makeInMemory(core.get());
    });
}

std::shared_ptr<OVFeed> OVFeed::create(std::string_view data, const std::string& url) {
    constexpr const char* kWhere = "-[OVFeed initWithData:URL:]";
    requireParameter(!url.empty(), kWhere, "url");
    return reporting(kWhere, [&] {
        PublicSession::open();
        const Ref<Data> bytes = Data::data(data.data(), data.size());
        const Ref<FeedCore> core = FeedCore::createFeed(bytes.get(), urlOf(url).get());
        return makeInMemory(core.get());
    });
}

std::shared_ptr<OVClient> OVFeed::client() const {
    return reporting("-[OVFeed client]", [&] { return mInternal->client(); });
}

std::optional<OVFeedSettings> OVFeed::settings() const {
    return raising("-[OVFeed settings]", [&] { return mInternal->getSettings(); });
}

void OVFeed::setSettings(const std::optional<OVFeedSettings>& settings) {
    raising("-[OVFeed setSettings:]", [&] { mInternal->setSettings(settings); });
}

void OVFeed::setPassword(const std::string& password) {
    raising("-[OVFeed setPassword:]", [&] {
        const Ref<String> text = stringOf(password);
        const NetError error = mInternal->core().setPassword(text.get(), true);
        if (error.code != 0)
            gWarn.log("%@ could not store a password: %s", this, error.description());
    });
}

OVFeed::Text OVFeed::login() const {
    return raising("-[OVFeed login]", [&] { return textOf(mInternal->core().mLogin.getValue()); });
}

void OVFeed::setLogin(const Text& login) {
    changing("setLogin", [&] {
        const Ref<String> text = stringOf(login);
        mInternal->core().public_setLogin(text.get());
        return true;
    });
}

bool OVFeed::isRefreshing() const {
    return mInternal->isRefreshing();
}

bool OVFeed::refresh(std::optional<OVError>* error) {
    const std::shared_ptr<OVFeed> keep = mInternal->self();
    std::optional<OVError> failure;
    const bool isStarted = reporting(
        "-[OVFeed refresh:]", [&] { return mInternal->startRefresh(); }, &failure);
    if (error) error->reset();
    if (isStarted || !error) return isStarted;
    *error = lastError();
    if (!*error && failure && failure->code() != OVInternalError) *error = failure;
    if (!*error) *error = errorWithCode(OVInternalError, URL().value_or(""));
    return false;
}

std::optional<OVError> OVFeed::lastError() const {
    return reporting("-[OVFeed lastError]", [&]() -> std::optional<OVError> {
        const FeedCore& core = mInternal->core();
        const NetError error = core.getLastError();
        if (error.code == 0) return std::nullopt;
        return errorWithNetError(error, textOf(core.mURL.getValue()).value_or(""));
    });
}

OVFeed::Time OVFeed::nextRefreshDate() const {
    return raising("-[OVFeed nextRefreshDate]", [&] {
        const Ref<Date> date = mInternal->core().getNextRefreshDate();
        return dateOf(date.get());
    });
}

OVFeed::Time OVFeed::lastRefreshDate() const {
    return raising("-[OVFeed lastRefreshDate]",
                   [&] { return dateOf(mInternal->core().mRefreshLocalDate.getValue()); });
}

int OVFeed::unreadCount() const {
    return raising("-[OVFeed unreadCount]", [&] { return mInternal->readUnreadCount(); });
}

OVFeed::Time OVFeed::localDateCreatedOfNewestEntry() const {
    return raising("-[OVFeed localDateCreatedOfNewestEntry]", [&] {
        return dateOf(mInternal->core().mLocalDateCreatedOfNewestEntry.getValue());
    });
}

OVFeed::Text OVFeed::identifier() const {
    return raising("-[OVFeed identifier]",
                   [&] { return textOf(mInternal->core().getIdentifier()); });
}

OVFeed::Text OVFeed::title() const {
    return raising("-[OVFeed title]", [&] { return textOf(mInternal->core().mTitle.getValue()); });
}

OVFeed::Text OVFeed::subtitle() const {
    return raising("-[OVFeed subtitle]",
                   [&] { return textOf(mInternal->core().mSubtitle.getValue()); });
}

OVFeed::Text OVFeed::rights() const {
    return raising("-[OVFeed rights]",
                   [&] { return textOf(mInternal->core().mRights.getValue()); });
}

OVFeed::Time OVFeed::dateUpdated() const {
    return raising("-[OVFeed dateUpdated]",
                   [&] { return dateOf(mInternal->core().mDateUpdated.getValue()); });
}

OVFeed::Text OVFeed::timeZoneUpdated() const {
    return raising("-[OVFeed timeZoneUpdated]",
                   [&] { return textOf(mInternal->core().mTimeZoneUpdated.getValue()); });
}

OVFeed::Text OVFeed::URL() const {
    return raising("-[OVFeed URL]", [&] { return textOf(mInternal->core().mURL.getValue()); });
}

OVFeed::Text OVFeed::alternateURL() const {
    return raising("-[OVFeed alternateURL]",
                   [&] { return textOf(mInternal->core().mAlternateURL.getValue()); });
}

OVFeed::Text OVFeed::iconURL() const {
    return raising("-[OVFeed iconURL]",
                   [&] { return textOf(mInternal->core().mIconURL.getValue()); });
}

OVFeed::Text OVFeed::logoURL() const {
    return raising("-[OVFeed logoURL]",
                   [&] { return textOf(mInternal->core().mLogoURL.getValue()); });
}

OVFeed::Text OVFeed::redirectedURL() const {
    return raising("-[OVFeed redirectedURL]",
                   [&] { return textOf(mInternal->core().mRedirectedURL.getValue()); });
}

OVFeed::Time OVFeed::localDateUpdated() const {
    return raising("-[OVFeed localDateUpdated]",
                   [&] { return dateOf(mInternal->core().mLocalDateUpdated.getValue()); });
}

int OVFeed::feedFormat() const {
    return raising("-[OVFeed feedFormat]",
                   [&] { return mInternal->core().mFeedFormat.getValue(); });
}

bool OVFeed::isEqual(const OVObject* other) const {
    const auto* feed = dynamic_cast<const OVFeed*>(other);
    return feed && IsEqual(mInternal->_feedCore(), feed->mInternal->_feedCore());
}

std::size_t OVFeed::hash() const {
    return mInternal->_feedCore()->getPFHashCode();
}

std::string OVFeed::description() const {
    const FeedCore* feed = mInternal->_feedCore();
    const SubscriptionCore* subscription = mInternal->_subscriptionCore();
    // No reading, as that can fail, and logs are written about failures.
    return OVFormat("%s[<%s> %qi/%qi]", "OVFeed", mInternal->getURL(), feed->getRowID(),
                    subscription ? subscription->getRowID() : 0);
}
