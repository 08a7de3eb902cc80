#include "Bridges/Barriers.h"
#include "Bridges/EntryQueryStatement.h"
#include "Bridges/OVClientInternal.h"
#include "Bridges/OVEnclosureInternal.h"
#include "Bridges/OVEntryInternal.h"
#include "Bridges/OVFeedInternal.h"
#include "Bridges/PublicObject.h"
#include "Bridges/PublicValues.h"
#include "Bridges/RowBatches.h"
#include "Model/AgentLink.h"
#include "Model/EnclosureCore.h"
#include "Model/EntryCore.h"
#include "Model/SubscriptionCore.h"

#include <Orvane/OVClient.h>

using namespace Foundation;
using namespace Orvane;

// What a client has: feeds, entries and enclosures.

namespace {

void refreshUnforced(const std::vector<SQLite::RowID>& feeds) {
    inBatches(feeds, [](const SQLite::RowID* rowIDs, unsigned count) {
        AgentLink::current().refreshMultiple(rowIDs, count, false);
    });
}

std::vector<SQLite::RowID> feedsOf(const ClientCore& client) {
    std::vector<SQLite::RowID> feeds;
    for (auto each = client.getSubscriptions("feed != 0"); each.hasRow(); each.nextRow()) {
        feeds.push_back(each->mFeed.getRowID());
    }
    return feeds;
}

std::vector<std::shared_ptr<OVEnclosure>> enclosuresOf(const OVClientInternal& client,
                                                       const char* condition) {
    std::vector<std::shared_ptr<OVEnclosure>> all;
    for (auto each = EnclosureCore::getEnclosures(&client.core(), condition); each.hasRow();
         each.nextRow()) {
        const AutoreleasePool pool;
        all.push_back(publicObject<OVEnclosure>(each.getRow()));
        all.back()->_internal()._setClient(client.self());
    }
    return all;
}

}  // namespace

std::vector<std::shared_ptr<OVFeed>> OVClient::feeds() const {
    return reporting("-[OVClient feeds]", [&] {
        ClientCore& core = mInternal->core();
        core.prefetchFeeds();
        std::vector<std::shared_ptr<OVFeed>> all;
        for (auto each = core.getSubscriptions("feed != 0"); each.hasRow(); each.nextRow()) {
            const AutoreleasePool pool;
            all.push_back(publicObject<OVFeed>(each.getRow()));
        }
        return all;
    });
}

bool OVClient::addFeed(const std::shared_ptr<OVFeed>& feed) {
    requireParameter(feed != nullptr, "-[OVClient addFeed:]", "feed");
    return reporting("-[OVClient addFeed:]",
                     [&] { return feed->_internal()._addToClient(mInternal->core()); });
}

std::shared_ptr<OVFeed> OVClient::addFeedWithURL(const std::string& url,
                                                 std::optional<OVError>* error) {
    return reporting(
        "-[OVClient addFeedWithURL:]",
        [&] {
            const Ref<Foundation::URL> location = urlOf(url);
            const Ref<SubscriptionCore> made =
                mInternal->core().createSubscription(location.get(), nullptr);
            return publicObject<OVFeed>(made.get());
        },
        error);
}

bool OVClient::removeFeed(const std::shared_ptr<OVFeed>& feed) {
    const std::shared_ptr<OVClient> owner = feed ? feed->client() : nullptr;
    if (!feed || (owner && owner.get() != this)) return false;
    return reporting("-[OVClient removeFeed:]", [&] { return feed->_internal()._remove(); });
}

std::shared_ptr<OVFeed> OVClient::feedWithURL(const std::string& url) const {
    return reporting("-[OVClient feedWithURL:]", [&] {
        const Ref<Foundation::URL> location = urlOf(url);
        const Ref<SubscriptionCore> found = mInternal->core().getSubscription(location.get());
        return publicObject<OVFeed>(found.get());
    });
}

std::shared_ptr<OVFeed> OVClient::feedWithIdentifier(const std::string& identifier) const {
    return reporting("-[OVClient feedWithIdentifier:]", [&] {
        const Ref<String> text = stringOf(identifier);
        const Ref<SubscriptionCore> found =
            mInternal->core().getSubscriptionWithFeedIdentifier(text.get());
        return publicObject<OVFeed>(found.get());
    });
}

void OVClient::refreshFeeds() {
    changing("refreshFeeds", [&] {
        refreshUnforced(feedsOf(mInternal->core()));
        return true;
    });
}

void OVClient::refreshFeeds(const std::vector<std::shared_ptr<OVFeed>>& feeds) {
    changing("refreshFeeds", [&] {
        std::vector<SQLite::RowID> ids;
        for (const std::shared_ptr<OVFeed>& feed : feeds) {
            if (!feed) continue;
            if (feed->_internal()._subscriptionCore()) {
                ids.push_back(feed->_internal().core().getRowID());
            } else {
                feed->refresh();
            }
        }
        refreshUnforced(ids);
        return true;
    });
}

std::shared_ptr<OVEntry> OVClient::entryWithIdentifier(const std::string& identifier) const {
    return reporting("-[OVClient entryWithIdentifier:]", [&] {
        const Ref<String> text = stringOf(identifier);
        Ref<SubscriptionCore> subscription;
        const Ref<EntryCore> core =
            mInternal->core().getEntryWithIdentifier(text.get(), subscription);
        std::shared_ptr<OVEntry> entry = publicObject<OVEntry>(core.get());
        if (entry) entry->_internal()._setFeed(publicObject<OVFeed>(subscription.get()));
        return entry;
    });
}

OVEntry::List OVClient::entries(const OVEntryQuery& query) const {
    return raising("-[OVClient entries:]", [&] {
        const EntryQueryStatement statement(mInternal->core(), query);
        OVEntry::List all;
        const std::shared_ptr<OVClient> client = mInternal->self();
        statement.walk([&](EntryCore* row) {
            all.push_back(publicObject<OVEntry>(row));
            // Which of the client's feeds it is of is found out when somebody asks.
            all.back()->_internal()._setClient(client);
        });
        return all;
    });
}

std::size_t OVClient::entryCount(const OVEntryQuery& query) const {
    return raising("-[OVClient entryCount:]",
                   [&] { return EntryQueryStatement(mInternal->core(), query).count(); });
}

void OVClient::expireAllEntries() {
    changing("expireAllEntries", [&] {
        mInternal->core().expireAllEntries();
        return true;
    });
}

std::vector<std::shared_ptr<OVEnclosure>> OVClient::enclosures() const {
    return reporting("-[OVClient enclosures]", [&] { return enclosuresOf(*mInternal, nullptr); });
}

std::vector<std::shared_ptr<OVEnclosure>> OVClient::enclosuresBeingDownloaded() const {
    return reporting("-[OVClient enclosuresBeingDownloaded]",
                     [&] { return enclosuresOf(*mInternal, "encl.downloadState in (1,2)"); });
}
