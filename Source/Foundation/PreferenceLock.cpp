#include "Foundation/PreferenceLock.h"

#include "Foundation/Clock.h"

#include <fcntl.h>
#include <glib.h>
#include <glib/gstdio.h>
#include <sys/file.h>

#include <cerrno>

namespace Foundation {

namespace {

constexpr double kPauseSeconds = 0.01;

}  // namespace

PreferenceLock::PreferenceLock(const std::string& folder) : mError(acquire(folder)) {}

int PreferenceLock::acquire(const std::string& folder) {
    constexpr int kOnlyTheUser = 0700;  // as the base directory specification wants it
    if (g_mkdir_with_parents(folder.c_str(), kOnlyTheUser) != 0) return errno;
    // Domains have no name that begins with a dot, so none is in the way.
    mFD = UniqueFD(open((folder + "/.lock").c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0600));
    return mFD ? waitForLock() : errno;
}

int PreferenceLock::waitForLock() const {
    constexpr int kAttempts = static_cast<int>(kPatienceSeconds / kPauseSeconds);
    for (int i = 0; i < kAttempts; ++i) {
        if (flock(mFD.get(), LOCK_EX | LOCK_NB) == 0) return 0;
        // A file system without locks must not keep preferences from being saved.
        if (errno == ENOLCK || errno == ENOTSUP || errno == ENOSYS) return 0;
        if (errno != EWOULDBLOCK && errno != EINTR) return errno;
        Clock::current().sleep(kPauseSeconds);
    }
    return EWOULDBLOCK;
}

}  // namespace Foundation
