#pragma once

#include "Foundation/Uncopyable.h"

#include <pthread.h>

namespace Foundation {

/// A recursive mutex. Any thread. Constructing throws `AssertionFailure` where the system refuses.
class Mutex : Uncopyable {
 public:
    Mutex();
    ~Mutex();

    void lock();
    void unlock();

 private:
    pthread_mutexattr_t m_mutex_attr;
    pthread_mutex_t m_mutex;
};

/// Holds a `Mutex`, which must outlive it, from `lock` to `unlock` or to its own end.
class MutexLock : Uncopyable {
 public:
    /// Locks at once.
    explicit MutexLock(Mutex* mutex) : mMutex(mutex) { lock(); }
    ~MutexLock() { unlock(); }

    /// Does nothing if already locked by this object.
    void lock();
    /// Does nothing if not locked by this object.
    void unlock();

 private:
    Mutex* mMutex;
    bool mLocked = false;
};

}  // namespace Foundation
