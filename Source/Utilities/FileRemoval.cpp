#include "Utilities/FileRemoval.h"

#include "Foundation/UniqueFD.h"
#include "Utilities/DirectoryNames.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <utility>
#include <vector>

namespace Orvane {

using Foundation::UniqueFD;

namespace {

int removeDirectoryAt(int parent, const char* name, std::size_t& removed);

int removeItemAt(int parent, const char* name, std::size_t& removed) {
    struct stat info = {};
    if (fstatat(parent, name, &info, AT_SYMLINK_NOFOLLOW) != 0) return errno;
    if (S_ISDIR(info.st_mode)) return removeDirectoryAt(parent, name, removed);
    if (unlinkat(parent, name, 0) != 0) return errno;
    ++removed;
    return 0;
}

/// Walks by descriptors, so that nobody who swaps a directory for a link can lead it elsewhere.
int removeDirectoryAt(int parent, const char* name, std::size_t& removed) {
    const int flags = O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC;
    const UniqueFD directory(openat(parent, name, flags));
    UniqueFD listed(directory ? fcntl(directory.get(), F_DUPFD_CLOEXEC, 0) : -1);
    if (!directory || !listed) return errno;
    // All are read before any is removed: what a listing gives while its directory changes is up to
    // the file system.
    std::vector<std::string> names;
    if (const int error = DirectoryNames::read(std::move(listed), names)) return error;
    for (const std::string& item : names) {
        if (const int error = removeItemAt(directory.get(), item.c_str(), removed)) return error;
    }
    if (unlinkat(parent, name, AT_REMOVEDIR) != 0) return errno;
    ++removed;
    return 0;
}

}  // namespace

int FileRemoval::removeFile(const std::string& path) {
    return unlink(path.c_str()) == 0 ? 0 : errno;
}

int FileRemoval::removeDirectory(const std::string& path, std::size_t& removed) {
    removed = 0;
    return removeDirectoryAt(AT_FDCWD, path.c_str(), removed);
}

bool FileRemoval::isDirectory(const std::string& path) {
    struct stat info = {};
    return lstat(path.c_str(), &info) == 0 && S_ISDIR(info.st_mode);
}

}  // namespace Orvane
