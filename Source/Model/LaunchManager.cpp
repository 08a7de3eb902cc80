#include "Model/LaunchManager.h"

#include "Foundation/Logger.h"
#include "Foundation/NetError.h"
#include "Utilities/FileUtils.h"

#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <limits>
#include <string>

namespace Orvane {

using Foundation::gLog;
using Foundation::gWarn;

namespace {

void waitFor(pid_t child) {
    int status = 0;
    pid_t ended = -1;
    do {
        ended = waitpid(child, &status, 0);
    } while (ended < 0 && errno == EINTR);
    if (ended < 0) {
        gWarn.log("LaunchManager: waitpid itself returned err %i", errno);
    } else if (!WIFEXITED(status)) {
        gWarn.log("LaunchManager: svcctl didn't exit (waitpid status = %i)", status);
    } else if (WEXITSTATUS(status) != 0) {
        gWarn.log("LaunchManager: svcctl exited with status %i", WEXITSTATUS(status));
    }
}

void unload(std::string path, std::string tool) {
    std::string command = "unload";
    char* arguments[] = {tool.data(), command.data(), path.data(), nullptr};
    const pid_t child = fork();
    if (child == 0) {
        // Libraries have descriptors of which they do not say that they are for this process alone.
        constexpr unsigned kFirst = STDERR_FILENO + 1;
        close_range(kFirst, std::numeric_limits<unsigned>::max(), 0);
        execv(tool.c_str(), arguments);
        _exit(errno);
    }
    if (child < 0) {
        gWarn.log("LaunchManager: fork() failed, err=%i", errno);
    } else {
        waitFor(child);
    }
}

}  // namespace

void LaunchManager::removeJob(Foundation::URL* description, const char* tool) {
    if (!FileUtils::exists(description)) return;
    gLog.log("Unregistering old svcd plist file");
    unload(description->getFileSystemRepresentation(), tool);
    gLog.log("Deleting old svcd plist file");
    FileUtils::deleteFile(description);
}

}  // namespace Orvane
