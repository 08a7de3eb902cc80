#pragma once

#include "Foundation/Counting.h"

#include <concepts>
#include <cstddef>
#include <cstdint>
#include <string>
#include <utility>

namespace Foundation {

/// Owns one reference to an object of either kind, a `PFRefCounted` or a `RefCounted`, or none: an
/// element of the collections.
///
/// Unlike a `Ref` it gives up what it held at once and never to a pool, so that a collection can be
/// changed and destroyed where there is no pool.
class ObjectRef {
 public:
    ObjectRef() = default;
    ObjectRef(std::nullptr_t) {}
    ObjectRef(const PFRefCounted* value) : ObjectRef(value, 0) {}
    ObjectRef(const RefCounted* object) : ObjectRef(object, kObjectTag) {}
    ObjectRef(const ObjectRef& other) : mTagged(other.mTagged) { retain(); }
    ObjectRef(ObjectRef&& other) noexcept : mTagged(std::exchange(other.mTagged, 0)) {}
    ObjectRef& operator=(ObjectRef other) noexcept {
        std::swap(mTagged, other.mTagged);
        return *this;
    }
    ~ObjectRef() { release(); }

    bool isNull() const { return mTagged == 0; }

    /// The value; null if this holds an object of the other kind, or none.
    PFRefCounted* getValue() const {
        return isObject() ? nullptr : reinterpret_cast<PFRefCounted*>(mTagged);
    }
    /// The object; null if this holds one of the other kind, or none.
    RefCounted* getObject() const {
        return isObject() ? reinterpret_cast<RefCounted*>(mTagged - kObjectTag) : nullptr;
    }

    /// What this holds as a T. REQUIRES: it is one, or null.
    template <class T>
    T* get() const {
        if constexpr (std::derived_from<T, PFRefCounted>) {
            return static_cast<T*>(getValue());
        } else {
            return static_cast<T*>(getObject());
        }
    }
    /// The same, but null if it is no T.
    template <class T>
    T* getAs() const {
        if constexpr (std::derived_from<T, PFRefCounted>) {
            return dynamic_cast<T*>(getValue());
        } else {
            return dynamic_cast<T*>(getObject());
        }
    }

    /// Whether both hold equal objects of one kind, or none.
    bool isEqual(const ObjectRef& other) const;
    std::size_t getHash() const;
    /// The object's text, as `%@` prints it.
    std::string description() const;

 private:
    // Both kinds have a virtual table and so even addresses: the lowest bit tells them apart.
    static constexpr std::uintptr_t kObjectTag = 1;

    ObjectRef(const void* object, std::uintptr_t tag)
        : mTagged(object ? reinterpret_cast<std::uintptr_t>(object) + tag : 0) {
        retain();
    }

    bool isObject() const { return (mTagged & kObjectTag) != 0; }
    void retain() const {
        Foundation::retain(getValue());
        Foundation::retain(getObject());
    }
    void release() const {
        Foundation::release(getValue());
        Foundation::release(getObject());
    }

    std::uintptr_t mTagged = 0;
};

}  // namespace Foundation
