#include "Foundation/Clock.h"
#include "Foundation/Logger.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"
#include "Model/MinistryOfTruth.h"
#include "SQLite/Transaction.h"

// How a feed goes, with all that is its own. The statements bypass the row classes: the entries
// that are in memory hear of it as of any change of the file, and no file goes one by one.

namespace Orvane {

using Foundation::Clock;
using Foundation::gLog;
using Foundation::Ref;
using SQLite::Query;
using SQLite::Transaction;

namespace {

constexpr const char* kWhere = "virtual void Orvane::FeedCore::deleteRow()";

/// Deletes rows of the feed's entries. A failure is reported, and the rest goes on.
void deleteRows(Query& query, const FeedCore& feed, const char* what) {
    try {
        const double start = Clock::current().now();
        query.bind(1, &feed);
        const auto count = static_cast<unsigned long long>(query.execute());
        gLog.log("    deleted %llu %s (duration=%.3fs)", count, what,
                 Clock::current().now() - start);
    } catch (...) {
        Foundation::warnAboutCurrentException(kWhere);
    }
}

void deleteEntryRows(const FeedCore& feed) {
    SQLite::Database* database = feed.getTable()->getDatabase();
    static auto* const sContents = new Query(
        database,
        "delete from Contents where rowID in (select c.rowID from Contents as c, Entries as e "
        "where e.feed=? and c.rowID in (e.content,e.summary,e.xmlRepresentation) )");
    static auto* const sEnclosures = new Query(
        database,
        "delete from Enclosures where rowID in (select encl.rowID from Enclosures as encl, "
        "Entries as entry where entry.feed=? and encl.entry=entry.rowID )");
    static auto* const sEntries = new Query(database, "delete from Entries where feed=?");
    deleteRows(*sContents, feed, "Contents");
    deleteRows(*sEnclosures, feed, "Enclosures");
    deleteRows(*sEntries, feed, "Entries");
}

}  // namespace

void FeedCore::deleteRow() {
    const Ref<FeedCore> self = getRefCount() > 0 ? this : nullptr;
    gLog.log("Deleting %@", this);
    removeFeeder();
    setXMLData(nullptr);
    const Transaction transaction(getTable() ? getTable()->getDatabase() : nullptr, false);
    // Entries that are not saved yet would bring the feed back with them.
    const SQLite::BasicRowIterator::NewRows newEntries = mEntries.getNewRows();
    for (const Ref<SQLite::Row>& row : newEntries) {
        auto* entry = static_cast<EntryCore*>(row.get());
        removeFromEntries(entry);
        entry->deleteRow();
    }
    if (getRowID() != 0) deleteEntryRows(*this);
    const double start = Clock::current().now();
    MinistryOfTruth::instance()->deleteTruthDirectoryForFeed(this, getURLOfEntryXMLDir(false));
    gLog.log("    delegated deletion of truth directory (duration=%.3fs)",
             Clock::current().now() - start);
    mEntryXMLDir = nullptr;
    CoreOf::deleteRow();
}

}  // namespace Orvane
