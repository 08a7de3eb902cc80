#include "Foundation/AssertionFailure.h"
#include "Foundation/Logger.h"
#include "Foundation/URL.h"
#include "Model/AuthorCore.h"
#include "Model/ContentCore.h"
#include "Model/EnclosureCore.h"
#include "Model/EntryCore.h"
#include "Model/FeedCore.h"
#include "SQLite/Database.h"

// How an entry takes over what a document says of it now.

namespace Orvane {

using Foundation::ArrayOf;
using Foundation::Date;
using Foundation::IsEqual;
using Foundation::MutableArrayOf;
using Foundation::Ref;
using Foundation::Returner;
using Foundation::String;
using SQLite::ScalarColumn;

namespace {

bool isEmpty(const String* value) {
    return String::isEmpty(value);
}
bool isEmpty(const Foundation::PFRefCounted* value) {
    return !value;
}

/// Compares even where the column is changed already, so that what is the same never counts.
template <class T>
bool assign(ScalarColumn<T>& column, typename ScalarColumn<T>::Argument value) {
    if constexpr (std::is_arithmetic_v<T>) {
        if (column.getValue() == value) return false;
    } else {
        if (IsEqual(column.getValue(), value)) return false;
    }
    column.setValue(value);
    return true;
}

/// `replace` lets a value go that is not there any more.
template <class T>
void take(ScalarColumn<T>& column, const ScalarColumn<T>& from, bool replace) {
    if (replace || !isEmpty(from.getValue())) assign(column, from.getValue());
}

bool takeOver(EnclosureCore& enclosure, const EnclosureCore& from) {
    const bool isTypeNew = assign(enclosure.mMIMEType, from.mMIMEType);
    const bool isTitleNew = assign(enclosure.mTitle, from.mTitle);
    const bool isLengthNew = assign(enclosure.mLength, from.mLength);
    return isTypeNew || isTitleNew || isLengthNew;
}

}  // namespace

bool EntryCore::updateFrom(const Ref<EntryCore>& newEntry, bool force) {
    OV_ASSERT_AS(newEntry.get() != nullptr, "newEntry");
    startUpdate(*newEntry);
    takeCurrent(*newEntry);
    take(mID, newEntry->mID, force);
    take(mAlternateURL, newEntry->mAlternateURL, force);
    take(mTitle, newEntry->mTitle, force);
    take(mRights, newEntry->mRights, force);
    take(mDateCreated, newEntry->mDateCreated, force);
    take(mDatePublished, newEntry->mDatePublished, force);
    take(mDateUpdated, newEntry->mDateUpdated, force);
    takeTexts(*newEntry, force);
    updateAuthorsFrom(newEntry.get());
    updateEnclosuresFrom(newEntry.get());
    if (isChanged()) {
        mLocalDateUpdated.setValue(Date::now());
        if (getRowID() != 0) gLogSub.log("    Updated entry '%@'", mTitle.getValue());
    }
    takeSource(*newEntry, force);
    if (!isChanged()) return false;
    mLocalDateXMLChanged.setValue(Date::now());
    return true;
}

void EntryCore::startUpdate(const EntryCore& newEntry) {
    if (getRowID() != 0) {
        gLogSub.log("    Comparing entry  %@ '%@'", this, mTitle.getValue());
        return;
    }
    const Date* created = newEntry.mLocalDateCreated;
    gLogSub.log("    Adding new entry '%@' (created %.3f)", newEntry.mTitle.getValue(),
                Date::getAbsoluteTime(created));
    assign(mLocalDateCreated, newEntry.mLocalDateCreated);
}

void EntryCore::takeCurrent(const EntryCore& newEntry) {
    if (!assign(mCurrent, newEntry.mCurrent) || !mCurrent) return;
    // What is new was never in the archive, and cannot be identified before it is filled.
    if (getRowID() == 0 && !mIdentifier) return;
    // It is back in the document, and so no longer in the archive.
    if (FeedCore* feed = getFeed()) feed->deleteEntryFile(getIdentifier());
}

void EntryCore::takeTexts(EntryCore& newEntry, bool replace) {
    String* contentHash = newEntry.getContentHash();
    if (!IsEqual(getContentHash(), contentHash) && (replace || newEntry.mContent)) {
        _setContentColumn(mContent, "content", newEntry.getContent());
        assign(mContentHash, contentHash);
    }
    String* summaryHash = newEntry.getSummaryHash();
    if (!IsEqual(getSummaryHash(), summaryHash) && (replace || newEntry.mSummary)) {
        _setContentColumn(mSummary, "summary", newEntry.getSummary());
        assign(mSummaryHash, summaryHash);
    }
}

void EntryCore::takeSource(EntryCore& newEntry, bool replace) {
    if (!replace && !newEntry.mXMLRepresentation) return;
    _setContentColumn(mXMLRepresentation, "XMLRepresentation", newEntry.getXMLRepresentation());
    assign(mXMLRepresentationHash, newEntry.getXMLRepresentationHash());
}

void EntryCore::updateAuthorsFrom(const EntryCore* newEntry) {
    Ref<AuthorCore> author = newEntry->getAuthor();
    if (!author.get() || author->isEmpty()) {
        if (mAuthor) setAuthor(nullptr);
        return;
    }
    if (IsContentEqual(author.get(), getAuthor())) return;
    const Ref<AuthorCore> known = author->findInDatabase();
    if (known.get()) {
        author = known;
    } else if (SQLite::gDatabase && SQLite::gDatabase->isWriteable()) {
        gLogSub.log("    Adding author %@ to db", author);
        author->saveChanges();
    }
    setAuthor(author.get());
    gLogSub.log("    Author = %@", author);
}

void EntryCore::updateEnclosuresFrom(const EntryCore* newEntry) {
    const Ref<ArrayOf<EnclosureCore>> present = getEnclosures(nullptr).allRows();
    const Ref<ArrayOf<EnclosureCore>> given = newEntry->getEnclosures(nullptr).allRows();
    if (present->isEmpty() && given->isEmpty()) return;
    const Ref<MutableArrayOf<EnclosureCore>> added =
        MutableArrayOf<EnclosureCore>::arrayFrom(*given);
    for (EnclosureCore* enclosure : *present) {
        if (EnclosureCore* match = enclosure->matchingEnclosureFrom(added.get())) {
            updateEnclosure(*enclosure, *match);
            added->remove(*added->indexOf(match));
        } else {
            dropEnclosure(enclosure);
        }
    }
    for (EnclosureCore* enclosure : *added) {
        if (enclosure->mURL.getValue()) insertEnclosure(*enclosure);
    }
}

void EntryCore::updateEnclosure(EnclosureCore& enclosure, const EnclosureCore& newEnclosure) {
    if (!takeOver(enclosure, newEnclosure)) return;
    setChanged();
    gLogSub.log("    Updated %@", &enclosure);
}

void EntryCore::dropEnclosure(EnclosureCore* enclosure) {
    gLogSub.log("    Deleted %@", enclosure);
    removeFromEnclosures(enclosure);
    enclosure->deleteRow();
    setChanged();
}

void EntryCore::insertEnclosure(const EnclosureCore& newEnclosure) {
    const Ref<EnclosureCore> enclosure = Returner<EnclosureCore>::adopted(new EnclosureCore);
    enclosure->mURL.setValue(newEnclosure.mURL);
    takeOver(*enclosure, newEnclosure);
    addToEnclosures(enclosure.get());
    enclosure->auditForDownload();
    setChanged();
    gLogSub.log("    Added %@", enclosure);
}

}  // namespace Orvane
