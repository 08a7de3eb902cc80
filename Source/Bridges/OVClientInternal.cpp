#include "Bridges/OVClientInternal.h"

#include "Bridges/Barriers.h"
#include "Bridges/ClientDelegates.h"
#include "Bridges/OVEnclosureInternal.h"
#include "Bridges/OVEntryInternal.h"
#include "Bridges/OVFeedInternal.h"
#include "Bridges/PublicObject.h"
#include "Bridges/PublicValues.h"
#include "Foundation/DistributedNotificationCenter.h"
#include "Foundation/Guard.h"
#include "Foundation/NotificationNames.h"
#include "Foundation/Number.h"
#include "Model/EnclosureCore.h"
#include "Model/FeedCore.h"
#include "Model/SubscriptionCore.h"
#include "Model/UpdatedEntryIterator.h"
#include "SQLite/ChangeSet.h"

#include <Orvane/OVNotificationCenter.h>

#include <charconv>

using namespace Foundation;
using namespace Orvane;

namespace Names = Foundation::NotificationNames;
using SQLite::TableOf;

namespace {

std::vector<std::string_view> splitAtCommas(std::string_view text) {
    std::vector<std::string_view> parts;
    for (;;) {
        const std::size_t end = text.find(',');
        parts.push_back(text.substr(0, end));
        if (end == std::string_view::npos) return parts;
        text.remove_prefix(end + 1);
    }
}

/// 0 for what is no number.
long long numberOf(std::string_view text) {
    long long number = 0;
    std::from_chars(text.data(), text.data() + text.size(), number);
    return number;
}

}  // namespace

OVClientInternal::OVClientInternal() {
    const AutoreleasePool pool;
    dateLastUpdated = Date::now();
}

OVClientInternal::~OVClientInternal() {
    callGuarded("OVClientInternal::~OVClientInternal()", [this] {
        stopObserving();
        ClientDelegates::set(getOwner(), nullptr);
        dateLastUpdated = nullptr;
    });
}

void OVClientInternal::_initWithCore(ClientCore* core, OVObject* owner) {
    mSignature = textOf(core->mSignature.getValue()).value_or("");
    setCore(core, owner);
    gLogAPIVerbose.log("INIT %@", owner);
    observe();
    mRefreshTimer.start(kRefreshDelaySeconds, false);
}

std::shared_ptr<OVClient>& OVClientInternal::applicationClient() {
    // Never destroyed: it lives as long as the process.
    static auto* const sClient = new std::shared_ptr<OVClient>;
    return *sClient;
}

void OVClientInternal::observe() {
    NotificationCenter* local = NotificationCenter::getLocal();
    local->addObserver(&mTableObserver, SQLite::Table::kRowsChangedNotification,
                       TableOf<EntryCore>::instance());
    local->addObserver(&mTableObserver, SQLite::Table::kRowsChangedNotification,
                       TableOf<SubscriptionCore>::instance());
    NotificationCenter* distributed = NotificationCenter::getDistributed();
    for (const NotificationName* name :
         {&Names::kFeedBeganUpdateDist, &Names::kFeedEndedUpdateDist,
          &Names::kEnclosureDownloadStarted, &Names::kEnclosureDownloadProgress,
          &Names::kEnclosureDownloadEnded}) {
        distributed->addObserver(&mFeedObserver, *name, nullptr);
    }
}

void OVClientInternal::stopObserving() {
    NotificationCenter::getLocal()->removeObserver(&mTableObserver);
    NotificationCenter* distributed = NotificationCenter::getDistributed();
    distributed->removeObserver(&mFeedObserver);
}

std::shared_ptr<OVClient> OVClientInternal::self() const {
    return std::static_pointer_cast<OVClient>(getOwner()->shared_from_this());
}

Ref<Core> OVClientInternal::findAgain() {
    const Ref<String> signature = stringOf(mSignature);
    const Ref<ClientCore> again = ClientCore::existingClientWithSignature(signature.get());
    return Ref<Core>(again);
}

// What is announced in this process, and by the agent. Handled in the loop's next turn: all of one
// commit has been announced by then, and the application is not called from inside the row store.

void OVClientInternal::tableChanged(Notification* notification) {
    const AutoreleasePool pool;
    try {
        noteTableChange(*notification);
    } catch (const std::exception& exception) {
        gWarn.log("OVClient: Exception handling table change: %s", exception.what());
    } catch (...) {
        gWarn.log("OVClient: Exception handling table change: %s", "of an unknown kind");
    }
}

void OVClientInternal::noteTableChange(const Notification& notification) {
    if (notification.getObject<SQLite::Table>() != TableOf<EntryCore>::instance()) {
        mSubscriptionChanges.emplace_back(notification.info);
        if (!mSubscriptionsTimer.isRunning()) mSubscriptionsTimer.start(0.0, false);
    } else if (tracksEntryChanges) {
        gLogAPI.log("%@ notified of updated entries!", getOwner());
        if (!mChangesTimer.isRunning()) mChangesTimer.start(0.0, false);
    } else {
        gLogAPI.log("%@ ignoring entry updates (tracksEntryChanges is off)", getOwner());
    }
}

void OVClientInternal::feedNotified(Notification* notification) {
    try {
        const auto* sender = notification->getObject<String>();
        catchUp();
        if (!isLost()) _handleFeedNotification(notification->name->view(), String::view(sender));
    } catch (const std::exception& exception) {
        gWarn.log("OVClient: Exception handling feed/encl change: %s", exception.what());
    } catch (...) {
        gWarn.log("OVClient: Exception handling feed/encl change: %s", "of an unknown kind");
    }
}

void OVClientInternal::_refreshNonBackgroundSubscriptions() {
    gLogAPI.log("%@: refreshNonBackgroundSubscriptions", getOwner());
    catchUp();
    core().refreshNonBackgroundSubscriptions();
}

void OVClientInternal::_sendChanges() {
    const std::shared_ptr<OVClient> keep = self();
    catchUp();
    const Ref<Date> since = dateLastUpdated;
    sendChangesSinceDate(since.get());
}

void OVClientInternal::handleSubscriptions() {
    const std::shared_ptr<OVClient> keep = self();
    const auto all = std::exchange(mSubscriptionChanges, {});
    catchUp();
    for (const Ref<Dictionary>& changes : all) {
        if (changes.get()) _handleSubscriptionNotification(*changes);
    }
}

void OVClientInternal::_handleSubscriptionNotification(const Dictionary& changes) {
    gLogAPI.log("%@ checking subscriptions for changes", getOwner());
    std::vector<std::shared_ptr<OVFeed>> feeds;
    for (const auto& [key, value] : changes) {
        if (Number::getInteger(dynamic_cast<const Number*>(value)) != SQLite::ChangeAction::kUpdate)
            continue;
        const SQLite::RowID rowID = String::toLongLong(dynamic_cast<const String*>(key));
        SubscriptionCore* row = TableOf<SubscriptionCore>::instance()->cachedRowWithID(rowID);
        // Nobody has asked an object for its count that is not there.
        if (!row || !row->getExistingOVObject() || row->isClientSettings()) continue;
        if (row->getClient() == peek()) feeds.push_back(publicObject<OVFeed>(row));
    }
    for (const std::shared_ptr<OVFeed>& feed : feeds) {
        callGuarded("-[OVClient _handleSubscriptionNotification:]",
                    [&] { feed->_internal()._checkForUnreadCountChange(); });
    }
}

void OVClientInternal::_handleFeedNotification(std::string_view name, std::string_view sender) {
    const std::shared_ptr<OVClient> keep = self();
    gLogAPI.log("%@ notified: %s", getOwner(), name);
    const std::vector<std::string_view> parts = splitAtCommas(sender);
    const SQLite::RowID feedID = numberOf(parts[0]);
    // 0 would find the client's settings.
    if (feedID <= 0) return;
    const Ref<SubscriptionCore> subscription = core().getSubscriptionWithFeedRowID(feedID);
    FeedCore* feedCore = subscription.get() ? subscription->getFeed() : nullptr;
    if (!feedCore) return;
    feedCore->unload();
    const std::shared_ptr<OVFeed> feed = publicObject<OVFeed>(subscription.get());
    if (name == Names::kFeedBeganUpdateDist.text()) {
        gLogAPI.log("%@: %@ began refresh", getOwner(), feed.get());
        feed->_internal()._beginRefresh();
    } else if (name == Names::kFeedEndedUpdateDist.text()) {
        gLogAPI.log("%@: %@ ended refresh", getOwner(), feed.get());
        feed->_internal()._endRefresh();
    } else {
        _handleDownloadNotification(parts, name != Names::kEnclosureDownloadProgress.text());
    }
}

void OVClientInternal::_handleDownloadNotification(const std::vector<std::string_view>& parts,
                                                   bool reload) {
    const SQLite::RowID rowID = parts.size() > 1 ? numberOf(parts[1]) : 0;
    TableOf<EnclosureCore>* table = TableOf<EnclosureCore>::instance();
    if (rowID <= 0 || !Core::_isInFile(table, rowID)) return;
    const Ref<EnclosureCore> row = table->rowWithID(rowID);
    if (reload) row->unload();
    row->setDownloadedBytes(parts.size() > 2 ? numberOf(parts[2]) : 0);
    const std::shared_ptr<OVEnclosure> enclosure = publicObject<OVEnclosure>(row.get());
    enclosure->_internal()._setClient(self());
    gLogAPI.log("%@: download status changed (state=%i, bytes=%lld, progress=%.3f)",
                enclosure.get(), row->mDownloadState.getValue(),
                parts.size() > 2 ? numberOf(parts[2]) : 0, row->getDownloadProgress());
    OVNotificationCenter::defaultCenter().post(
        {OVEnclosureDownloadStateDidChangeNotification, enclosure, {}});
}

// Changes of entries.

void OVClientInternal::sendChangesSinceDate(Date* date) {
    const std::shared_ptr<OVClient> keep = self();
    gLogAPI.log("%@ sendChangesSinceDate: %@ ...", getOwner(), date);
    OnceList<std::shared_ptr<OVFeed>> changed;
    const Ref<Date> newDate = collectChanges(date, changed);
    for (const std::shared_ptr<OVFeed>& feed : changed.take()) {
        callGuarded("-[OVClient sendChangesSinceDate:]",
                    [&] { feed->_internal()._sendEntryNotifications(); });
    }
    dateLastUpdated = newDate;
    gLogAPI.log("...end sendChangesSinceDate -- new dateLastUpdated = %@", dateLastUpdated);
}

namespace {

/// Lets the feed remember what has happened to the entry that the iterator stands on.
void remember(const UpdatedEntryIterator& each, const Date* since, OVFeedInternal& feed,
              const std::shared_ptr<OVEntry>& entry) {
    const Date* created = each.getEntry()->mLocalDateCreated.getValue();
    if (each.hasExpired()) {
        // For the application that is the same as being gone.
        feed._rememberDeletedEntry(entry->identifier().value_or(""));
    } else if (created && (!since || created->compare(*since) > 0)) {
        feed._rememberAddedEntry(entry);
    } else {
        if (each.hasUpdatedContent()) feed._rememberUpdatedEntry(entry);
        if (each.hasUpdatedFlags()) feed._rememberFlaggedEntry(entry);
    }
}

}  // namespace

/// The feeds in which something has changed. Gives the date of the last change; where not all could
/// be read, the date that there was, for the next time.
Ref<Date> OVClientInternal::collectChanges(Date* since, OnceList<std::shared_ptr<OVFeed>>& feeds) {
    try {
        UpdatedEntryIterator each(&core(), since);
        for (; each.getEntry(); ++each) {
            const AutoreleasePool pool;
            const std::shared_ptr<OVEntry> entry = publicObject<OVEntry>(each.getEntry());
            const std::shared_ptr<OVFeed> feed = publicObject<OVFeed>(each.getSubscription());
            entry->_internal()._setFeed(feed);
            gLogAPI.log("    found %@", entry.get());
            remember(each, since, feed->_internal(), entry);
            feeds.add(feed);
        }
        return each.getMaxDate();
    } catch (...) {
        warnAboutCurrentException("-[OVClient sendChangesSinceDate:]");
        return since;
    }
}
