#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>

namespace Foundation {

/// A view of memory that it does not own. Valid as long as that memory is.
class Bytes {
 public:
    /// No bytes, at no place.
    Bytes() = default;
    /// The bytes from `begin` up to but not including `end`. Throws `AssertionFailure` if they are
    /// in the wrong order.
    Bytes(const void* begin, const void* end);
    explicit Bytes(std::string_view text) : Bytes(text.data(), text.data() + text.size()) {}

    const std::uint8_t* getBegin() const { return mBegin; }
    const std::uint8_t* getEnd() const { return mEnd; }
    std::size_t getLength() const { return static_cast<std::size_t>(mEnd - mBegin); }
    bool isEmpty() const { return mBegin == mEnd; }
    std::string_view view() const { return {reinterpret_cast<const char*>(mBegin), getLength()}; }

    /// Moves the beginning up. Throws `AssertionFailure` for a place outside the view, and for a
    /// view of no place.
    void setBegin(const void* begin);
    /// Moves the beginning up by `n` bytes, as `setBegin` does.
    void addBegin(std::ptrdiff_t n);
    /// Moves the end down. Throws `AssertionFailure` for a place outside the view.
    void setEnd(const void* end);

 private:
    const std::uint8_t* mBegin = nullptr;
    const std::uint8_t* mEnd = nullptr;
};

}  // namespace Foundation
