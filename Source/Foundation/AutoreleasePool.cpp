#include "Foundation/AutoreleasePool.h"

#include "Foundation/AssertionFailure.h"

#include "Foundation/Logger.h"
#include "Foundation/Ref.h"
#include "Foundation/String.h"
#include "Foundation/Utils.h"

#include <exception>
#include <memory>

namespace Foundation {

namespace {

/// The mutex that a thread holds while it has a pool. Never destroyed: pools outlive statics.
Mutex* poolMutex() {
    static Mutex* sMutex = new Mutex;
    return sMutex;
}

}  // namespace

AutoreleasePool* AutoreleasePool::sCurrent = nullptr;
std::atomic<ThreadID> AutoreleasePool::sThread = 0;
std::uint32_t AutoreleasePool::sAutoreleasePoolNestLevel = 0;

AutoreleaseBucket* AutoreleaseBucket::add(const void* object, AutoreleaseTypeFlag type) {
    if (mCount == kCapacity) {
        mNext = new AutoreleaseBucket;
        return mNext->add(object, type);
    }
    mObjects[mCount] = object;
    mTypes[mCount] = type;
    ++mCount;
    return this;
}

void AutoreleaseBucket::drain() {
    drainOwnEntries();
    std::unique_ptr<AutoreleaseBucket> next(mNext);
    mNext = nullptr;
    while (next) {
        next->drainOwnEntries();
        std::unique_ptr<AutoreleaseBucket> done = std::move(next);
        next.reset(done->mNext);
    }
}

void AutoreleaseBucket::drainOwnEntries() {
    for (std::uint32_t i = 0; i < mCount; ++i) {
        if (mTypes[i] == AutoreleaseTypeFlag::PFRefCounted) {
            static_cast<const PFRefCounted*>(mObjects[i])->release();
        } else {
            static_cast<const RefCounted*>(mObjects[i])->_evaporate();
        }
    }
    mCount = 0;
}

AutoreleasePool::AutoreleasePool() : mLock(poolMutex()) {
    const ThreadID thread = ThreadUtil::IDCurrent();
    OV_ASSERT_AS(!sThread || sThread == thread, "!sThread || sThread == ThreadUtil::IDCurrent()");
    if (sAutoreleasePoolNestLevel != 0) {
        OV_ASSERT_AS(sThread == thread,
                     "!sAutoreleasePoolNestLevel || sThread == ThreadUtil::IDCurrent()");
    }
    ++sAutoreleasePoolNestLevel;
    sThread = thread;
    mPrevious = sCurrent;
    sCurrent = this;
}

AutoreleasePool::~AutoreleasePool() noexcept(false) {
    AutoreleasePool* const top = sCurrent;
    leaveStack();
    mFirstBucket.drain();
    if (top != this) failNotOnTop(top);
}

void AutoreleasePool::leaveStack() {
    AutoreleasePool** link = &sCurrent;
    while (*link != this) {
        OV_ASSERT(*link);
        link = &(*link)->mPrevious;
    }
    *link = mPrevious;
    OV_ASSERT(sAutoreleasePoolNestLevel);
    --sAutoreleasePoolNestLevel;
    if (sAutoreleasePoolNestLevel == 0) sThread = 0;
}

void AutoreleasePool::failNotOnTop(const AutoreleasePool* top) const {
    try {
        AssertionFailure::failed(
            "Foundation::AutoreleasePool::~AutoreleasePool()", "sCurrent==this",
            "Non-top AutoreleasePool being popped (this=%p, top=%p)", this, top);
    } catch (...) {
        // The assertion is in the log. A second exception in flight would end the process.
        if (std::uncaught_exceptions() == 0) throw;
    }
}

bool AutoreleasePool::currentThreadHasPool() {
    return sThread == ThreadUtil::IDCurrent() && sCurrent;
}

template <class T>
bool AutoreleasePool::addEntry(const T* object, AutoreleaseTypeFlag type) {
    if (!currentThreadHasPool()) {
        warnNoPool(object);
        return false;
    }
    sCurrent->mCurrentBucket = sCurrent->mCurrentBucket->add(object, type);
    return true;
}

bool AutoreleasePool::add(const RefCounted* object) {
    return addEntry(object, AutoreleaseTypeFlag::RefCounted);
}

const PFRefCounted* AutoreleasePool::autorelease(const PFRefCounted* value) {
    if (value) addEntry(value, AutoreleaseTypeFlag::PFRefCounted);
    return value;
}

void AutoreleasePool::warnNoPool(const RefCounted* object) {
    AutoreleasePool pool;
    gWarn.log("No pool to handle autorelease of %@", object);
    Compatibility::Utils::printStack(3, 10);
}

void AutoreleasePool::warnNoPool(const PFRefCounted* object) {
    AutoreleasePool pool;
    gWarn.log("No pool to handle autorelease of %@", object);
    Compatibility::Utils::printStack(3, 10);
}

}  // namespace Foundation
