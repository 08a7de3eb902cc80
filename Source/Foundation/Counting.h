#pragma once

#include "Foundation/AutoreleasePool.h"
#include "Foundation/PFRefCounted.h"
#include "Foundation/RefCounted.h"

namespace Foundation {

/// How references to a T are counted. Every operation accepts null.
template <class T>
struct Counting {
    static void retain(const T* object) {
        if (object) object->retain();
    }
    static void release(const T* object) {
        if (object) object->release();
    }
    static void autorelease(const T* object) {
        if constexpr (requires { object->autorelease(); }) {
            if (object) object->autorelease();
        } else {
            AutoreleasePool::autorelease(object);
        }
    }
};

/// The same as free functions. Each gives its argument back, null for null.
template <class T>
T* retain(T* object) {
    Counting<T>::retain(object);
    return object;
}
template <class T>
void release(T* object) {
    Counting<T>::release(object);
}
template <class T>
T* autorelease(T* object) {
    Counting<T>::autorelease(object);
    return object;
}
/// A new `RefCounted` becomes an owned one; see `RefCounted::adopted`.
template <class T>
T* adopted(T* object) {
    if (object) object->adopted();
    return object;
}

/// Gives `next`, retained, for a place that held `old`, which stays valid until the pool drains.
/// If the two are the same, nothing is counted.
template <class T>
T* transferRef(T* old, T* next) {
    if (old == next) return next;
    Counting<T>::retain(next);
    Counting<T>::autorelease(old);
    return next;
}

/// As `transferRef`, but `old` is released at once.
template <class T>
T* transferRefUnpooled(T* old, T* next) {
    if (old == next) return next;
    Counting<T>::retain(next);
    Counting<T>::release(old);
    return next;
}

}  // namespace Foundation
