#pragma once

#include "Foundation/Counting.h"

#include <concepts>
#include <utility>

namespace Foundation {

template <class T>
class Ref;

/// What a function gives back that makes or retains an object: one reference, which goes into a
/// `Ref` without a count, becomes a plain pointer that is valid until the current pool drains, or
/// is given up when the returner is dropped.
template <class T>
class [[nodiscard]] Returner {
 public:
    Returner() = default;
    Returner(std::nullptr_t) {}
    /// Takes over the caller's reference, as a new value has it. May be null.
    explicit Returner(T* owned) : mObject(owned) {}
    /// Takes a further reference. Like the next one defined in `Ref.h`, which has what it takes.
    Returner(const Ref<T>& object);
    /// Takes over what the reference holds.
    Returner(Ref<T>&& object);
    Returner(Returner&& other) noexcept : mObject(other.detach()) {}
    template <std::derived_from<T> U>
    Returner(Returner<U>&& other) : mObject(other.detach()) {}
    Returner& operator=(Returner&&) = delete;
    ~Returner() { Counting<T>::release(mObject); }

    /// Hands out a further reference to an object that others own. May be null.
    static Returner retained(T* object) { return Returner(Foundation::retain(object)); }
    /// Hands out a new `RefCounted`, not owned yet.
    static Returner adopted(T* object) { return Returner(Foundation::adopted(object)); }

    /// The object, left to the current pool; this returner is then empty.
    operator T*() { return Foundation::autorelease(detach()); }
    T* operator->() { return *this; }

    /// The object with its reference, which the caller must give up; this returner is then empty.
    [[nodiscard]] T* detach() { return std::exchange(mObject, nullptr); }

 private:
    T* mObject = nullptr;
};

class Data;
class String;
class URL;
using StringReturner = Returner<String>;
using DataReturner = Returner<Data>;
using URLReturner = Returner<URL>;

}  // namespace Foundation
