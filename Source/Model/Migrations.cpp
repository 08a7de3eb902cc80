#include "Model/Migrations.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Clock.h"
#include "Foundation/Logger.h"
#include "Model/ClientCore.h"
#include "Model/EnclosureCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"
#include "Model/Housekeeping.h"
#include "Model/Schema.h"
#include "Model/SubscriptionCore.h"
#include "SQLite/Exception.h"
#include "SQLite/TableOf.h"
#include "SQLite/Transaction.h"

#include <iterator>

namespace Orvane {

using Foundation::Clock;
using SQLite::gDatabase;
using SQLite::TableOf;
using SQLite::Transaction;

namespace {

template <class T>
void addColumn(const char* name, const char* declaration) {
    TableOf<T>::instance()->addColumn(name, declaration);
}

template <class T>
void addIndex(const char* name, const char* columns) {
    TableOf<T>::instance()->addIndex(name, columns);
}

void addRebuildFlagsAndFormat() {
    addColumn<FeedCore>("rebuildXml", "integer");
    addColumn<FeedCore>("feedFormat", "integer");
    addColumn<EntryCore>("rebuildXml", "integer");
}

void addTimeZones() {
    addColumn<FeedCore>("timeZoneUpdated", "integer");
    addColumn<EntryCore>("timeZoneUpdated", "integer");
    addColumn<EntryCore>("timeZonePublished", "integer");
    addColumn<EntryCore>("timeZoneCreated", "integer");
}

void changeNothing() {}

void addLinkLocalGUID() {
    addColumn<FeedCore>("linkLocalGuid", "text");
}

void addDownloadState() {
    addColumn<EnclosureCore>("downloadState", "integer");
}

void addDownloadAuditStatus() {
    addColumn<EnclosureCore>("downloadAuditStatus", "integer");
}

/// Nothing reads it.
void addMonkey() {
    addColumn<FeedCore>("monkey", "blob");
}

void addExpirationDate() {
    addColumn<SubscriptionCore>("expirationDate", "number");
}

void addUnreadCount() {
    addColumn<SubscriptionCore>("unreadCount", "integer");
    if (Housekeeping* housekeeping = Housekeeping::current()) {
        housekeeping->updateAllUnreadCountsSoon();
    }
}

void addHashes() {
    addColumn<EntryCore>("contentHash", "text");
    addColumn<EntryCore>("summaryHash", "text");
    addColumn<EntryCore>("xmlRepresentationHash", "text");
    addColumn<EntryCore>("localDateXmlChanged", "real");
    addIndex<EntryCore>("Entries_localDateXmlChanged", "localDateXmlChanged");
}

/// Every client counts as in use now, so that none is dormant at once.
void addDateUsed() {
    addColumn<ClientCore>("dateUsed", "real");
    gDatabase->execute("update Clients set dateUsed=%.3lf", Clock::current().now());
}

void exchangeIndexes() {
    for (const char* obsolete :
         {"Entries_current", "Entries_dateCreated", "Entries_datePublished", "Entries_dateUpdated",
          "Entries_draft", "Entries_edited", "Entries_feed", "Entries_flagged",
          "Entries_localDateFlagsUpdated", "Entries_localDateUpdated", "Entries_read",
          "Entries_title", "Subscriptions_client", "Subscriptions_feed"}) {
        gDatabase->dropIndex(obsolete);
    }
    addIndex<EnclosureCore>("Enclosures_autodownloads", "downloadState, downloadAuditStatus");
    addIndex<EntryCore>("Entries_tosync", "localDateFlagsUpdated");
    addIndex<EntryCore>("Entries_unreadcount", "feed, read, localDateCreated");
    addIndex<FeedCore>("Feeds_identifier", "identifier");
    addIndex<SubscriptionCore>("Subscriptions_feedandclient", "feed, client");
    addIndex<SubscriptionCore>("Subscriptions_nonbackground",
                               "client, refreshesInBackground, refreshInterval");
}

void addRecoverOldEntries() {
    addColumn<FeedCore>("recoverOldEntries", "integer");
}

void addFOAF() {
    addColumn<FeedCore>("foafUrl", "text");
}

void addEnclosureTitle() {
    addColumn<EnclosureCore>("title", "text");
}

bool vacuumsIncrementally() {
    return gDatabase->execScalar("PRAGMA auto_vacuum") == 2;
}

/// A file that is not empty gets the mode by being written anew. Where there is no room for that it
/// does without.
void setIncrementalVacuum() {
    gDatabase->execute("PRAGMA auto_vacuum = INCREMENTAL");
    if (vacuumsIncrementally()) return;
    try {
        gDatabase->execute("VACUUM");
    } catch (const SQLite::Exception& exception) {
        if (exception.isFatal()) throw;
        Foundation::doWarnAboutException(&exception, "void Orvane::setIncrementalVacuum()");
    }
}

constexpr const char* kMoveNewestDateOn =
    "UPDATE Feeds SET localDateCreatedOfNewestEntry = MAX(localDateCreatedOfNewestEntry, "
    "NEW.localDateCreated) WHERE rowID = NEW.feed";

void addDateOfNewestEntry() {
    addColumn<FeedCore>("localDateCreatedOfNewestEntry", "REAL");
    gDatabase->execute(
        "UPDATE Feeds SET localDateCreatedOfNewestEntry = (SELECT MAX(localDateCreated) FROM "
        "Entries WHERE feed = Feeds.rowID)");
    gDatabase->execute(
        "CREATE TRIGGER Update_Feeds_localDateCreatedOfNewestEntryInFeed_After_Update AFTER UPDATE "
        "OF localDateCreated ON Entries BEGIN %s; END",
        kMoveNewestDateOn);
    gDatabase->execute(
        "CREATE TRIGGER Update_Feeds_localDateCreatedOfNewestEntryInFeed_After_Insert AFTER INSERT "
        "ON Entries BEGIN %s; END",
        kMoveNewestDateOn);
}

struct Step {
    void (*run)();
    int toMinorVersion;
    bool canBeInTransaction = true;
};

constexpr Step kSteps[] = {
    {addRebuildFlagsAndFormat, 6},
    {addTimeZones, 7},
    {changeNothing, 8},
    {addLinkLocalGUID, 9},
    {addDownloadState, 10},
    {addDownloadAuditStatus, 11},
    {addMonkey, 12},
    {addExpirationDate, 13},
    {addUnreadCount, 14},
    {addHashes, 15},
    {addDateUsed, 16},
    {exchangeIndexes, 17},
    {addRecoverOldEntries, 18},
    {addFOAF, 19},
    {addEnclosureTitle, 20},
    // Writing a file anew is a transaction of its own. It may be done again.
    {setIncrementalVacuum, 21, false},
    {addDateOfNewestEntry, 22},
};
static_assert(kSteps[0].toMinorVersion == Migrations::kOldestMinorVersion + 1);
static_assert(std::end(kSteps)[-1].toMinorVersion == Schema::kMinorVersion);

void perform(const Step& step) {
    step.run();
    gDatabase->setUserVersion(Schema::kMajorVersion * 10000 + step.toMinorVersion);
}

void runStep(const Step& step) {
    if (!step.canBeInTransaction) return perform(step);
    const Transaction transaction(true);
    perform(step);
}

}  // namespace

void Migrations::run(int fromMinorVersion) {
    OV_ASSERT(fromMinorVersion >= kOldestMinorVersion);
    for (const Step& step : kSteps) {
        if (step.toMinorVersion > fromMinorVersion) runStep(step);
    }
}

}  // namespace Orvane
