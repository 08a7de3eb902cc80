#pragma once

#include "Model/CoreOf.h"
#include "SQLite/ScalarColumn.h"
#include "SQLite/ToManyColumn.h"
#include "SQLite/ToOneColumn.h"

#include <cstdint>

namespace Orvane {

class AuthorCore;
class ContentCore;
class EnclosureCore;
class EntryCore;
class FeedCore;

/// The table "Entries", and what an entry keeps.
class EntryColumns : public CoreOf<EntryCore> {
 public:
    static constexpr const char* kTableName = "Entries";
    static const char kSchema[];
    static const SQLite::Table::IndexSpec kSchemaIndexes[];
    static const SQLite::Table::TriggerSpec kSchemaTriggers[];

    /// The positions of the columns, behind "rowID".
    enum ColumnID : int {
        Identifier = 0,
        ID,
        Title,
        Rights,
        Content,
        ContentHash,
        Summary,
        SummaryHash,
        XMLRepresentation,
        XMLRepresentationHash,
        DateUpdated,
        TimeZoneUpdated,
        DatePublished,
        TimeZonePublished,
        DateCreated,
        TimeZoneCreated,
        BaseURL,
        AlternateURL,
        Author,
        Feed,
        Current,
        Tombstone,
        Read,
        Flagged,
        LocalDateCreated,
        LocalDateUpdated,
        LocalDateXMLChanged,
        LocalDateFlagsUpdated,
    };

    using CoreOf::CoreOf;

    /// The columns in the order of the table.
    static const SQLite::ColumnList& columnList();

    SQLite::ScalarColumn<Foundation::String> mIdentifier{this};  ///< a hash
    SQLite::ScalarColumn<Foundation::String> mID{this};          ///< the document's
    SQLite::ScalarColumn<Foundation::String> mTitle{this};
    SQLite::ScalarColumn<Foundation::String> mRights{this};
    SQLite::ToOneColumn<ContentCore, false> mContent{this};
    SQLite::ScalarColumn<Foundation::String> mContentHash{this};
    SQLite::ToOneColumn<ContentCore, false> mSummary{this};
    SQLite::ScalarColumn<Foundation::String> mSummaryHash{this};
    SQLite::ToOneColumn<ContentCore, false> mXMLRepresentation{this};  ///< the source
    SQLite::ScalarColumn<Foundation::String> mXMLRepresentationHash{this};
    SQLite::ScalarColumn<Foundation::Date> mDateUpdated{this};
    SQLite::ScalarColumn<Foundation::TimeZone> mTimeZoneUpdated{this};
    SQLite::ScalarColumn<Foundation::Date> mDatePublished{this};
    SQLite::ScalarColumn<Foundation::TimeZone> mTimeZonePublished{this};
    SQLite::ScalarColumn<Foundation::Date> mDateCreated{this};
    SQLite::ScalarColumn<Foundation::TimeZone> mTimeZoneCreated{this};
    SQLite::ScalarColumn<Foundation::URL> mBaseURL{this};
    SQLite::ScalarColumn<Foundation::URL> mAlternateURL{this};  ///< the entry's page
    SQLite::ToOneColumn<AuthorCore, false> mAuthor{this};
    SQLite::ToOneColumn<FeedCore, true> mFeed{this};
    SQLite::ScalarColumn<bool> mCurrent{this};    ///< still in the feed's document
    SQLite::ScalarColumn<bool> mTombstone{this};  ///< kept for templates; no behaviour here
    SQLite::ScalarColumn<bool> mRead{this};
    SQLite::ScalarColumn<bool> mFlagged{this};
    SQLite::ScalarColumn<Foundation::Date> mLocalDateCreated{this};     ///< first seen here
    SQLite::ScalarColumn<Foundation::Date> mLocalDateUpdated{this};     ///< data changed here
    SQLite::ScalarColumn<Foundation::Date> mLocalDateXMLChanged{this};  ///< source changed here
    /// Read or flagged changed.
    SQLite::ScalarColumn<Foundation::Date> mLocalDateFlagsUpdated{this};
    SQLite::ToManyColumn<EnclosureCore> mEnclosures{this, "entry"};
    std::uint64_t mSortValue = 0;  ///< the place among entries that are not stored
};

}  // namespace Orvane
