#include "Model/EntryCore.h"

#include "Model/AuthorCore.h"
#include "Model/ContentCore.h"
#include "Model/EnclosureCore.h"
#include "Model/FeedCore.h"
#include "Model/PublicObjects.h"

namespace Orvane {

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

}  // namespace Orvane
