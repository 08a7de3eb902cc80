#pragma once

#include "Foundation/NetError.h"
#include "Foundation/URL.h"
#include "Model/CoreOf.h"
#include "Model/Downloader.h"
#include "SQLite/RowIterator.h"
#include "SQLite/ScalarColumn.h"
#include "SQLite/ToOneColumn.h"

namespace Orvane {

class ClientCore;
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

    /// Values of `mDownloadAuditStatus`.
    enum AuditStatus : int { kNotAudited = 0, kApproved = 1, kNotApproved = 2 };
    /// Values of `mDownloadState`.
    enum State : int {
        kNoDownload = 0,
        kRequested = 1,
        kDownloading = 2,
        kFinished = 3,
        kFailed = 4,  ///< or cancelled
        kDeleted = 5,
    };
    /// What a cancelled download has for its error.
    static constexpr Foundation::NetError kCancelled{Foundation::NetError::kPFURL, -999};

    using CoreOf::CoreOf;

    /// The columns in the order of the table.
    static const SQLite::ColumnList& columnList();

    OVObject* createOVObject() override;

    /// Null without one, and if the file has lost it.
    EntryCore* getEntry() const;
    /// Each side of the link sets the other. The entry, which may be null, must outlive the link if
    /// it is not stored.
    void setEntry(EntryCore* entry);
    /// The first of a list that has the same URL, or null.
    EnclosureCore* matchingEnclosureFrom(
        const Foundation::ArrayOf<EnclosureCore>* enclosures) const;
    /// "EnclosureCore[<url> type sizeKB]", if that is in memory.
    Foundation::StringReturner toString() const override;

    /// A client's enclosures that meet a condition of SQL on "encl", "entry" and "sub", all for
    /// null: what is to be downloaded first, then by subscription and entry.
    static SQLite::RowIterator<EnclosureCore> getEnclosures(ClientCore* client,
                                                            const char* condition);
    /// Deletes those that meet a condition of SQL, with their finished files. How many there were.
    static int deleteEnclosuresWhere(const char* condition);

    // Which are downloaded without being asked for.

    /// Notes whether a subscription of the feed wants the file. Once, for a new enclosure.
    void auditForDownload();
    /// Starts up to two downloads that are wanted and not done, each once in the life of the
    /// process; one that was cancelled stays so. Whether any was started.
    static bool startAutoDownloads();
    /// The process has tried none.
    static void _forgetAutoDownloads();

    // Downloading. The operations ask the agent where the row may not be changed here, and throw
    // what `AgentLink` does; each has the one that the agent carries out.

    /// Starts or resumes the download. Whether that could be.
    bool download();
    bool downloadActual();
    /// Stops it, and what was there is not tried again by itself. True but for a failed call.
    bool cancelDownload();
    bool cancelDownloadActual();
    /// Deletes the file, and what there is of one. Whether there was any.
    bool deleteDownload();
    bool deleteDownloadActual();
    /// Notes it if the finished file has been deleted by somebody else. True but for a failed call.
    bool checkDownload();
    bool checkDownloadActual();

    Foundation::NetError getDownloadError() const;
    void setDownloadError(Foundation::NetError error);
    /// Tells all processes; what they get is IDs and a number of bytes.
    void postDownloadStarted();
    void postDownloadProgress();
    /// The same, and lets the downloader go.
    void postDownloadEnded();

    /// From 0.0 to 1.0, which is a finished file that is there.
    double getDownloadProgress() const;
    /// Whether the finished file is not there any more.
    bool wasDownloadDeleted() const;
    /// For a process that heard of the progress.
    void setDownloadedBytes(long long bytes);

    // Places of the file.

    /// The directory for what there is of it; null without a URL.
    Foundation::URL* getIncompleteDownloadURL() const;
    Foundation::URL* getIncompleteDownloadFile() const;
    /// A free place in the directory of downloads, by a name that the server suggests, which may be
    /// null, or by the URL. Whatever they are, it is a plain name.
    Foundation::URLReturner calculateUniqueDownloadFile(Foundation::String* suggestedName) const;

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

 private:
    void postDownload(const Foundation::NotificationName& name);

    mutable Foundation::Ref<Foundation::URL> mIncompleteURL;   ///< null until asked for
    mutable Foundation::Ref<Foundation::URL> mIncompleteFile;  ///< null until asked for
    Foundation::Ref<Downloader> mDownloader;                   ///< while it runs
    long long mDownloadedBytes = -1;                           ///< below 0 while unknown
};

}  // namespace Orvane
