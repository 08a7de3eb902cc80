#pragma once

#include <cstddef>
#include <cstdint>

namespace Foundation {

class String;
template <class T>
class Returner;
using StringReturner = Returner<String>;

/// Base of the value classes: strings, URLs, data, dates, collections.
///
/// A value is made with one reference, which its maker hands on in a `Returner`. A null pointer is
/// a value too: whatever takes a value takes null. Counts are plain integers, as in `RefCounted`.
class PFRefCounted {
 public:
    PFRefCounted(const PFRefCounted&) = delete;
    PFRefCounted& operator=(const PFRefCounted&) = delete;
    virtual ~PFRefCounted();

    /// Equal values have equal hashes. The default is the address.
    virtual std::size_t getHash() const;
    /// Whether the two are equal values. `other` may be null. The default is identity.
    virtual bool isEqual(const PFRefCounted* other) const;
    /// A text for logs and `%@`. The default names class and address.
    virtual StringReturner toString() const;

    void retain() const { ++mCount; }
    /// Gives up one reference, and destroys the value with the last one.
    void release() const {
        if (--mCount == 0) delete this;
    }
    std::uint32_t getRetainCount() const { return mCount; }

 protected:
    PFRefCounted() = default;

 private:
    mutable std::uint32_t mCount = 1;
};

/// Whether the two are the same value or equal ones. False if one alone is null.
bool IsEqual(const PFRefCounted* a, const PFRefCounted* b);

}  // namespace Foundation
