#include "Foundation/Bytes.h"

#include "Foundation/AssertionFailure.h"

#include <functional>

namespace Foundation {

namespace {

/// Whether `a` is not behind `b`, also for pointers into different blocks.
bool isOrdered(const void* a, const void* b) {
    return std::less_equal<const void*>()(a, b);
}

}  // namespace

Bytes::Bytes(const void* begin, const void* end)
    : mBegin(static_cast<const std::uint8_t*>(begin)), mEnd(static_cast<const std::uint8_t*>(end)) {
    OV_ASSERT_AS(isOrdered(begin, end), "begin<=end");
}

void Bytes::setBegin(const void* begin) {
    OV_ASSERT_AS(mBegin, "mBegin");
    OV_ASSERT_AS(isOrdered(mBegin, begin), "begin>=mBegin");
    OV_ASSERT_AS(isOrdered(begin, mEnd), "begin<=mEnd");
    mBegin = static_cast<const std::uint8_t*>(begin);
}

void Bytes::addBegin(std::ptrdiff_t n) {
    // Compared as counts: a pointer that far off could not even be formed.
    OV_ASSERT_AS(mBegin, "mBegin");
    OV_ASSERT_AS(n >= 0, "begin>=mBegin");
    OV_ASSERT_AS(n <= mEnd - mBegin, "begin<=mEnd");
    mBegin += n;
}

void Bytes::setEnd(const void* end) {
    OV_ASSERT_AS(isOrdered(mBegin, end), "end>=mBegin");
    OV_ASSERT_AS(isOrdered(end, mEnd), "end<=mEnd");
    mEnd = static_cast<const std::uint8_t*>(end);
}

}  // namespace Foundation
