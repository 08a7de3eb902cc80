#pragma once

#include "Foundation/ArrayOf.h"
#include "Foundation/Date.h"
#include "Foundation/NetError.h"
#include "Foundation/String.h"
#include "Foundation/URL.h"

#include <cstddef>
#include <cstdint>

namespace Orvane {

/// Work on the files that URLs name.
///
/// A URL may be null or not that of a local file; that is an error like a file that is missing.
/// Errors are those of `Foundation::fileError` where nothing else is said: code -12 of domain 15
/// for what is not there, -13 for what may not be done, -11 for a URL of no local file, and an
/// `errno` in domain 1 for the rest. An operation that succeeds clears the error.
class FileUtils {
 public:
    using ArrayOfURLs = Foundation::ArrayOf<Foundation::URL>;
    using NetError = Foundation::NetError;
    using String = Foundation::String;
    using URL = Foundation::URL;

    /// Whether the file is there, at the end of any symbolic link. Warns if that can't be found
    /// out.
    static bool exists(URL* url);
    /// Makes sure that the directory is there, with those above it; new ones have mode 0700. All
    /// errors are of domain 15: -10 for those without a code of their own. Throws
    /// `AssertionFailure` unless the URL has a directory path.
    static bool createDirectory(URL* newDirURL, NetError& error);
    /// The same, with a warning on failure.
    static bool createDirectory(URL* newDirURL);

    /// Renames, over what is at `to`. Errors are of domain 1.
    static bool move(URL* from, URL* to, NetError& error);
    static bool move(URL* from, URL* to);
    /// Moves a file or directory to the desktop's trash or, where that can't take it, aside in
    /// place; see `Trash`. Errors are of domain 1.
    static bool moveToTrash(URL* url, NetError& error);
    /// Deletes a file or symbolic link, no directory.
    static bool deleteFile(URL* url, NetError& error);
    static bool deleteFile(URL* url);
    /// Deletes what the directory holds, then the directory; stops at the first failure. Follows no
    /// symbolic link. The number of items removed, counting the directory, or 0 with the error.
    static std::size_t deleteDirectory(URL* url, NetError& error);

    /// Deletes files on the thread of `FileDeletionQueue`. Failures draw a warning.
    static void asyncDeleteFiles(ArrayOfURLs* urls);
    /// The same for a directory with all it holds.
    static void asyncDeleteDirectory(URL* url);
    /// Whether such work is pending. Any thread.
    static bool isDeletingFilesAsynchronously();

    /// The URL, if nothing has its name, else the first that is free with "-1", "-2" and so on
    /// before the first "." of the name. Null for null.
    static Foundation::URLReturner pathWithUniqueFilenameForPath(URL* url);

    /// Null, and a log line, where it can't be told.
    static Foundation::DateReturner getFileModDate(URL* url);
    static Foundation::DateReturner getFileCreationDate(URL* url);
    /// In bytes; 0, and a log line, where it can't be told.
    static std::int64_t getFileLength(URL* url);
    /// The URLs of all that the directory holds, hidden files too, by name. Null, and a log line,
    /// where it can't be read.
    static Foundation::Returner<ArrayOfURLs> getDirectoryContents(URL* url, NetError& error);

    /// Marks a file as downloaded from `sourceURL` by way of `originURL`, a page with the given
    /// title, from a sender; see `Quarantine`. Users and passwords are left out of the URLs. All
    /// but `file` may be null. A failure is logged.
    static void markQuarantined(URL* file, URL* sourceURL, URL* originURL, String* title,
                                String* senderName = nullptr, String* senderEmail = nullptr);
};

}  // namespace Orvane
