#pragma once

#include "Model/Declared.h"
#include "Model/EntryCore.h"

#include <vector>

template <>
struct Declared<Orvane::EntryCore> {
    static std::vector<DeclaredColumn> columns() {
        return {
            {"identifier", "text unique"},
            {"id", "text"},
            {"title", "text"},
            {"rights", "text"},
            {"content", "integer references Contents(rowID)"},
            {"contentHash", "text"},
            {"summary", "integer references Contents(rowID)"},
            {"summaryHash", "text"},
            {"xmlRepresentation", "integer references Contents(rowID)"},
            {"xmlRepresentationHash", "text"},
            {"dateUpdated", "real"},
            {"timeZoneUpdated", "blob"},
            {"datePublished", "real"},
            {"timeZonePublished", "blob"},
            {"dateCreated", "real"},
            {"timeZoneCreated", "blob"},
            {"baseUrl", "text"},
            {"alternateUrl", "text"},
            {"author", "integer references Authors(rowID)"},
            {"feed", "integer references Feeds(rowID)"},
            {"current", "integer"},
            {"tombstone", "integer"},
            {"read", "integer"},
            {"flagged", "integer"},
            {"localDateCreated", "real"},
            {"localDateUpdated", "real"},
            {"localDateXmlChanged", "real"},
            {"localDateFlagsUpdated", "real"},
        };
    }
    template <class F>
    static void visit(Orvane::EntryCore& row, F f) {
        using C = Orvane::EntryCore;
        f(C::ColumnID::Identifier, row.mIdentifier);
        f(C::ColumnID::ID, row.mID);
        f(C::ColumnID::Title, row.mTitle);
        f(C::ColumnID::Rights, row.mRights);
        f(C::ColumnID::Content, row.mContent);
        f(C::ColumnID::ContentHash, row.mContentHash);
        f(C::ColumnID::Summary, row.mSummary);
        f(C::ColumnID::SummaryHash, row.mSummaryHash);
        f(C::ColumnID::XMLRepresentation, row.mXMLRepresentation);
        f(C::ColumnID::XMLRepresentationHash, row.mXMLRepresentationHash);
        f(C::ColumnID::DateUpdated, row.mDateUpdated);
        f(C::ColumnID::TimeZoneUpdated, row.mTimeZoneUpdated);
        f(C::ColumnID::DatePublished, row.mDatePublished);
        f(C::ColumnID::TimeZonePublished, row.mTimeZonePublished);
        f(C::ColumnID::DateCreated, row.mDateCreated);
        f(C::ColumnID::TimeZoneCreated, row.mTimeZoneCreated);
        f(C::ColumnID::BaseURL, row.mBaseURL);
        f(C::ColumnID::AlternateURL, row.mAlternateURL);
        f(C::ColumnID::Author, row.mAuthor);
        f(C::ColumnID::Feed, row.mFeed);
        f(C::ColumnID::Current, row.mCurrent);
        f(C::ColumnID::Tombstone, row.mTombstone);
        f(C::ColumnID::Read, row.mRead);
        f(C::ColumnID::Flagged, row.mFlagged);
        f(C::ColumnID::LocalDateCreated, row.mLocalDateCreated);
        f(C::ColumnID::LocalDateUpdated, row.mLocalDateUpdated);
        f(C::ColumnID::LocalDateXMLChanged, row.mLocalDateXMLChanged);
        f(C::ColumnID::LocalDateFlagsUpdated, row.mLocalDateFlagsUpdated);
    }
};
