#pragma once

#include "Model/CoreOf.h"
#include "SQLite/RowIterator.h"
#include "SQLite/ScalarColumn.h"
#include "SQLite/ToManyColumn.h"
#include "SQLite/ToOneColumn.h"

#include <cstdint>
#include <string_view>

namespace Orvane {

class AuthorCore;
class ContentCore;
class EnclosureCore;
class FeedCore;

/// A post of a feed: a row of "Entries". Free until it is merged into the store.
class EntryCore : public CoreOf<EntryCore> {
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

    /// The stored entry of an identifier, or null. Throws `AssertionFailure` for null.
    static Foundation::Returner<EntryCore> getEntryWithIdentifier(Foundation::String* identifier);
    /// A free entry of which nothing is known but its identifier, until its feed brings it.
    static Foundation::Returner<EntryCore> createGhostEntry(Foundation::String* identifier);

    ~EntryCore() override;

    // Identity.

    /// The hash that tells the entry in all stores, computed once and kept where the row may be
    /// changed. Throws `AssertionFailure` if it cannot be computed for such a row; null else.
    Foundation::String* getIdentifier() const;
    /// The SHA-1 of the feed's identifier and the entry's ID, URL, title, content or summary: the
    /// first that is not empty. Null without a feed.
    Foundation::StringReturner computeIdentifier() const;
    /// Throws `AssertionFailure` unless this is the entry's identifier; `name` says whose it is.
    void assertIdentifier(Foundation::String* identifier, const char* name) const;

    // Contents. An entry keeps its rows of "Contents" and changes what is in them. The setters copy
    // what they get, which may be null.

    ContentCore* getContent() const;
    ContentCore* getSummary() const;
    ContentCore* getXMLRepresentation() const;
    void setContent(ContentCore* content);
    void setSummary(ContentCore* summary);
    void setXMLRepresentation(ContentCore* source);
    /// Sets "content", "summary" or "XMLRepresentation"; null data for none. Throws
    /// `AssertionFailure` for other names.
    void setContentColumn(const char* name, Foundation::String* mimeType, Foundation::Data* data);

    /// The hash that is stored, or else of what there is, which is then kept where the row may be
    /// changed; null if there is nothing. A stored hash does not follow the setters.
    Foundation::String* getContentHash();
    Foundation::String* getSummaryHash();
    Foundation::String* getXMLRepresentationHash();

    // Authors: there is at most one, and a contributor counts as an author.

    AuthorCore* getAuthor() const;
    void setAuthor(AuthorCore* author);
    SQLite::RowIterator<AuthorCore> getAuthors(const char* condition) const;
    SQLite::RowIterator<AuthorCore> getContributors(const char* condition) const;
    /// Takes the author, unless that is nobody or there is another one.
    void addToAuthors(AuthorCore* author);
    void addToContributors(AuthorCore* author) { addToAuthors(author); }
    /// Takes the first of the authors, which may be null, if there is none yet.
    void useDefaultAuthors(Foundation::ArrayOf<AuthorCore>* authors,
                           Foundation::ArrayOf<AuthorCore>* contributors);

    // Enclosures, and the feed. Each side of a link sets the other.

    SQLite::RowIterator<EnclosureCore> getEnclosures(const char* condition) const;
    void addToEnclosures(EnclosureCore* enclosure);
    void removeFromEnclosures(EnclosureCore* enclosure);
    FeedCore* getFeed() const;
    /// The feed, which may be null, must outlive the link if it is not stored.
    void setFeed(FeedCore* feed);

    // Dates and order.

    /// Fills in the date and zone of publication where they are empty.
    void useDefaultTimePublished(Foundation::Date* date, Foundation::TimeZone* zone);
    /// When it was published, or else updated, or else first seen here; null if none is known.
    Foundation::Date* getDateForDisplay() const;
    /// A number that grows in the order of entries: the ID or, without one, `mSortValue`.
    std::uint64_t getSortValue() const;

    void saveChanges() override;
    OVObject* createOVObject() override;

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

 private:
    using ContentColumn = SQLite::ToOneColumn<ContentCore, false>;

    ContentColumn& contentColumn(std::string_view name);
    void _setContentColumn(ContentColumn& column, ContentCore* content);
    void replaceContent(ContentColumn& column, ContentCore* present, ContentCore* content);
    Foundation::String* hashOf(const ContentColumn& column,
                               SQLite::ScalarColumn<Foundation::String>& stored) const;
};

}  // namespace Orvane
