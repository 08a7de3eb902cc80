#pragma once

#include "Model/CoreOf.h"
#include "SQLite/ScalarColumn.h"
#include "SQLite/ToOneColumn.h"

namespace Orvane {

class EntryCore;

/// A file attached to an entry, with the state of its download: a row of "Enclosures".
class EnclosureCore : public CoreOf<EnclosureCore> {
 public:
    static constexpr const char* kTableName = "Enclosures";
    static const char kSchema[];
    static const SQLite::Table::IndexSpec kSchemaIndexes[];

    /// The positions of the columns, behind "rowID".
    enum ColumnID : int {
        Entry = 0,
        URL,
        MIMEType,
        Length,
        Title,
        DownloadAuditStatus,
        DownloadState,
        DownloadedPath,
        DownloadErrorDomain,
        DownloadErrorCode,
    };

    using CoreOf::CoreOf;

    /// The columns in the order of the table.
    static const SQLite::ColumnList& columnList();

    OVObject* createOVObject() override;

    EntryCore* getEntry() const;
    /// Each side of the link sets the other. The entry, which may be null, must outlive the link if
    /// it is not stored.
    void setEntry(EntryCore* entry);
    /// The first of a list that has the same URL, or null.
    EnclosureCore* matchingEnclosureFrom(
        const Foundation::ArrayOf<EnclosureCore>* enclosures) const;
    /// "EnclosureCore[<url> type sizeKB]", if that is in memory.
    Foundation::StringReturner toString() const override;

    SQLite::ToOneColumn<EntryCore, true> mEntry{this};
    SQLite::ScalarColumn<Foundation::URL> mURL{this};
    SQLite::ScalarColumn<Foundation::String> mMIMEType{this};
    SQLite::ScalarColumn<long long> mLength{this};  ///< bytes
    SQLite::ScalarColumn<Foundation::String> mTitle{this};
    /// 0 not audited, 1 approved, 2 not approved.
    SQLite::ScalarColumn<int> mDownloadAuditStatus{this};
    /// 0 none, 1 requested, 2 downloading, 3 finished, 4 failed, 5 deleted.
    SQLite::ScalarColumn<int> mDownloadState{this};
    SQLite::ScalarColumn<Foundation::URL> mDownloadedPath{this};  ///< of the finished file
    SQLite::ScalarColumn<long long> mDownloadErrorDomain{this};
    SQLite::ScalarColumn<int> mDownloadErrorCode{this};
};

}  // namespace Orvane
