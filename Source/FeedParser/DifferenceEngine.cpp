#include "FeedParser/DifferenceEngine.h"

#include "Foundation/ArrayOf.h"
#include "Foundation/AssertionFailure.h"
#include "Foundation/Data.h"
#include "Foundation/Date.h"
#include "Foundation/Guard.h"
#include "Foundation/Logger.h"
#include "Foundation/URL.h"
#include "Model/ContentCore.h"
#include "Model/EnclosureCore.h"
#include "Model/EntryCore.h"
#include "Model/EntryUndo.h"
#include "Model/FeedCore.h"
#include "SQLite/CursorOf.h"
#include "SQLite/TableOf.h"
#include "SQLite/Transaction.h"

#include <string>
#include <utility>

namespace Orvane {

using Foundation::AutoreleasePool;
using Foundation::Data;
using Foundation::Date;
using Foundation::gLog;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;
using SQLite::Cursor;
using SQLite::CursorOf;
using SQLite::RowID;
using SQLite::TableOf;
using SQLite::Transaction;

namespace {

std::string joined(const std::vector<RowID>& rowIDs) {
    std::string text;
    for (const RowID rowID : rowIDs) {
        if (!text.empty()) text += ",";
        text += std::to_string(rowID);
    }
    return text;
}

}  // namespace

DifferenceEngine::DifferenceEngine(Ref<FeedCore> feed, bool force)
    : mFeed(std::move(feed)),
      mDatabase(mFeed->getTable() ? mFeed->getTable()->getDatabase() : nullptr),
      mForce(force) {}

DifferenceEngine::~DifferenceEngine() = default;

bool DifferenceEngine::updateFrom(const Ref<FeedCore>& newFeed) {
    gLogSub.log("DifferenceEngine updating feed %@", newFeed->mURL.getValue());
    const FeedCore::ReadState before = mFeed->getReadState();
    bool changed = false;
    try {
        changed = merge(*newFeed);
    } catch (...) {
        giveUp();
        mFeed->setReadState(before);
        throw;
    }
    deleteFiles();
    return changed;
}

bool DifferenceEngine::merge(FeedCore& newFeed) {
    const Ref<Date> lastUpdate = mFeed->mLocalDateUpdated.getValue();
    if (!mFeed->updateFrom(&newFeed, mForce)) return false;
    const Ref<Foundation::ArrayOf<EntryCore>> entries = newFeed.getEntries(nullptr).allRows();
    mMap.addEntries(entries);
    if (mMap.isEmpty()) {
        gLog.log("DifferenceEngine: Found zero articles in %@", newFeed.mURL.getValue());
        return false;
    }
    savePending();
    const bool changed = mergeEntries();
    // The feed's own columns are new, but nothing that is dated by this.
    if (!changed) mFeed->mLocalDateUpdated.setValue(lastUpdate);
    return changed;
}

bool DifferenceEngine::mergeEntries() {
    const Transaction transaction(mDatabase, true);
    if (mDatabase) {
        archiveNonCurrentEntries();
        if (!mForce) pruneUnchangedEntries();
    }
    updateExistingEntries();
    insertNewEntries();
    if (mUpdated != 0 || mAdded != 0 || mArchived != 0) return finish();
    if (mDatabase) mDatabase->saveRowsSoon();
    return false;
}

bool DifferenceEngine::finish() {
    gLogSub.log("\tDifferenceEngine: updated %u, added %u, archived %u articles in <%@>", mUpdated,
                mAdded, mArchived, mFeed->mURL.getValue());
    mFeed->mLocalDateUpdated.setValue(Date::now());
    mFeed->updateUnreadCounts();
    if (mDatabase) mDatabase->saveRows();
    return true;
}

void DifferenceEngine::savePending() {
    if (!mDatabase) return;
    // The merge looks into the file; and what fails in it must not take along what others did.
    TableOf<EntryCore>::instance()->saveRows();
    TableOf<EnclosureCore>::instance()->saveRows();
    TableOf<ContentCore>::instance()->saveRows();
}

void DifferenceEngine::archiveNonCurrentEntries() {
    std::vector<RowID> archived;
    Cursor cursor(mDatabase,
                  "select e.rowID, e.identifier, c.data   from Entries as e, Contents as c  "
                  "where e.feed=%lld and e.current and not (e.%s)    "
                  "and e.xmlRepresentation = c.rowID",
                  mFeed->getRowID(), mMap.getIdentifiersSQL());
    for (; cursor.hasRow(); cursor.nextRow()) {
        const AutoreleasePool pool;
        archived.push_back(cursor.int64Column(0));
        const Ref<String> identifier = cursor.stringColumn(1);
        const Ref<Data> source = cursor.dataColumn(2);
        if (source.get()) mFeed->saveEntryToFile(identifier, source);
    }
    if (archived.empty()) return;
    mArchived = static_cast<std::uint32_t>(
        mDatabase->execute("update Entries set current=0 where rowID in (%s)", joined(archived)));
    for (const RowID rowID : archived) {
        // Who has the entry in memory would not see that it is in the archive.
        EntryCore* entry = TableOf<EntryCore>::instance()->cachedRowWithID(rowID);
        if (entry) entry->mCurrent._forgetLoaded();
    }
}

void DifferenceEngine::pruneUnchangedEntries() {
    Cursor cursor(mDatabase,
                  "SELECT xmlRepresentationHash FROM Entries WHERE feed=%lld and current and %s",
                  mFeed->getRowID(), mMap.getIdentifiersSQL());
    for (; cursor.hasRow(); cursor.nextRow()) {
        // By itself, whoever has it: an entry whose source another one has is unchanged as well.
        if (const char* hash = cursor.cStringColumn(0)) mMap.removeEntry(mMap.entryWithHash(hash));
    }
}

void DifferenceEngine::updateExistingEntries() {
    if (mMap.isEmpty()) return;
    if (!mDatabase) {
        for (auto entry = mFeed->getEntries(nullptr); entry.hasRow(); entry.nextRow()) {
            if (!updateExistingEntry(entry.getRow())) entry->mCurrent.setValue(false);
        }
        return;
    }
    // Of whatever feed: an identifier has the feed's in it, and an entry without a feed is found.
    const std::string known = mMap.getIdentifiersSQL();
    CursorOf<EntryCore> cursor(TableOf<EntryCore>::instance()->rowsWhere(known.c_str()));
    for (; cursor.hasRow(); cursor.nextRow()) {
        const Ref<EntryCore> entry = cursor.row();
        updateExistingEntry(entry.get());
    }
}

bool DifferenceEngine::updateExistingEntry(EntryCore* entry) {
    const AutoreleasePool pool;
    const Ref<EntryCore> newEntry = mMap.entryWithIdentifier(entry->getIdentifier());
    if (!newEntry.get()) return false;
    mTouched.emplace_back(entry);
    if (entry->getFeed()) {
        updateEntry(*entry, newEntry);
    } else {
        insertEntry(entry, newEntry);
    }
    OV_ASSERT_AS(IsEqual(entry->getIdentifier(), newEntry->getIdentifier()),
                 "IsEqual(entry->getIdentifier(),newEntry->getIdentifier())");
    mMap.removeEntry(newEntry);
    return true;
}

void DifferenceEngine::updateEntry(EntryCore& entry, EntryCore* newEntry) {
    if (!entry.mCurrent) {
        mFilesToDelete.emplace_back(entry.getIdentifier());
        // Here, so that its file stays until the merge is saved.
        entry.mCurrent.setValue(true);
    }
    if (entry.updateFrom(newEntry, true)) ++mUpdated;
}

void DifferenceEngine::insertNewEntries() {
    while (const Ref<EntryCore> newEntry = mMap.last()) {
        const AutoreleasePool pool;
        const Ref<EntryCore> fresh = Returner<EntryCore>::adopted(new EntryCore);
        mTouched.push_back(fresh);
        insertEntry(fresh, newEntry);
        mMap.removeEntry(newEntry);
    }
}

void DifferenceEngine::insertEntry(EntryCore* entry, EntryCore* newEntry) {
    mFeed->addToEntries(entry);
    entry->mCurrent.setValue(true);
    entry->updateFrom(newEntry, true);
    ++mAdded;
    if (mDatabase) entry->addToTable(TableOf<EntryCore>::instance());
    entry->assertIdentifier(newEntry->getIdentifier(), "newEntry");
}

void DifferenceEngine::deleteFiles() {
    if (!mDatabase) return;
    // Behind the commit: until then the archive needs them.
    for (const Ref<String>& identifier : mFilesToDelete) {
        Foundation::callGuarded("void Orvane::DifferenceEngine::deleteFiles()",
                                [&] { mFeed->deleteEntryFile(identifier); });
    }
}

void DifferenceEngine::giveUp() {
    if (!mDatabase) return;
    for (const Ref<EntryCore>& entry : mTouched) {
        Foundation::callGuarded("void Orvane::DifferenceEngine::giveUp()",
                                [&] { EntryUndo::giveUp(entry); });
    }
}

}  // namespace Orvane
