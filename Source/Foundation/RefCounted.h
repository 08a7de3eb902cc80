#pragma once

#include <cstddef>
#include <cstdint>

namespace Foundation {

class String;
template <class T>
class Returner;
using StringReturner = Returner<String>;

/// Base of what is shared and owns other things: rows, tasks, feeders, parsers.
///
/// An object is new (count 0, in no pool), owned (count at least 1), held by a pool alone (count 0,
/// pooled) or destroyed; the last `release` of an object in no pool destroys it, and so does a pool
/// that drains its entry at count 0. Hold it by `Ref<T>`; hand it back by `Returner<T>`.
///
/// Counts are plain integers: a thread that touches counted objects does so inside an
/// `AutoreleasePool`, which keeps every other such thread out.
class RefCounted {
 public:
    RefCounted(const RefCounted&) = delete;
    RefCounted& operator=(const RefCounted&) = delete;

    /// Equal objects have equal hash codes. The default is the address.
    virtual std::size_t getPFHashCode() const;
    /// Whether the two stand for the same thing. `other` may be null. The default is identity.
    virtual bool isEqual(const RefCounted* other) const;
    /// A description for logs. The default names class, address, count and, by a "p", the pool.
    virtual StringReturner toString() const;
    /// Warns if references are left.
    virtual ~RefCounted();

    void retain() const { ++mRefCount; }
    /// Gives up one reference; destroys the object with the last one unless a pool holds it.
    /// Throws `AssertionFailure` at count 0.
    void release() const;
    /// Gives up one reference to the current pool. Throws `AssertionFailure` if the object has
    /// none and is pooled already.
    const RefCounted* autorelease() const;
    /// Makes a new object an owned one: the creator calls it to hand its object on as a reference.
    /// Does nothing to an object that is owned or pooled.
    const RefCounted* adopted() const;

    std::uint32_t getRefCount() const { return mRefCount; }
    bool isPooled() const { return mPooled; }

    /// Only for a pool that drains: ends the pool's hold, and the object if nothing else holds it.
    void _evaporate() const;

 protected:
    RefCounted() = default;

 private:
    [[noreturn]] void _badRelease() const;

    mutable std::uint32_t mRefCount = 0;
    mutable bool mPooled = false;
};

/// Whether the two are the same object or equal ones. False if one alone is null.
bool IsEqual(const RefCounted* a, const RefCounted* b);

}  // namespace Foundation
