#include "Model/EntryColumns.h"

#include "Model/AuthorCore.h"
#include "Model/ContentCore.h"
#include "Model/EnclosureCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"

namespace Orvane {

using SQLite::column;

const char EntryColumns::kSchema[] =
    "rowID integer not null unique primary key, identifier text unique, id text, title text, "
    "rights text, content integer references Contents(rowID), contentHash text, "
    "summary integer references Contents(rowID), summaryHash text, "
    "xmlRepresentation integer references Contents(rowID), xmlRepresentationHash text, "
    "dateUpdated real, timeZoneUpdated blob, datePublished real, timeZonePublished blob, "
    "dateCreated real, timeZoneCreated blob, baseUrl text, alternateUrl text, "
    "author integer references Authors(rowID), feed integer references Feeds(rowID), "
    "current integer, tombstone integer, read integer, flagged integer, localDateCreated real, "
    "localDateUpdated real, localDateXmlChanged real, localDateFlagsUpdated real";

const SQLite::Table::IndexSpec EntryColumns::kSchemaIndexes[] = {
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

const SQLite::Table::TriggerSpec EntryColumns::kSchemaTriggers[] = {
    {"Entries_update_feeds_localdatecreatedofnewestentryinfeed_after_update",
     "AFTER UPDATE OF localDateCreated", kNoteNewestEntry},
    {"Entries_update_feeds_localdatecreatedofnewestentryinfeed_after_insert", "AFTER INSERT",
     kNoteNewestEntry},
    {nullptr, nullptr, nullptr},
};

const SQLite::ColumnList& EntryColumns::columnList() {
    static const SQLite::ColumnList sColumns = {
        column<&EntryColumns::mIdentifier>("identifier"),
        column<&EntryColumns::mID>("id"),
        column<&EntryColumns::mTitle>("title"),
        column<&EntryColumns::mRights>("rights"),
        column<&EntryColumns::mContent>("content"),
        column<&EntryColumns::mContentHash>("contentHash"),
        column<&EntryColumns::mSummary>("summary"),
        column<&EntryColumns::mSummaryHash>("summaryHash"),
        column<&EntryColumns::mXMLRepresentation>("xmlRepresentation"),
        column<&EntryColumns::mXMLRepresentationHash>("xmlRepresentationHash"),
        column<&EntryColumns::mDateUpdated>("dateUpdated"),
        column<&EntryColumns::mTimeZoneUpdated>("timeZoneUpdated"),
        column<&EntryColumns::mDatePublished>("datePublished"),
        column<&EntryColumns::mTimeZonePublished>("timeZonePublished"),
        column<&EntryColumns::mDateCreated>("dateCreated"),
        column<&EntryColumns::mTimeZoneCreated>("timeZoneCreated"),
        column<&EntryColumns::mBaseURL>("baseUrl"),
        column<&EntryColumns::mAlternateURL>("alternateUrl"),
        column<&EntryColumns::mAuthor>("author"),
        column<&EntryColumns::mFeed>("feed"),
        column<&EntryColumns::mCurrent>("current"),
        column<&EntryColumns::mTombstone>("tombstone"),
        column<&EntryColumns::mRead>("read"),
        column<&EntryColumns::mFlagged>("flagged"),
        column<&EntryColumns::mLocalDateCreated>("localDateCreated"),
        column<&EntryColumns::mLocalDateUpdated>("localDateUpdated"),
        column<&EntryColumns::mLocalDateXMLChanged>("localDateXmlChanged"),
        column<&EntryColumns::mLocalDateFlagsUpdated>("localDateFlagsUpdated"),
        SQLite::toMany<&EntryColumns::mEnclosures>(),
    };
    return sColumns;
}

}  // namespace Orvane
