#include "Foundation/Mutex.h"

#include "Foundation/AssertionFailure.h"

namespace Foundation {

Mutex::Mutex() {
    OV_ASSERT_AS(0 == pthread_mutexattr_init(&m_mutex_attr),
                 "0==pthread_mutexattr_init(&m_mutex_attr)");
    OV_ASSERT_AS(0 == pthread_mutexattr_settype(&m_mutex_attr, PTHREAD_MUTEX_RECURSIVE),
                 "0==pthread_mutexattr_settype(&m_mutex_attr, PTHREAD_MUTEX_RECURSIVE)");
    OV_ASSERT_AS(0 == pthread_mutex_init(&m_mutex, &m_mutex_attr),
                 "0==pthread_mutex_init(&m_mutex, &m_mutex_attr)");
}

Mutex::~Mutex() {
    pthread_mutex_destroy(&m_mutex);
    pthread_mutexattr_destroy(&m_mutex_attr);
}

void Mutex::lock() {
    pthread_mutex_lock(&m_mutex);
}

void Mutex::unlock() {
    pthread_mutex_unlock(&m_mutex);
}

void MutexLock::lock() {
    if (mLocked) return;
    mMutex->lock();
    mLocked = true;
}

void MutexLock::unlock() {
    if (!mLocked) return;
    mMutex->unlock();
    mLocked = false;
}

}  // namespace Foundation
