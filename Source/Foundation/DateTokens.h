#pragma once

#include "Foundation/DateWords.h"

#include <cstddef>
#include <cstdint>
#include <string_view>

namespace Foundation {

/// The tokens of a date's text.
///
/// It keeps as many as the longest format can use; a text with more is read to its end, since its
/// comments may be broken and it may name a zone, but matches nothing.
class DateTokens {
 public:
    static constexpr std::size_t kCapacity = 32;

    /// Reads `text`. False if a comment does not end.
    ///
    /// The last zone name of the text goes to `zoneName`, cut to `zoneNameSize` bytes with their
    /// final zero, whatever the result; without one the buffer is left alone.
    bool read(std::string_view text, char* zoneName, std::size_t zoneNameSize) noexcept;

    /// How many tokens the text has, which may be more than are kept.
    std::size_t count() const { return mCount; }
    bool isComplete() const { return mCount <= kCapacity; }
    /// REQUIRES: `i` is below `count()` and `kCapacity`.
    const DateToken& at(std::size_t i) const { return mTokens[i]; }
    /// The class of a token, `None` behind the last one.
    DateTokenClass classAt(std::size_t i) const {
        return i < mCount ? mTokens[i].kind : DateTokenClass::None;
    }
    /// A set of classes has the bit `bit(class)` for each. This one is of those in the text.
    std::uint32_t classes() const { return mClasses; }
    static constexpr std::uint32_t bit(DateTokenClass kind) {
        // `None` stands for no token, so its bit is free for `Unknown`, which has none of its own.
        return kind == DateTokenClass::Unknown ? 1u : 1u << static_cast<int>(kind);
    }

 private:
    class Reader;

    void add(DateTokenClass kind, std::int32_t value = 0) noexcept;

    std::size_t mCount = 0;
    std::uint32_t mClasses = 0;
    DateToken mTokens[kCapacity];
};

}  // namespace Foundation
