#pragma once

#include "Foundation/Array.h"
#include "Foundation/Ref.h"

#include <algorithm>
#include <concepts>
#include <cstddef>
#include <initializer_list>
#include <iterator>
#include <optional>

namespace Foundation {

/// A list of T, which is a `PFRefCounted` or a `RefCounted`. Holds a reference to each element.
/// Null may be an element.
template <class T>
class ArrayOf : public Array {
 public:
    /// Walks the elements. Valid until a `MutableArrayOf` is changed.
    class Iterator {
     public:
        using iterator_category = std::forward_iterator_tag;
        using value_type = T*;
        using difference_type = std::ptrdiff_t;
        using pointer = T* const*;
        using reference = T*;

        Iterator() = default;
        explicit Iterator(const ObjectRef* item) : mItem(item) {}
        T* operator*() const { return mItem->get<T>(); }
        Iterator& operator++() {
            ++mItem;
            return *this;
        }
        Iterator operator++(int) { return Iterator(mItem++); }
        bool operator==(const Iterator&) const = default;

     private:
        const ObjectRef* mItem = nullptr;
    };

    static Returner<ArrayOf> array(std::initializer_list<T*> elements = {}) {
        return arrayFrom(elements);
    }
    /// The elements of any range of `T*` or `Ref<T>`.
    template <class Range>
    static Returner<ArrayOf> arrayFrom(const Range& elements) {
        Ref<ArrayOf> array{Returner<ArrayOf>(new ArrayOf)};
        array->append(elements);
        return Returner<ArrayOf>(std::move(array));
    }

    /// Throws `AssertionFailure` from `count()` on.
    T* at(std::size_t index) const { return item(index).template get<T>(); }
    /// Null if there is no element.
    T* first() const { return isEmpty() ? nullptr : at(0); }
    T* last() const { return isEmpty() ? nullptr : at(count() - 1); }

    Iterator begin() const { return Iterator(mItems.data()); }
    Iterator end() const { return Iterator(mItems.data() + count()); }

    /// The place of the first element equal to `element`.
    std::optional<std::size_t> indexOf(const T* element) const {
        const auto found =
            std::find_if(begin(), end(), [&](const T* item) { return IsEqual(item, element); });
        if (found == end()) return std::nullopt;
        return static_cast<std::size_t>(std::distance(begin(), found));
    }
    bool contains(const T* element) const { return indexOf(element).has_value(); }

 protected:
    ArrayOf() = default;

    template <class Range>
    void append(const Range& elements) {
        for (const auto& element : elements) {
            const T* pointer = element;
            mItems.emplace_back(pointer);
        }
    }
};

/// An array that can be changed. What it gives up is released at once.
template <class T>
class MutableArrayOf : public ArrayOf<T> {
 public:
    static Returner<MutableArrayOf> array(std::initializer_list<T*> elements = {}) {
        return arrayFrom(elements);
    }
    template <class Range>
    static Returner<MutableArrayOf> arrayFrom(const Range& elements) {
        Ref<MutableArrayOf> array{Returner<MutableArrayOf>(new MutableArrayOf)};
        array->append(elements);
        return Returner<MutableArrayOf>(std::move(array));
    }

    void add(T* element) { this->mItems.emplace_back(element); }
    /// The same for an element that is handed over; needs no pool.
    template <std::derived_from<T> U>
    void add(Returner<U> element) {
        const Ref<U> held = std::move(element);
        add(held);
    }
    /// Adds the elements of `other`, which may be null or this array.
    void addAll(const ArrayOf<T>* other) {
        const std::size_t added = other ? other->count() : 0;
        for (std::size_t i = 0; i < added; ++i) {
            add(other->at(i));
        }
    }
    /// Puts an element before the one at `index`, at the end for `count()`.
    void insert(std::size_t index, T* element) {
        if (index != this->count()) this->item(index);
        this->mItems.insert(this->mItems.begin() + static_cast<std::ptrdiff_t>(index), element);
    }
    void set(std::size_t index, T* element) {
        this->item(index);
        // The element may be in use by what it replaces, so the old one goes last.
        const ObjectRef old = std::exchange(this->mItems[index], ObjectRef(element));
    }
    void remove(std::size_t index) {
        const ObjectRef old = this->item(index);
        this->mItems.erase(this->mItems.begin() + static_cast<std::ptrdiff_t>(index));
    }
    void removeAll() {
        std::vector<ObjectRef> old;
        old.swap(this->mItems);
    }

    /// Orders the elements; equal ones keep their order. `isLess` takes two `T*`.
    template <class Less>
    void sort(Less isLess) {
        std::stable_sort(
            this->mItems.begin(), this->mItems.end(),
            [&](const ObjectRef& a, const ObjectRef& b) { return isLess(a.get<T>(), b.get<T>()); });
    }

 private:
    MutableArrayOf() = default;
};

}  // namespace Foundation
