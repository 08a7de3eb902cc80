#pragma once

#include "Foundation/Returner.h"

#include <concepts>
#include <cstddef>
#include <utility>

namespace Foundation {

/// Owns one reference to a T, or none. T is a `RefCounted` or a `PFRefCounted`.
///
/// What an assignment replaces stays valid until the current pool drains, so that a caller may go
/// on with a plain pointer that it got before. The one exception is assignment from a `Returner`,
/// which releases the old object at once.
template <class T>
class [[nodiscard]] Ref {
 public:
    Ref() = default;
    Ref(std::nullptr_t) {}
    Ref(T* object) : mObject(Foundation::retain(object)) {}
    Ref(const Ref& other) : Ref(other.mObject) {}
    template <std::derived_from<T> U>
    Ref(const Ref<U>& other) : Ref(static_cast<T*>(other.get())) {}
    Ref(Ref&& other) noexcept : mObject(other.detach()) {}
    /// Takes the returner's reference over.
    template <std::derived_from<T> U>
    Ref(Returner<U>&& returner) : mObject(returner.detach()) {}
    ~Ref() { Counting<T>::release(mObject); }

    Ref& operator=(T* object) {
        mObject = transferRef(mObject, object);
        return *this;
    }
    Ref& operator=(std::nullptr_t) { return *this = static_cast<T*>(nullptr); }
    Ref& operator=(const Ref& other) { return *this = other.mObject; }
    template <std::derived_from<T> U>
    Ref& operator=(const Ref<U>& other) {
        return *this = static_cast<T*>(other.get());
    }
    /// As from a const one, but the other's reference is taken over instead of counted.
    Ref& operator=(Ref&& other) {
        if (mObject != other.mObject) {
            Counting<T>::autorelease(std::exchange(mObject, other.detach()));
        }
        return *this;
    }
    template <std::derived_from<T> U>
    Ref& operator=(Returner<U>&& returner) {
        T* old = std::exchange(mObject, returner.detach());
        Counting<T>::release(old);
        return *this;
    }

    T* get() const { return mObject; }
    operator T*() const& { return mObject; }
    /// A temporary reference would leave a pointer that nothing holds: keep the `Ref`, or
    /// `autorelease`.
    operator T*() && = delete;
    T* operator->() const { return mObject; }
    T& operator*() const { return *mObject; }

    /// The object with its reference, which the caller must give up; this `Ref` is then null.
    [[nodiscard]] T* detach() { return std::exchange(mObject, nullptr); }

 private:
    T* mObject = nullptr;
};

template <class T>
Returner<T>::Returner(const Ref<T>& object) : mObject(Foundation::retain(object.get())) {}

template <class T>
Returner<T>::Returner(Ref<T>&& object) : mObject(object.detach()) {}

}  // namespace Foundation
