#pragma once

#include <string>

namespace Foundation {

/// Where the files are that are installed with the library. It may have been installed under
/// another prefix than it was built for, or moved with all of them since: what stands at the right
/// place beside it counts first.
struct InstalledTree {
    /// The directory that `fromLibrary`, a relative path, leads to from where the library is;
    /// `builtFor` if there is none. Without a library, in a program that holds all of it, the
    /// program's place counts. Any thread.
    static std::string findDirectory(const std::string& fromLibrary, const std::string& builtFor);
};

}  // namespace Foundation
