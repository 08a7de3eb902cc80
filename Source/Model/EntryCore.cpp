#include "Model/EntryCore.h"

#include "Foundation/AssertionFailure.h"
#include "Foundation/Logger.h"
#include "Foundation/NetException.h"
#include "Model/AuthorCore.h"
#include "Model/ContentCore.h"
#include "Model/EnclosureCore.h"
#include "Model/FeedCore.h"
#include "Model/PublicObjects.h"

namespace Orvane {

using Foundation::Date;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;
using SQLite::column;

const char EntryCore::kSchema[] =
    "rowID integer not null unique primary key, identifier text unique, id text, title text, "
    "rights text, content integer references Contents(rowID), contentHash text, "
    "summary integer references Contents(rowID), summaryHash text, "
    "xmlRepresentation integer references Contents(rowID), xmlRepresentationHash text, "
    "dateUpdated real, timeZoneUpdated blob, datePublished real, timeZonePublished blob, "
    "dateCreated real, timeZoneCreated blob, baseUrl text, alternateUrl text, "
    "author integer references Authors(rowID), feed integer references Feeds(rowID), "
    "current integer, tombstone integer, read integer, flagged integer, localDateCreated real, "
    "localDateUpdated real, localDateXmlChanged real, localDateFlagsUpdated real";

const SQLite::Table::IndexSpec EntryCore::kSchemaIndexes[] = {
    {"Entries_identifier", "identifier"},
    {"Entries_unreadcount", "feed, read, localDateCreated"},
    {"Entries_tosync", "localDateFlagsUpdated"},
    {nullptr, nullptr},
};

namespace {

constexpr const char* kNoteNewestEntry =
    "BEGIN UPDATE Feeds SET localDateCreatedOfNewestEntry = MAX(localDateCreatedOfNewestEntry, "
    "NEW.localDateCreated) WHERE rowID = NEW.feed; END";

}  // namespace

const SQLite::Table::TriggerSpec EntryCore::kSchemaTriggers[] = {
    {"Entries_update_feeds_localdatecreatedofnewestentryinfeed_after_update",
     "AFTER UPDATE OF localDateCreated", kNoteNewestEntry},
    {"Entries_update_feeds_localdatecreatedofnewestentryinfeed_after_insert", "AFTER INSERT",
     kNoteNewestEntry},
    {nullptr, nullptr, nullptr},
};

const SQLite::ColumnList& EntryCore::columnList() {
    static const SQLite::ColumnList sColumns = {
        column<&EntryCore::mIdentifier>("identifier"),
        column<&EntryCore::mID>("id"),
        column<&EntryCore::mTitle>("title"),
        column<&EntryCore::mRights>("rights"),
        column<&EntryCore::mContent>("content"),
        column<&EntryCore::mContentHash>("contentHash"),
        column<&EntryCore::mSummary>("summary"),
        column<&EntryCore::mSummaryHash>("summaryHash"),
        column<&EntryCore::mXMLRepresentation>("xmlRepresentation"),
        column<&EntryCore::mXMLRepresentationHash>("xmlRepresentationHash"),
        column<&EntryCore::mDateUpdated>("dateUpdated"),
        column<&EntryCore::mTimeZoneUpdated>("timeZoneUpdated"),
        column<&EntryCore::mDatePublished>("datePublished"),
        column<&EntryCore::mTimeZonePublished>("timeZonePublished"),
        column<&EntryCore::mDateCreated>("dateCreated"),
        column<&EntryCore::mTimeZoneCreated>("timeZoneCreated"),
        column<&EntryCore::mBaseURL>("baseUrl"),
        column<&EntryCore::mAlternateURL>("alternateUrl"),
        column<&EntryCore::mAuthor>("author"),
        column<&EntryCore::mFeed>("feed"),
        column<&EntryCore::mCurrent>("current"),
        column<&EntryCore::mTombstone>("tombstone"),
        column<&EntryCore::mRead>("read"),
        column<&EntryCore::mFlagged>("flagged"),
        column<&EntryCore::mLocalDateCreated>("localDateCreated"),
        column<&EntryCore::mLocalDateUpdated>("localDateUpdated"),
        column<&EntryCore::mLocalDateXMLChanged>("localDateXmlChanged"),
        column<&EntryCore::mLocalDateFlagsUpdated>("localDateFlagsUpdated"),
        SQLite::toMany<&EntryCore::mEnclosures>(),
    };
    return sColumns;
}

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

void EntryCore::saveChanges() {
    const Ref<EntryCore> self = this;
    CoreOf::saveChanges();
    // A feed that is not in memory has no new entries.
    FeedCore* feed = SQLite::TableOf<FeedCore>::instance()->cachedRowWithID(mFeed.getRowID());
    if (feed) feed->mEntries.removeSaved(this);
}

}  // namespace Orvane
