#include "Foundation/RuntimeDirectory.h"

#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>

namespace Foundation {

namespace {

constexpr mode_t kPrivate = S_IRWXU;
constexpr mode_t kPermissions = 07777;

bool isPrivateDirectory(const struct stat& status) {
    return S_ISDIR(status.st_mode) && status.st_uid == geteuid() &&
           (status.st_mode & kPermissions) == kPrivate;
}

/// Makes a directory with mode 0700 whatever the umask is. True if it is there now.
bool makeDirectory(const std::string& path) {
    if (mkdir(path.c_str(), kPrivate) == 0) {
        return chmod(path.c_str(), kPrivate) == 0;
    }
    return errno == EEXIST;
}

}  // namespace

bool RuntimeDirectory::isTrusted(const std::string& path) {
    struct stat status;
    return stat(path.c_str(), &status) == 0 && isPrivateDirectory(status);
}

bool RuntimeDirectory::makePrivate(const std::string& path, std::string& error) {
    struct stat status;
    if (!makeDirectory(path) || lstat(path.c_str(), &status) != 0) {
        error = "can't make the directory " + path + ": " + std::strerror(errno);
        return false;
    }
    if (isPrivateDirectory(status)) return true;
    error = path + " is no directory that belongs to the user alone";
    return false;
}

std::string RuntimeDirectory::getBase(std::string& error) {
    const char* given = std::getenv("XDG_RUNTIME_DIR");
    if (given && given[0] == '/' && isTrusted(given)) return given;
    const std::string own = "/tmp/orvane-" + std::to_string(geteuid());
    return makePrivate(own, error) ? own : std::string();
}

std::string RuntimeDirectory::getPath(std::string& error) {
    const std::string base = getBase(error);
    if (base.empty()) return base;
    const std::string path = base + "/Orvane";
    return makePrivate(path, error) ? path : std::string();
}

}  // namespace Foundation
