#include "Model/EnclosureCore.h"

#include "Foundation/Logger.h"
#include "Foundation/TypeName.h"
#include "Foundation/URL.h"
#include "Model/EntryCore.h"
#include "Model/PublicObjects.h"

namespace Orvane {

using Foundation::Ref;
using SQLite::column;

const char EnclosureCore::kSchema[] =
    "rowID integer not null unique primary key, entry integer references Entries(rowID), "
    "url text not null, mimeType text, length integer, title text, "
    "downloadAuditStatus integer, downloadState integer, downloadedPath text, "
    "downloadErrorDomain integer, downloadErrorCode integer";

const SQLite::Table::IndexSpec EnclosureCore::kSchemaIndexes[] = {
    {"Enclosures_entry", "entry"},
    {"Enclosures_autodownloads", "downloadState, downloadAuditStatus"},
    {nullptr, nullptr},
};

const SQLite::ColumnList& EnclosureCore::columnList() {
    static const SQLite::ColumnList sColumns = {
        column<&EnclosureCore::mEntry>("entry"),
        column<&EnclosureCore::mURL>("url"),
        column<&EnclosureCore::mMIMEType>("mimeType"),
        column<&EnclosureCore::mLength>("length"),
        column<&EnclosureCore::mTitle>("title"),
        column<&EnclosureCore::mDownloadAuditStatus>("downloadAuditStatus"),
        column<&EnclosureCore::mDownloadState>("downloadState"),
        column<&EnclosureCore::mDownloadedPath>("downloadedPath"),
        column<&EnclosureCore::mDownloadErrorDomain>("downloadErrorDomain"),
        column<&EnclosureCore::mDownloadErrorCode>("downloadErrorCode"),
    };
    return sColumns;
}

OVObject* EnclosureCore::createOVObject() {
    return PublicObjects::makeFor(this);
}

EntryCore* EnclosureCore::getEntry() const {
    const SQLite::RowID entry = mEntry.getRowID();
    // An entry that is deleted does not wait for a download that runs.
    if (entry != 0 && !_isInFile(SQLite::TableOf<EntryCore>::instance(), entry)) return nullptr;
    return mEntry.getValue();
}

void EnclosureCore::setEntry(EntryCore* entry) {
    // The old entry may have the last reference. An object that nobody owns yet must not get one.
    const Ref<EnclosureCore> self = getRefCount() > 0 ? this : nullptr;
    const Ref<EntryCore> old = mEntry.getValue();
    if (Foundation::IsEqual(old.get(), entry)) return;
    mEntry.setValue(entry);
    if (old.get()) old->removeFromEnclosures(this);
    if (entry) entry->addToEnclosures(this);
}

EnclosureCore* EnclosureCore::matchingEnclosureFrom(
    const Foundation::ArrayOf<EnclosureCore>* enclosures) const {
    for (EnclosureCore* other : *enclosures) {
        if (Foundation::IsEqual(mURL, other->mURL)) return other;
    }
    return nullptr;
}

Foundation::StringReturner EnclosureCore::toString() const {
    if (!mURL.isLoaded() || !mMIMEType.isLoaded() || !mLength.isLoaded()) {
        return CoreOf::toString();
    }
    return Foundation::String::stringWithFormat(
        "%s[<%@> %@ %.0fKB]", Foundation::getTypeName(typeid(*this)), mURL.getValue(),
        mMIMEType.getValue(), static_cast<double>(mLength.getValue()) / 1024);
}

}  // namespace Orvane
