#pragma once

#include "Foundation/Bundle.h"
#include "Foundation/String.h"
#include "Foundation/URL.h"

#include <optional>
#include <string>

namespace Compatibility {

/// Where files are. Main thread.
///
///     <base>/Orvane/                         getStorageURL
///     <base>/Orvane/Database/                getStorageDatabaseURL
///     <base>/Orvane/Database/Database.sqlite3  getStorageDatabaseFile
///     <base>/Orvane/Clients.plist            getClientPListURL
///     <base>/Orvane/Feeds/                   getStorageTruthURL
///     <base>/Orvane/Downloads/               getStorageEnclosuresURL
///     <base>/Orvane/Downloads/Incomplete/    getStorageIncompleteEnclosuresURL
///
/// No accessor makes or looks at a file.
class FileSystem {
 public:
    using Bundle = Foundation::Bundle;
    using String = Foundation::String;
    using URL = Foundation::URL;
    using URLReturner = Foundation::URLReturner;

    /// Puts the tree elsewhere. Null stands for the user's directory of application data, which is
    /// then looked up anew.
    static void setStorageBaseURL(URL* url);
    /// What was set, or else "$XDG_DATA_HOME", or else ".local/share" in the user's home. Looked up
    /// once. Throws `AssertionFailure` where the user has no home.
    static URLReturner getStorageBaseURL();

    static URLReturner getStorageURL();
    static URLReturner getStorageDatabaseURL();
    static URLReturner getStorageDatabaseFile();
    static URLReturner getClientPListURL();
    static URLReturner getStorageTruthURL();
    static URLReturner getStorageEnclosuresURL();
    static URLReturner getStorageIncompleteEnclosuresURL();

    /// The library's own resources.
    static Bundle* getFrameworkBundle();
    /// The resources of the running program: what it has set, or else the library's.
    static Bundle* getClientBundle();
    /// For a program that has resources of its own. Null takes it back.
    static void setClientBundle(Bundle* bundle);

    /// "/tmp".
    static URLReturner getTempURL();

    /// The icon, a local file, of a type of files: by MIME type or, where that is null or unknown,
    /// by a file name or bare extension. Null if the desktop has none.
    static URLReturner getFileIconURL(String* type, String* name);
    /// The icon for a local file, by its name. Null if the desktop has none.
    static URLReturner getLocalFileIconURL(URL* file);

    /// The user's directory of application data by the values of $XDG_DATA_HOME and $HOME and the
    /// home of the user's account, each of which may be null. Values that are not absolute paths
    /// count as unset. Empty if none is left.
    static std::string findDataDirectory(const char* xdgDataHome, const char* home,
                                         const char* accountHome);
};

}  // namespace Compatibility
