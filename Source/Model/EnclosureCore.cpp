#include "Model/EnclosureCore.h"

#include "Model/EntryCore.h"
#include "Model/PublicObjects.h"

namespace Orvane {

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

}  // namespace Orvane
