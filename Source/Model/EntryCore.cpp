#include "Model/EntryCore.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Guard.h"
#include "Foundation/Logger.h"
#include "Foundation/NetException.h"
#include "Model/AgentLink.h"
#include "Model/AuthorCore.h"
#include "Model/ContentCore.h"
#include "Model/EnclosureCore.h"
#include "Model/FeedCore.h"
#include "Model/PublicObjects.h"
#include "Model/SyncPlanner.h"
#include "SQLite/Database.h"
#include "SQLite/Transaction.h"

namespace Orvane {

using Foundation::Date;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;

OVObject* EntryCore::createOVObject() {
    return PublicObjects::makeFor(this);
}

Returner<EntryCore> EntryCore::getEntryWithIdentifier(String* identifier) {
    OV_ASSERT_AS(identifier != nullptr, "identifier");
    static auto* const sQuery =
        SQLite::TableOf<EntryCore>::instance()->rowsWhere("identifier = ?").release();
    sQuery->bind(1, identifier);
    return sQuery->firstRow();
}

Returner<EntryCore> EntryCore::createGhostEntry(String* identifier) {
    Ref<EntryCore> ghost = Returner<EntryCore>::adopted(new EntryCore);
    ghost->mIdentifier.setValue(identifier);
    ghost->mLocalDateCreated.setValue(Date::now());
    ghost->mCurrent.setValue(true);
    return ghost;
}

void EntryCore::useDefaultTimePublished(Date* date, Foundation::TimeZone* zone) {
    if (!mDatePublished.getValue()) mDatePublished.setValue(date);
    if (!mTimeZonePublished.getValue()) mTimeZonePublished.setValue(zone);
}

Date* EntryCore::getDateForDisplay() const {
    if (Date* published = mDatePublished) return published;
    if (Date* updated = mDateUpdated) return updated;
    return mLocalDateCreated;
}

std::uint64_t EntryCore::getSortValue() const {
    return getRowID() != 0 ? static_cast<std::uint64_t>(getRowID()) : mSortValue;
}

void EntryCore::setRead(bool read) {
    if (mRead == read) return;
    mRead.setValue(read);
    mLocalDateFlagsUpdated.setValue(Date::now());
    if (FeedCore* feed = getFeed()) feed->updateUnreadCounts();
}

void EntryCore::setFlagged(bool flagged) {
    if (mFlagged == flagged) return;
    mFlagged.setValue(flagged);
    mLocalDateFlagsUpdated.setValue(Date::now());
}

bool EntryCore::changeFlags(bool read, bool flagged, bool updateCounts) {
    const bool isReadNew = mRead != read;
    const bool isFlaggedNew = mFlagged != flagged;
    if (!isReadNew && !isFlaggedNew) return false;
    mLocalDateFlagsUpdated.setValue(Date::now());
    if (isFlaggedNew) mFlagged.setValue(flagged);
    if (!isReadNew) return true;
    mRead.setValue(read);
    FeedCore* feed = updateCounts ? getFeed() : nullptr;
    if (feed) feed->updateUnreadCounts();
    return true;
}

bool EntryCore::public_setRead(bool read) {
    if (isChangeable()) {
        setRead(read);
    } else {
        AgentLink::current().setRead(this, read);
        mRead.unload();
    }
    return true;
}

bool EntryCore::public_setFlagged(bool flagged) {
    if (isChangeable()) {
        setFlagged(flagged);
    } else {
        AgentLink::current().setFlagged(this, flagged);
        mFlagged.unload();
    }
    return true;
}

void EntryCore::ipcWillChangeColumn(int column) {
    if (column == ColumnID::Read || column == ColumnID::Flagged) return;
    throw Foundation::NetException(Foundation::NetError::kOrvane, OVReadOnlyError);
}

void EntryCore::ipcDidChangeColumn(int column) {
    OV_ASSERT_AS(column == ColumnID::Read || column == ColumnID::Flagged,
                 "col == ColumnID::Read || col == ColumnID::Flagged");
    if (SyncPlanner* planner = SyncPlanner::current()) planner->autoSyncSoon();
}

void EntryCore::deleteRow() {
    Foundation::gLog.log("Deleting %@", this);
    if (getRowID() == 0) return CoreOf::deleteRow();
    requireChangeable();
    const SQLite::Transaction transaction(true);
    deleteChildren();
    FeedCore* feed = getFeed();
    if (feed && !mCurrent) feed->deleteEntryFile(getIdentifier());
    CoreOf::deleteRow();
}

void EntryCore::deleteChildren() {
    constexpr const char* kWhere = "virtual void Orvane::EntryCore::deleteRow()";
    SQLite::Database* database = getTable()->getDatabase();
    // What is left behind takes room and does no harm.
    Foundation::callGuarded(kWhere, [&] {
        static auto* const sQuery =
            new SQLite::Query(database, "delete from Contents where rowID in (?,?,?)");
        sQuery->bindRowID(1, mContent.getRowID());
        sQuery->bindRowID(2, mSummary.getRowID());
        sQuery->bindRowID(3, mXMLRepresentation.getRowID());
        sQuery->execute();
    });
    Foundation::callGuarded(kWhere, [&] {
        static auto* const sQuery =
            new SQLite::Query(database, "delete from Enclosures where entry=?");
        sQuery->bindRowID(1, getRowID());
        sQuery->execute();
    });
}

void EntryCore::saveChanges() {
    const Ref<EntryCore> self = this;
    CoreOf::saveChanges();
    // A feed that is not in memory has no new entries.
    FeedCore* feed = SQLite::TableOf<FeedCore>::instance()->cachedRowWithID(mFeed.getRowID());
    if (feed) feed->mEntries.removeSaved(this);
}

}  // namespace Orvane
