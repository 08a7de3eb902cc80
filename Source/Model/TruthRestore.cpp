#include "Model/TruthRestore.h"

#include "Foundation/ArrayOf.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Clock.h"
#include "Foundation/Date.h"
#include "Foundation/Dictionary.h"
#include "Foundation/Logger.h"
#include "Foundation/Number.h"
#include "Model/AuthorCore.h"
#include "Model/ClientsPlist.h"
#include "Model/ContentCore.h"
#include "Model/EnclosureCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"
#include "SQLite/Exception.h"
#include "SQLite/Query.h"
#include "SQLite/TableOf.h"
#include "SQLite/Transaction.h"
#include "Utilities/FileSystem.h"
#include "Utilities/FileUtils.h"

namespace Orvane {

using namespace Foundation;
using SQLite::gDatabase;
using SQLite::gLogTruth;
using SQLite::Query;
using SQLite::RowID;
using SQLite::TableOf;

namespace {

constexpr int kConstraint = 19;  // SQLITE_CONSTRAINT

String* text(const Dictionary& item, const char* key) {
    return item.getAs<String>(key);
}

long long integer(const Dictionary& item, const char* key) {
    return Number::getInteger(item.getAs<Number>(key));
}

double real(const Dictionary& item, const char* key) {
    return Number::getReal(item.getAs<Number>(key));
}

int flag(const Dictionary& item, const char* key) {
    return Number::getBool(item.getAs<Number>(key)) ? 1 : 0;
}

void insertClient(Query& query, RowID id, const Dictionary& item) {
    String* signature = text(item, ClientsPlist::kSignature);
    gLogTruth.log("    Client \"%@\"", signature);
    Ref<Date> used = item.getAs<Date>(ClientsPlist::kDateUsed);
    if (!used) used = Date::now();
    query.bindRowID(1, id);
    query.bind(2, signature);
    query.bind(3, flag(item, ClientsPlist::kPrivate));
    query.bind(4, used.get());
    query.execute();
}

void insertFeed(Query& query, RowID id, const Dictionary& item) {
    String* url = text(item, ClientsPlist::kURL);
    gLogTruth.log("    feed \"%@\"", url);
    query.bindRowID(1, id);
    query.bind(2, url);
    query.bind(3, text(item, ClientsPlist::kLogin));
    query.execute();
}

void insertSubscription(Query& query, RowID id, const Dictionary& item) {
    gLogTruth.log("    subscription #%lld", id);
    query.bindRowID(1, id);
    query.bindRowID(2, integer(item, ClientsPlist::kClient));
    query.bindRowID(3, integer(item, ClientsPlist::kFeed));
    query.bind(4, real(item, ClientsPlist::kRefreshInterval));
    query.bind(5, real(item, ClientsPlist::kExpirationInterval));
    query.bind(6, flag(item, ClientsPlist::kRefreshesInBackground));
    query.bind(7, flag(item, ClientsPlist::kDownloadsEnclosures));
    query.bind(8, real(item, ClientsPlist::kMaxEnclosureSize));
    query.bind(9, text(item, ClientsPlist::kEnclosureTypes));
    query.execute();
}

/// Calls `insert` for each item of the dictionary `name`, with its row ID.
template <class Insert>
void insertEach(const Dictionary& root, const char* name, Query& query, Insert insert) {
    const auto* items = root.getAs<Dictionary>(name);
    if (!items) return;
    for (const auto& [key, value] : *items) {
        const AutoreleasePool pool;
        const auto* item = dynamic_cast<const Dictionary*>(value);
        if (!item) continue;
        try {
            insert(query, String::toLongLong(dynamic_cast<const String*>(key)), *item);
        } catch (const SQLite::Exception& exception) {
            if ((exception.getCode() & 0xFF) != kConstraint) throw;
            doWarnAboutException(&exception,
                                 "bool Orvane::MinistryOfTruth::restoreSubscriptions()");
        }
    }
}

/// The rebuilt database knows nothing of the files in it.
void moveDownloadsAway() {
    const Ref<URL> downloads{Compatibility::FileSystem::getStorageEnclosuresURL()};
    NetError error;
    if (FileUtils::exists(downloads) && !FileUtils::moveToTrash(downloads, error)) {
        gWarn.log("Unable to move <%@> to trash: %@", downloads, error);
    }
}

/// Lets go of what is in memory of entries and what belongs to them, of which nothing may be left
/// to save. The open transaction keeps every row that it has saved: tables that knew them all would
/// look through ever more of them at each save.
void forgetRows() {
    gDatabase->saveRows();
    TableOf<EntryCore>::instance()->uncacheRows();
    TableOf<EnclosureCore>::instance()->uncacheRows();
    TableOf<AuthorCore>::instance()->uncacheRows();
    TableOf<ContentCore>::instance()->uncacheRows();
}

void restoreEntriesOf(FeedCore& feed) {
    const double start = Clock::current().now();
    gLog.log("Restoring entries of <%@> from saved XML files...", feed.mURL.getValue());
    feed.recoverFromXMLData();
    gLog.log("...Finished restoring entries in %.2f sec", Clock::current().now() - start);
}

/// There is nothing left in memory that would have to know.
void markAllAsSeen() {
    gDatabase->execute("update Entries set read=1");
    gDatabase->execute("update Subscriptions set unreadCount=0");
    gDatabase->execute("update Enclosures set downloadAuditStatus=2");
}

}  // namespace

void TruthRestore::insertSubscriptions(const Dictionary* root) {
    const SQLite::Transaction transaction(true);
    Query client(gDatabase,
                 "insert into Clients (rowID,signature,private,dateUsed) values (?,?,?,?)");
    insertEach(*root, ClientsPlist::kClients, client, insertClient);
    Query feed(gDatabase, "insert into Feeds (rowID,URL,login) values (?,?,?)");
    insertEach(*root, ClientsPlist::kFeeds, feed, insertFeed);
    Query subscription(
        gDatabase,
        "insert into Subscriptions (rowID,client,feed, "
        "refreshInterval,expirationInterval,refreshesInBackground,downloadsEnclosures,"
        "maxEnclosureSize,enclosureTypesString) values (?,?,?,?,?,?,?,?,?)");
    insertEach(*root, ClientsPlist::kSubscriptions, subscription, insertSubscription);
}

void TruthRestore::restoreEntries() {
    gLog.log("----BEGIN restoreEntries");
    moveDownloadsAway();
    const auto query = TableOf<FeedCore>::instance()->allRows();
    const Ref<ArrayOf<FeedCore>> feeds = query->allRows();
    for (FeedCore* feed : *feeds) {
        const AutoreleasePool pool;
        restoreEntriesOf(*feed);
        forgetRows();
    }
    markAllAsSeen();
    gLog.log("----END restoreEntries");
}

}  // namespace Orvane
