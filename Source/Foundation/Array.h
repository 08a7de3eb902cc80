#pragma once

#include "Foundation/ObjectRef.h"
#include "Foundation/PFRefCounted.h"

#include <cstddef>
#include <vector>

namespace Foundation {

/// A list of objects of any kind, null among them: what all `ArrayOf<T>` have in common. Immutable
/// for who holds it as this.
class Array : public PFRefCounted {
 public:
    std::size_t count() const { return mItems.size(); }
    bool isEmpty() const { return mItems.empty(); }

    /// The element at `index` if it is a T, otherwise null. Throws `AssertionFailure` from
    /// `count()` on.
    template <class T>
    T* getAs(std::size_t index) const {
        return item(index).getAs<T>();
    }

    std::size_t getHash() const override;
    /// Whether `other` is an array of equal elements in the same order, of whatever type it is.
    bool isEqual(const PFRefCounted* other) const override;
    /// "(a, b, c)"
    StringReturner toString() const override;

 protected:
    const ObjectRef& item(std::size_t index) const;

    std::vector<ObjectRef> mItems;
};

}  // namespace Foundation
