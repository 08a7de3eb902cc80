#pragma once

#include "Foundation/Mutex.h"
#include "Foundation/ThreadUtil.h"
#include "Foundation/Uncopyable.h"

#include <atomic>
#include <cstddef>
#include <cstdint>

namespace Foundation {

class PFRefCounted;
class RefCounted;

enum class AutoreleaseTypeFlag : std::uint32_t { RefCounted = 0, PFRefCounted = 1 };

/// A block of a pool's entries, in the order they were added; blocks chain to the next one.
class AutoreleaseBucket : Uncopyable {
 public:
    static constexpr std::uint32_t kCapacity = 256;

    // The arrays are filled as entries come: clearing 3 KB for each callback would cost more than
    // the callback's own entries do.
    AutoreleaseBucket() {}

    /// Adds an entry here or, if this bucket is full, to a new next one. Gives the bucket used.
    AutoreleaseBucket* add(const void* object, AutoreleaseTypeFlag type);
    /// Gives up every entry, oldest first, then those of the chained buckets, which end with it.
    void drain();

 private:
    void drainOwnEntries();

    AutoreleaseBucket* mNext = nullptr;
    std::uint32_t mCount = 0;
    const void* mObjects[kCapacity];
    AutoreleaseTypeFlag mTypes[kCapacity];
};

/// Owns what was handed back without an owner until the pool's end, when it is given up in the
/// order it was added. Stands around every callback. Always on the stack, and pools end in the
/// opposite order of their beginning.
///
/// There is one stack of pools in the process. A thread that opens a pool waits until no other
/// thread has one open, and keeps the right to pools until its outermost pool ends.
///
/// A pool of at most 256 entries allocates nothing.
class AutoreleasePool : Uncopyable {
 public:
    AutoreleasePool();
    /// Throws `AssertionFailure` if this is not the top pool, unless an exception is in flight.
    ~AutoreleasePool() noexcept(false);

    static void* operator new(std::size_t) = delete;
    static void* operator new[](std::size_t) = delete;

    /// Gives one reference to the current pool, without a count, and the value back. Null is null.
    static const PFRefCounted* autorelease(const PFRefCounted* value);

    /// Adds an entry for an object that has just given a reference up. Where the calling thread
    /// has no pool this warns, with the call stack, and gives false: there is no entry then.
    static bool add(const RefCounted* object);

    /// Whether a pool of the calling thread is open: then no other thread can open one.
    static bool currentThreadHasPool();
    /// How many pools are open.
    static std::uint32_t getNestLevel() { return sAutoreleasePoolNestLevel; }

 private:
    static void warnNoPool(const RefCounted* object);
    static void warnNoPool(const PFRefCounted* object);
    template <class T>
    static bool addEntry(const T* object, AutoreleaseTypeFlag type);
    void leaveStack();
    void failNotOnTop(const AutoreleasePool* top) const;

    static AutoreleasePool* sCurrent;
    // Read by threads that have no pool and so do not hold the mutex.
    static std::atomic<ThreadID> sThread;
    static std::uint32_t sAutoreleasePoolNestLevel;

    MutexLock mLock;
    AutoreleaseBucket* mCurrentBucket = &mFirstBucket;
    AutoreleasePool* mPrevious;
    AutoreleaseBucket mFirstBucket;
};

}  // namespace Foundation
