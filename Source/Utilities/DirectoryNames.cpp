#include "Utilities/DirectoryNames.h"

#include <dirent.h>

#include <cerrno>
#include <memory>
#include <string_view>

namespace Orvane {

int DirectoryNames::read(Foundation::UniqueFD directory, std::vector<std::string>& names) {
    const std::unique_ptr<DIR, int (*)(DIR*)> list(fdopendir(directory.get()), closedir);
    if (!list) return errno;
    (void)directory.detach();
    for (;;) {
        errno = 0;
        const dirent* entry = readdir(list.get());  // NOLINT(concurrency-*): a list of our own
        if (!entry) return errno;
        const std::string_view name = entry->d_name;
        if (name != "." && name != "..") names.emplace_back(name);
    }
}

}  // namespace Orvane
