#include "Foundation/Logger.h"
#include "Model/ClientCore.h"
#include "Model/EnclosureCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"
#include "Model/SubscriptionCore.h"
#include "SQLite/Database.h"
#include "Utilities/FileUtils.h"

#include <string>

// Which enclosures are downloaded without being asked for, and which are a client's.

namespace Orvane {

using Foundation::Ref;
using SQLite::RowIterator;
using EnclosureTable = SQLite::TableOf<EnclosureCore>;

namespace {

/// The IDs of those whose download this process has started, for SQL.
std::string& attempted() {
    static std::string sIDs = "0";
    return sIDs;
}

}  // namespace

RowIterator<EnclosureCore> EnclosureCore::getEnclosures(ClientCore* client, const char* condition) {
    const auto text = SQLite::SQLText::format(
        "select distinct encl.* from Enclosures as encl, Entries as entry, Subscriptions as sub"
        "  where %s  and encl.entry = entry.rowID and entry.feed = sub.feed and sub.client = %lld"
        " order by encl.downloadState, sub.rowID, entry.rowID",
        condition ? condition : "1", client->getRowID());
    auto query = std::make_unique<SQLite::Query>(EnclosureTable::instance(), text);
    return {std::make_unique<SQLite::Cursor>(query.release(), true),
            SQLite::BasicRowIterator::NewRows()};
}

int EnclosureCore::deleteEnclosuresWhere(const char* condition) {
    EnclosureTable::instance()->uncacheRows();
    SQLite::Database* database = EnclosureTable::instance()->getDatabase();
    for (SQLite::Cursor cursor(database, "select downloadedPath from Enclosures where %s",
                               condition);
         cursor.hasRow(); cursor.nextRow()) {
        const Ref<Foundation::URL> file = cursor.urlColumn(0);
        if (!file.get()) continue;
        Foundation::gLog.log("Deleting enclosure %@", file);
        FileUtils::deleteFile(file.get());
    }
    return database->execute("delete from Enclosures where %s", condition);
}

void EnclosureCore::auditForDownload() {
    const EntryCore* entry = getEntry();
    const FeedCore* feed = entry ? entry->getFeed() : nullptr;
    bool isWanted = false;
    if (feed) {
        for (auto subscription = feed->getSubscriptions(nullptr);
             subscription.hasRow() && !isWanted; subscription.nextRow()) {
            isWanted = subscription->willAutoDownload(this);
        }
    }
    if (isWanted) gLogSub.log("Approved %@ for auto-download", this);
    mDownloadAuditStatus.setValue(isWanted ? kApproved : kNotApproved);
}

bool EnclosureCore::startAutoDownloads() {
    EnclosureTable* table = EnclosureTable::instance();
    if (!table->getDatabase()->isOpen()) return false;
    SQLite::QueryOf<EnclosureCore> query(
        table,
        "SELECT DISTINCT * FROM Enclosures    WHERE downloadAuditStatus=%i"
        "       AND downloadState NOT IN (%i,%i)       AND rowID NOT IN (%s)"
        "       AND NOT (downloadState=%i and downloadErrorDomain=%ld"
        "                and downloadErrorCode=%i)    LIMIT 2",
        int{kApproved}, int{kFinished}, int{kDeleted}, attempted(), int{kFailed}, kCancelled.domain,
        kCancelled.code);
    const Ref<Foundation::ArrayOf<EnclosureCore>> wanted = query.allRows();
    bool isAnyStarted = false;
    for (EnclosureCore* enclosure : *wanted) {
        gLogDownload.log("Starting auto-download of %@", enclosure);
        // First, so that one that cannot even be started does not stand before the others for good.
        attempted() += OVFormat(",%lli", enclosure->getRowID());
        isAnyStarted |= enclosure->download();
    }
    if (!isAnyStarted) gLogDownload.log("Found no enclosures to auto-download");
    return isAnyStarted;
}

void EnclosureCore::_forgetAutoDownloads() {
    attempted() = "0";
}

}  // namespace Orvane
