#include "Foundation/Mutex.h"

#include <gtest/gtest.h>

#include <thread>

using namespace Foundation;

namespace {

/// Returns once another thread has had the mutex, which must be free by then.
void passToAnotherThread(Mutex& mutex) {
    std::thread other([&] { const MutexLock lock(&mutex); });
    other.join();
}

}  // namespace

TEST(Mutex, IsRecursive) {
    Mutex mutex;
    {
        const MutexLock outer(&mutex);
        const MutexLock inner(&mutex);
    }
    passToAnotherThread(mutex);
}

TEST(Mutex, KeepsOtherThreadsOut) {
    Mutex mutex;
    bool isDone = false;
    bool wasDone = false;
    std::thread other;
    {
        const MutexLock lock(&mutex);
        other = std::thread([&] {
            const MutexLock mine(&mutex);
            wasDone = isDone;
        });
        isDone = true;
    }
    other.join();
    EXPECT_TRUE(wasDone);
}

TEST(MutexLock, LocksOnceAndUnlocksOnce) {
    Mutex mutex;
    MutexLock lock(&mutex);
    lock.lock();
    lock.unlock();
    passToAnotherThread(mutex);
    mutex.lock();
    lock.unlock();  // not its own
    lock.lock();
    lock.unlock();
    mutex.unlock();
    passToAnotherThread(mutex);
}

TEST(MutexLock, UnlocksAtItsEndUnlessThatIsDone) {
    Mutex mutex;
    { const MutexLock lock(&mutex); }
    passToAnotherThread(mutex);
    {
        MutexLock lock(&mutex);
        lock.unlock();
    }
    passToAnotherThread(mutex);
}
