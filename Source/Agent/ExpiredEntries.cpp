#include "Agent/ExpiredEntries.h"

#include "Foundation/ArrayOf.h"
#include "Foundation/Clock.h"
#include "Foundation/Guard.h"
#include "Foundation/Logger.h"
#include "Foundation/URL.h"
#include "Model/EnclosureCore.h"
#include "Model/FeedCore.h"
#include "SQLite/Cursor.h"
#include "SQLite/Database.h"
#include "Utilities/FileUtils.h"

namespace Orvane {

using Foundation::MutableArrayOf;
using Foundation::Ref;
using Foundation::URL;
using SQLite::gDatabase;

namespace {

constexpr double kGhostSeconds = 172800.0;  // 2 days

/// Adds where an entry of a feed may have its file.
void addFile(MutableArrayOf<URL>& files, SQLite::RowID feedID, Foundation::String* identifier) {
    const Ref<FeedCore> feed = FeedCore::getRow(feedID);
    // A directory is not made for files that cannot be in it.
    if (!feed.get() || !feed->getURLOfEntryXMLDir(false)) return;
    const Ref<URL> file = feed->getURLOfEntryXMLFile(identifier);
    files.add(file.get());
}

}  // namespace

// The patience of a feed is that of its most patient subscription: SQL's minimum leaves those out
// that have no date, and where one has the 0 of a subscription that never lets go, nothing expires.
ExpiredEntries::ExpiredEntries() {
    gDatabase->execute(
        "create temporary table ExpiredEntries as select rowID as "
        "entry,content,summary,xmlRepresentation, identifier,Entries.feed as feed"
        "                           from (select Feeds.rowID as feed, "
        "min(Subscriptions.expirationDate) as expirationDate"
        "                                 from Feeds, Subscriptions"
        "                                where Subscriptions.feed=Feeds.rowID"
        "                                group by Feeds.rowID) as Exps, Entries"
        "                          where Entries.feed=Exps.feed"
        "                            and localDateCreated < expirationDate"
        "                            and current=0 and flagged=0");
}

int ExpiredEntries::remove() {
    int removed = 0;
    const int entries =
        gDatabase->execute("delete from Entries where rowID in (select entry from ExpiredEntries)");
    if (entries > 0) {
        const int enclosures =
            EnclosureCore::deleteEnclosuresWhere("entry in (select entry from ExpiredEntries)");
        const int contents = removeContents();
        gLogAgent.log("Deleted %i entries, %i contents, %i enclosures", entries, contents,
                      enclosures);
        removeFiles();
        removed = entries + enclosures + contents;
    }
    gDatabase->execute("drop table ExpiredEntries");
    return removed;
}

int ExpiredEntries::removeContents() {
    return gDatabase->execute(
        "delete from Contents where rowID in (select content from ExpiredEntries)"
        "                                                           or rowID in (select summary "
        "from ExpiredEntries)"
        "                                                           or rowID in (select "
        "xmlRepresentation from ExpiredEntries)");
}

void ExpiredEntries::removeFiles() {
    const Ref<MutableArrayOf<URL>> files = MutableArrayOf<URL>::array();
    for (SQLite::Cursor cursor(gDatabase, "select feed,identifier from ExpiredEntries");
         cursor.hasRow(); cursor.nextRow()) {
        // An identifier that is no file's name must not keep all others from going.
        Foundation::callGuarded("int Orvane::AgentTask::expungeOldArticles()", [&] {
            const Ref<Foundation::String> identifier = cursor.stringColumn(1);
            const SQLite::RowID feed = cursor.int64Column(0);
            if (feed != 0 && identifier.get()) addFile(*files, feed, identifier.get());
        });
    }
    FileUtils::asyncDeleteFiles(files);
}

int ExpiredEntries::bustGhosts() {
    const int ghosts =
        gDatabase->execute("delete from Entries where feed=0 and localDateCreated<%.0lf",
                           Foundation::Clock::current().now() - kGhostSeconds);
    if (ghosts >= 1) gLogAgent.log("Busted %i ghost entries", ghosts);
    return ghosts;
}

}  // namespace Orvane
