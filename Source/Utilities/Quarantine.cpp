#include "Utilities/Quarantine.h"

#include <sys/xattr.h>

#include <cerrno>
#include <utility>

namespace Orvane {

namespace {

int setAttribute(const std::string& path, const char* name, const std::string& value) {
    if (!value.empty()) {
        return setxattr(path.c_str(), name, value.data(), value.size(), 0) == 0 ? 0 : errno;
    }
    return removexattr(path.c_str(), name) == 0 || errno == ENODATA ? 0 : errno;
}

}  // namespace

int Quarantine::mark(const std::string& path, const FileOrigin& origin) {
    int result = 0;
    for (const auto& [name, value] : {std::pair("user.xdg.origin.url", &origin.url),
                                      std::pair("user.xdg.referrer.url", &origin.referrer),
                                      std::pair("user.xdg.publisher", &origin.publisher),
                                      std::pair("user.xdg.creator", &origin.creator)}) {
        const int error = setAttribute(path, name, *value);
        if (error == ENOTSUP) return 0;
        if (result == 0) result = error;
    }
    return result;
}

}  // namespace Orvane
