#pragma once

#include "Foundation/ArrayOf.h"
#include "Model/EntryColumns.h"
#include "SQLite/RowIterator.h"

#include <cstdint>
#include <string_view>

namespace Orvane {

class XMLElement;

/// A post of a feed: a row of "Entries". Free until it is merged into the store.
class EntryCore : public EntryColumns {
 public:
    using EntryColumns::EntryColumns;

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
    // what they get, which may be null, by way of the agent where the row may not be changed here.

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
    /// By way of the agent where the row may not be changed here. Whether the author could be put
    /// into the file; throws if a call fails.
    bool public_setAuthor(AuthorCore* author);
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
    /// Null without one, and if the file has lost it.
    FeedCore* getFeed() const;
    /// The feed, which may be null, must outlive the link if it is not stored.
    void setFeed(FeedCore* feed);

    // Flags.

    /// Sets it, with the date of the change, and counts the feed's unread entries again.
    void setRead(bool read);
    /// Sets it, with the date of the change.
    void setFlagged(bool flagged);
    /// Sets both with one date. Whether one was different.
    bool changeFlags(bool read, bool flagged, bool updateCounts);
    /// By way of the agent where the row may not be changed here. True but for a failed call, which
    /// throws.
    bool public_setRead(bool read);
    bool public_setFlagged(bool flagged);

    // Dates and order.

    /// Fills in the date and zone of publication where they are empty.
    void useDefaultTimePublished(Foundation::Date* date, Foundation::TimeZone* zone);
    /// When it was published, or else updated, or else first seen here; null if none is known.
    Foundation::Date* getDateForDisplay() const;
    /// A number that grows in the order of entries: the ID or, without one, `mSortValue`.
    std::uint64_t getSortValue() const;

    // Merging.

    /// Makes this entry what `newEntry` is, and whether that changed it. What is null or empty
    /// there clears what is here with `force`, and leaves it alone without.
    bool updateFrom(const Foundation::Ref<EntryCore>& newEntry, bool force);
    void updateAuthorsFrom(const EntryCore* newEntry);
    void updateEnclosuresFrom(const EntryCore* newEntry);

    // The source, as XML. Null without a source, or if it is no XML.

    /// The entry's element or, `stripped`, only what in it is not in the columns.
    Foundation::Returner<XMLElement> getXMLElement(bool stripped) const;
    Foundation::Returner<XMLElement> _parseXMLRepresentation() const;
    /// Takes out of an element of Atom what is in the columns and, unless `removeOnly`, puts in
    /// what is in them now. Gives the MIME type of the result.
    const char* _updateAtomXML(XMLElement& element, bool removeOnly) const;

    /// Deletes it with its contents, its enclosures and, if it is archived, its file.
    void deleteRow() override;
    void saveChanges() override;
    /// Throws `NetException` with `OVReadOnlyError` for all but the flags.
    void ipcWillChangeColumn(int column) override;
    /// Plans a sync.
    void ipcDidChangeColumn(int column) override;
    OVObject* createOVObject() override;

 private:
    using ContentColumn = SQLite::ToOneColumn<ContentCore, false>;

    void deleteChildren();
    void startUpdate(const EntryCore& newEntry);
    void takeCurrent(const EntryCore& newEntry);
    void takeTexts(EntryCore& newEntry, bool replace);
    void takeSource(EntryCore& newEntry, bool replace);
    void updateEnclosure(EnclosureCore& enclosure, const EnclosureCore& newEnclosure);
    void dropEnclosure(EnclosureCore* enclosure);
    void insertEnclosure(const EnclosureCore& newEnclosure);
    ContentColumn& contentColumn(std::string_view name);
    void _setContentColumn(ContentColumn& column, const char* name, ContentCore* content);
    void replaceContent(ContentColumn& column, ContentCore* present, ContentCore* content);
    Foundation::String* hashOf(const ContentColumn& column,
                               SQLite::ScalarColumn<Foundation::String>& stored) const;
};

}  // namespace Orvane
