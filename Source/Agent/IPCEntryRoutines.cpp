// What clients ask for entries, their enclosures and authors.

#include "Agent/IPCRoutines.h"
#include "Agent/IPCValues.h"
#include "Agent/SetColumn.h"
#include "Foundation/AutoreleasePool.h"
#include "Foundation/Data.h"
#include "Foundation/Logger.h"
#include "Model/AgentLink.h"
#include "Model/AuthorCore.h"
#include "Model/EnclosureCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"
#include "Model/SyncPlanner.h"
#include "SQLite/Database.h"
#include "SQLite/Transaction.h"

#include <map>
#include <vector>

namespace Orvane {

using Foundation::AutoreleasePool;
using Foundation::Data;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;
using Foundation::URL;

namespace {

/// All of them, before any is changed: a call that is refused for one that is not there must leave
/// nothing behind that the next call would save.
std::vector<Ref<EntryCore>> rowsOf(IPCRowIDs entries) {
    std::vector<Ref<EntryCore>> rows;
    rows.reserve(entries.size());
    for (const std::int64_t entry : entries) {
        const AutoreleasePool pool;
        rows.emplace_back(EntryCore::getRow(entry));
    }
    return rows;
}

/// How many have changed. Those that are unread are counted once for each feed: to count them for
/// each entry takes minutes where a client marks all of a long feed.
unsigned changeFlags(const std::vector<Ref<EntryCore>>& rows, std::int32_t read,
                     std::int32_t flagged) {
    std::map<SQLite::RowID, Ref<FeedCore>> feeds;
    unsigned changed = 0;
    for (const Ref<EntryCore>& row : rows) {
        const AutoreleasePool pool;
        const bool wasRead = row->mRead;
        const bool isRead = read < 0 ? wasRead : read > 0;
        const bool isFlagged = flagged < 0 ? row->mFlagged.getValue() : flagged > 0;
        if (row->changeFlags(isRead, isFlagged, false)) ++changed;
        FeedCore* feed = isRead != wasRead ? row->getFeed() : nullptr;
        if (feed) feeds.try_emplace(feed->getRowID(), feed);
    }
    for (const auto& [rowID, feed] : feeds) {
        const AutoreleasePool pool;
        feed->updateUnreadCounts();
    }
    return changed;
}

}  // namespace

void ipc_impl_entry_setContent(std::int64_t entry, const std::string& column, IPCBytes text,
                               IPCBytes data) {
    EntryCore* row = EntryCore::getRow(entry);
    const Ref<String> type = getLongString(text);
    Ref<Data> bytes;
    if (!data.empty()) bytes = Data::data(data.data(), data.size());
    row->setContentColumn(column.c_str(), type, bytes);
}

void ipc_impl_entry_setAuthor(std::int64_t entry, std::int64_t author) {
    EntryCore* row = EntryCore::getRow(entry);
    row->setAuthor(author == 0 ? nullptr : AuthorCore::getRow(author));
}

void ipc_impl_entries_setflags(IPCRowIDs entries, std::int32_t read, std::int32_t flagged) {
    const SQLite::Transaction transaction(true);
    const unsigned changed = changeFlags(rowsOf(entries), read, flagged);
    gLogIPC.log("setFlags: Changed %u of %u entries to (read=%i, flagged=%i)", changed,
                static_cast<unsigned>(entries.size()), read, flagged);
    if (SyncPlanner* planner = SyncPlanner::current()) planner->autoSyncSoon();
}

void ipc_impl_enclosure_action(std::int64_t enclosure, std::int32_t action, std::int32_t& handled) {
    EnclosureCore* row = EnclosureCore::getRow(enclosure);
    switch (action) {
        case AgentLink::kDownload:
            row->download();
            break;
        case AgentLink::kCheck:
            row->checkDownload();
            break;
        case AgentLink::kCancel:
            row->cancelDownload();
            break;
        case AgentLink::kDelete:
            row->deleteDownload();
            break;
        default:
            break;
    }
    handled = 1;
}

void ipc_impl_author_create(IPCBytes name, IPCBytes email, IPCBytes url,
                            const std::string& contactBookUid, std::int64_t& author) {
    const Ref<AuthorCore> made = Returner<AuthorCore>::adopted(new AuthorCore);
    const Ref<String> nameText = getLongString(name);
    const Ref<String> emailText = getLongString(email);
    const Ref<URL> homepage = getURL(url);
    const Ref<String> uid = getCString255(contactBookUid);
    made->mName.setValue(nameText);
    made->mEmail.setValue(emailText);
    made->mURL.setValue(homepage);
    made->mContactBookUID.setValue(uid);
    author = 0;
    if (!homepage.get() && !nameText.get() && !emailText.get()) return;
    const Ref<AuthorCore> stored = made->addToDatabase();
    SQLite::gDatabase->saveRows();
    author = stored->getRowID();
}

void ipc_impl_author_setContactBookUID(std::int64_t author, const std::string& uid) {
    const Ref<String> text = getCString255(uid);
    AuthorCore::getRow(author)->mContactBookUID.setValue(text);
}

void ipc_impl_entry_setRead(std::int64_t entry, bool value) {
    setColumn<EntryCore>(entry, EntryCore::Read, [&](EntryCore& row) { row.setRead(value); });
}

void ipc_impl_entry_setFlagged(std::int64_t entry, bool value) {
    setColumn<EntryCore>(entry, EntryCore::Flagged, [&](EntryCore& row) { row.setFlagged(value); });
}

}  // namespace Orvane
