#include "Foundation/AtomicFile.h"

#include "Foundation/UniqueFD.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <climits>
#include <cstdio>
#include <cstdlib>

namespace Foundation {

namespace {

constexpr int kMostLinks = 40;  // as the kernel follows
constexpr mode_t kPermissions = 0777;

/// The directory part of a path, with its final "/"; empty for a bare name.
std::string directoryOf(const std::string& path) {
    return path.substr(0, path.rfind('/') + 1);
}

/// Replaces `path` by what it leads to, over any number of symbolic links, so that its last
/// component is no link. The last one need not exist.
int followLinks(std::string& path) {
    for (int i = 0; i < kMostLinks; ++i) {
        char target[PATH_MAX];
        const ssize_t length = readlink(path.c_str(), target, sizeof target);
        if (length < 0) return errno == EINVAL || errno == ENOENT ? 0 : errno;
        if (length == sizeof target) return ENAMETOOLONG;
        const std::string_view next(target, static_cast<std::size_t>(length));
        path = next.starts_with('/') ? std::string(next) : directoryOf(path).append(next);
    }
    return ELOOP;
}

/// The permissions that the file at `path` has or, if there is none yet, is to get.
int permissionsFor(const std::string& path, mode_t& permissions) {
    struct stat info = {};
    permissions = S_IRUSR | S_IWUSR;
    if (stat(path.c_str(), &info) != 0) return errno == ENOENT ? 0 : errno;
    if (S_ISDIR(info.st_mode)) return EISDIR;
    // Replacing a device or a pipe by a file is never what was meant.
    if (!S_ISREG(info.st_mode)) return EINVAL;
    permissions = info.st_mode & kPermissions;
    return 0;
}

int writeAll(int fd, std::string_view content) {
    while (!content.empty()) {
        const ssize_t written = ::write(fd, content.data(), content.size());
        if (written < 0 && errno == EINTR) continue;
        if (written < 0) return errno;
        content.remove_prefix(static_cast<std::size_t>(written));
    }
    return 0;
}

int fill(int fd, std::string_view content, mode_t permissions) {
    if (const int error = writeAll(fd, content)) return error;
    if (fchmod(fd, permissions) != 0) return errno;
    return fsync(fd) == 0 ? 0 : errno;
}

/// Makes a rename in the directory last. File systems that have no such thing say EINVAL.
int syncDirectory(const std::string& directory) {
    const UniqueFD fd(
        open(directory.empty() ? "." : directory.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
    // A directory may be open for writing and searching only; its rename is as good as it gets.
    if (!fd) return errno == EACCES ? 0 : errno;
    return fsync(fd.get()) == 0 || errno == EINVAL ? 0 : errno;
}

}  // namespace

int AtomicFile::write(const std::string& path, std::string_view content) {
    std::string target = path;
    if (const int error = followLinks(target)) return error;
    mode_t permissions = 0;
    if (const int error = permissionsFor(target, permissions)) return error;

    const std::string directory = directoryOf(target);
    std::string temporary = directory + ".orvane-XXXXXX";
    UniqueFD fd(mkostemp(temporary.data(), O_CLOEXEC));
    if (!fd) return errno;
    int error = fill(fd.get(), content, permissions);
    fd.close();
    if (error == 0 && rename(temporary.c_str(), target.c_str()) != 0) error = errno;
    if (error != 0) {
        unlink(temporary.c_str());
        return error;
    }
    return syncDirectory(directory);
}

}  // namespace Foundation
