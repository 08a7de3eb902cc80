#pragma once

#include <string>
#include <string_view>

namespace Foundation {

/// Writes files so that a reader, a crash or a full disk never meets half of one.
struct AtomicFile {
    /// Makes `content` the whole content of the file at `path`, on the disk when this returns. A
    /// new file has mode 0600; one that is replaced keeps its permissions. A symbolic link stays,
    /// and the file it leads to is written.
    ///
    /// Gives 0 or the `errno` of what failed. After a failure the file is as it was before, and
    /// nothing is left beside it; only where the directory alone could not be synced (the one
    /// failure after the replacement) the new content stands, and may not outlive a power cut.
    ///
    /// Blocks on the disk. Any thread; of two writers at a time, one wins whole.
    [[nodiscard]] static int write(const std::string& path, std::string_view content);
};

}  // namespace Foundation
