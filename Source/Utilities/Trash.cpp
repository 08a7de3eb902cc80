#include "Utilities/Trash.h"

#include "Foundation/Logger.h"

#include <fcntl.h>
#include <gio/gio.h>
#include <sys/stat.h>

#include <cerrno>
#include <cstdio>
#include <memory>

namespace Orvane {

namespace {

/// Renames unless something has the new name.
int renameToFreeName(const std::string& from, const std::string& to) {
    if (renameat2(AT_FDCWD, from.c_str(), AT_FDCWD, to.c_str(), RENAME_NOREPLACE) == 0) return 0;
    if (errno != EINVAL) return errno;
    // A file system that cannot tell in the same step.
    struct stat info = {};
    if (lstat(to.c_str(), &info) == 0) return EEXIST;
    return std::rename(from.c_str(), to.c_str()) == 0 ? 0 : errno;
}

int renameAside(const std::string& path, std::string& aside) {
    for (unsigned n = 1;; ++n) {
        aside = path + ".aside." + std::to_string(n);
        const int error = renameToFreeName(path, aside);
        if (error != EEXIST) return error;
    }
}

}  // namespace

int Trash::moveAway(const std::string& path) {
    // Only the local files' own service: the desktop's others would look for its message bus.
    const std::unique_ptr<GFile, void (*)(void*)> file(
        g_vfs_get_file_for_path(g_vfs_get_local(), path.c_str()), g_object_unref);
    GError* failure = nullptr;
    if (g_file_trash(file.get(), nullptr, &failure)) return 0;
    const std::unique_ptr<GError, void (*)(GError*)> reason(failure, g_error_free);
    std::string aside;
    const int error = renameAside(path, aside);
    if (error == 0) {
        Foundation::gLog.log("The trash did not take <%s> (%s): it is now <%s>", path,
                             reason->message, aside);
    }
    return error;
}

}  // namespace Orvane
