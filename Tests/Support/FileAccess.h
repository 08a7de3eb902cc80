#pragma once

#include <sys/fsuid.h>

#include <sys/resource.h>
#include <csignal>

namespace Support {

/// The calling thread meets files as an ordinary user while this lives, even where the tests run
/// as root, so that permissions count.
class OrdinaryFileAccess {
 public:
    OrdinaryFileAccess() : mUser(setfsuid(kNobody)) {
        if (mUser != 0) setfsuid(static_cast<uid_t>(mUser));
    }
    ~OrdinaryFileAccess() { setfsuid(static_cast<uid_t>(mUser)); }
    OrdinaryFileAccess(const OrdinaryFileAccess&) = delete;
    OrdinaryFileAccess& operator=(const OrdinaryFileAccess&) = delete;

 private:
    static constexpr uid_t kNobody = 65534;
    int mUser;
};

/// No file can grow beyond `bytes` while this lives, as on a disk that is full: writing fails with
/// EFBIG.
class FileSizeLimit {
 public:
    explicit FileSizeLimit(rlim_t bytes) : mHandler(std::signal(SIGXFSZ, SIG_IGN)) {
        getrlimit(RLIMIT_FSIZE, &mLimit);
        rlimit limit = mLimit;
        limit.rlim_cur = bytes;
        setrlimit(RLIMIT_FSIZE, &limit);
    }
    ~FileSizeLimit() {
        setrlimit(RLIMIT_FSIZE, &mLimit);
        std::signal(SIGXFSZ, mHandler);
    }
    FileSizeLimit(const FileSizeLimit&) = delete;
    FileSizeLimit& operator=(const FileSizeLimit&) = delete;

 private:
    rlimit mLimit = {};
    void (*mHandler)(int);
};

}  // namespace Support
