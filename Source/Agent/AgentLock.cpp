#include "Agent/AgentLock.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/Clock.h"
#include "Foundation/Logger.h"
#include "Foundation/Ref.h"
#include "Foundation/String.h"
#include "Foundation/URL.h"
#include "Utilities/FileSystem.h"
#include "Utilities/FileUtils.h"

#include <fcntl.h>
#include <sys/file.h>

#include <cerrno>
#include <cstring>
#include <string>

namespace Orvane {

using namespace Foundation;

namespace {

constexpr const char* kFileName = ".agent";

/// The file, made if it is not there; empty, with `errno`, if that cannot be.
UniqueFD openFile() {
    const AutoreleasePool pool;
    const Ref<URL> storage = Compatibility::FileSystem::getStorageURL();
    NetError error;
    FileUtils::createDirectory(storage, error);
    const Ref<String> name = String::string(kFileName);
    const Ref<URL> file = storage->byAppending(name, false);
    const std::string path = file->getFileSystemRepresentation();
    return UniqueFD(open(path.c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0600));
}

}  // namespace

bool AgentLock::take(double seconds) {
    UniqueFD file = openFile();
    const double end = Clock::current().now() + seconds;
    int error = file ? 0 : errno;
    while (file && flock(file.get(), LOCK_EX | LOCK_NB) != 0) {
        error = errno;
        if (error != EWOULDBLOCK && error != EINTR) break;
        if (Clock::current().now() >= end) return false;
        Clock::current().sleep(kRetrySeconds);
        error = 0;
    }
    if (error != 0) gWarn.log("The storage cannot be locked: %s", std::strerror(error));
    mFile = std::move(file);
    return true;
}

}  // namespace Orvane
