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
#include "Model/SyncPlanner.h"
#include "SQLite/Database.h"
#include "SQLite/Transaction.h"

namespace Orvane {

using Foundation::AutoreleasePool;
using Foundation::Data;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;
using Foundation::URL;

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
    unsigned changed = 0;
    for (const std::int64_t entry : entries) {
        const AutoreleasePool pool;
        EntryCore* row = EntryCore::getRow(entry);
        const bool isRead = read < 0 ? row->mRead.getValue() : read > 0;
        const bool isFlagged = flagged < 0 ? row->mFlagged.getValue() : flagged > 0;
        if (row->changeFlags(isRead, isFlagged, true)) ++changed;
    }
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
