#pragma once

#include <cstddef>
#include <string>

namespace Orvane {

/// Removal of files by plain paths. Any thread. Each operation gives 0 or an `errno`.
struct FileRemoval {
    /// Removes a file or a symbolic link, never a directory.
    [[nodiscard]] static int removeFile(const std::string& path);
    /// Removes a directory with all it holds, and stops at the first failure. Symbolic links are
    /// removed themselves; the path must not end in one. `removed` is how many items went, the
    /// directory among them, also after a failure.
    [[nodiscard]] static int removeDirectory(const std::string& path, std::size_t& removed);
    /// Whether the path names a directory and no symbolic link to one.
    static bool isDirectory(const std::string& path);
};

}  // namespace Orvane
