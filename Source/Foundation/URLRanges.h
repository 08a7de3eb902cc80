#pragma once

#include "Foundation/URL.h"

#include <array>

namespace Foundation {

/// Where the parts of a URL stand in its text. An absent part is an empty range where it would
/// stand.
class URLRanges {
 public:
    struct Range {
        std::size_t mark;  ///< where the marks in front of the part begin
        std::size_t begin;
        std::size_t end;
    };

    explicit URLRanges(const URLParts& parts);

    const Range& operator[](URL::Component part) const {
        return mRanges[static_cast<std::size_t>(part)];
    }

 private:
    static constexpr std::size_t kCount = static_cast<std::size_t>(URL::Component::Fragment) + 1;

    std::array<Range, kCount> mRanges = {};
};

}  // namespace Foundation
