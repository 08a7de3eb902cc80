#include "Net/CacheDirectory.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Ref.h"
#include "Foundation/URL.h"
#include "Utilities/FileUtils.h"

#include <cstdlib>

namespace Orvane {

namespace {

/// The value of a variable that is the path of a directory; empty if it is none.
std::string directoryOf(const char* variable) {
    const char* value = std::getenv(variable);
    return value && *value == '/' ? value : "";
}

}  // namespace

std::string CacheDirectory::path() {
    const Foundation::AutoreleasePool pool;
    std::string base = directoryOf("XDG_CACHE_HOME");
    if (base.empty() && !directoryOf("HOME").empty()) base = directoryOf("HOME") + "/.cache";
    if (base.empty()) return {};
    const std::string path = base + "/orvane";
    const Foundation::Ref<Foundation::URL> url =
        Foundation::URL::urlWithFileSystemPath(path.c_str(), true);
    return FileUtils::createDirectory(url) ? path : "";
}

}  // namespace Orvane
