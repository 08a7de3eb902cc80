#pragma once

#include <cstdint>
#include <stdexcept>

namespace Foundation {

/// An HTTP exchange that ended with a redirection that was not followed, or with an error.
class HTTPException : public std::runtime_error {
 public:
    /// Throws `AssertionFailure` for a status below 300.
    explicit HTTPException(std::uint16_t status);

    std::uint16_t getStatus() const { return mStatus; }

 private:
    std::uint16_t mStatus;
};

}  // namespace Foundation
