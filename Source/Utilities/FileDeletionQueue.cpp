#include "Utilities/FileDeletionQueue.h"

#include "Foundation/AutoreleasePool.h"
#include "Foundation/FileErrors.h"
#include "Foundation/Logger.h"
#include "Utilities/FileRemoval.h"

#include <pthread.h>

#include <cerrno>
#include <csignal>
#include <system_error>

namespace Orvane {

namespace {

constexpr char kThreadName[] = "OV.FileDeletion";

/// Keeps signals away from threads that are started meanwhile: they are the run loop's.
class SignalsBlocked : Foundation::Uncopyable {
 public:
    SignalsBlocked() {
        sigset_t all;
        sigfillset(&all);
        pthread_sigmask(SIG_SETMASK, &all, &mBefore);
    }
    ~SignalsBlocked() { pthread_sigmask(SIG_SETMASK, &mBefore, nullptr); }

 private:
    sigset_t mBefore = {};
};

}  // namespace

FileDeletionQueue& FileDeletionQueue::shared() {
    static FileDeletionQueue sQueue;
    return sQueue;
}

FileDeletionQueue::FileDeletionQueue() {
    // A queue that ends with the process may still warn, so these must end after it.
    Foundation::standardErrorSink();
    Foundation::journalSink();
}

FileDeletionQueue::~FileDeletionQueue() {
    std::unique_lock lock(mMutex);
    mIsEnding = true;
    // A process that exits inside a callback never closes its pool: a warning that has begun to
    // wait for one stays where it is.
    const bool poolsAreShut = Foundation::AutoreleasePool::currentThreadHasPool();
    mChanged.wait(lock, [&] { return !mIsRunning || (poolsAreShut && mIsWarning); });
    const bool isStuck = mIsRunning;
    lock.unlock();
    if (isStuck) {
        mThread.detach();
    } else if (mThread.joinable()) {
        mThread.join();
    }
}

void FileDeletionQueue::add(std::vector<Item> items, bool areDirectories) {
    ++mPending;
    std::unique_lock lock(mMutex);
    mJobs.push_back({std::move(items), areDirectories});
    if (mIsRunning) return;
    mIsRunning = true;
    if (mThread.joinable()) mThread.join();  // it has left its loop already
    try {
        const SignalsBlocked signalsBlocked;
        mThread = std::thread(&FileDeletionQueue::run, this);
        pthread_setname_np(mThread.native_handle(), kThreadName);
    } catch (const std::system_error&) {
        // No thread to be had: late is better than never, and here better than not.
        lock.unlock();
        run();
    }
}

void FileDeletionQueue::waitUntilIdle() {
    std::unique_lock lock(mMutex);
    mChanged.wait(lock, [&] { return mPending == 0; });
}

void FileDeletionQueue::run() noexcept {
    std::unique_lock lock(mMutex);
    while (!mJobs.empty()) {
        const Job job = std::move(mJobs.front());
        mJobs.pop_front();
        lock.unlock();
        try {
            perform(job);
        } catch (...) {
            Foundation::warnAboutCurrentException("void Orvane::FileDeletionQueue::run()");
        }
        lock.lock();
        --mPending;
        mChanged.notify_all();
    }
    mIsRunning = false;
    mChanged.notify_all();
}

void FileDeletionQueue::perform(const Job& job) {
    for (const Item& item : job.items) {
        std::size_t removed = 0;
        const bool isTree = job.areDirectories && FileRemoval::isDirectory(item.path);
        const int error = isTree ? FileRemoval::removeDirectory(item.path, removed)
                                 : FileRemoval::removeFile(item.path);
        if (error != 0) warn(item, error);
    }
}

void FileDeletionQueue::warn(const Item& item, int error) {
    const auto log = [&] {
        Foundation::gWarn.log("Deleting <%s> got %@", item.url, Foundation::fileError(error));
    };
    std::unique_lock lock(mMutex);
    // The thread that ends the queue waits for it, so there is nothing to be kept out.
    if (mIsEnding) return log();
    mIsWarning = true;
    mChanged.notify_all();
    lock.unlock();
    {
        const Foundation::AutoreleasePool pool;
        log();
    }
    lock.lock();
    mIsWarning = false;
}

}  // namespace Orvane
