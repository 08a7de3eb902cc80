#pragma once

#include "Foundation/Uncopyable.h"

#include <utility>

namespace Foundation {

/// Owns a file descriptor, or none (-1), and closes it. Leaves `errno` as it is.
class UniqueFD : Uncopyable {
 public:
    UniqueFD() = default;
    explicit UniqueFD(int fd) : mFD(fd) {}
    UniqueFD(UniqueFD&& other) noexcept : mFD(other.detach()) {}
    UniqueFD& operator=(UniqueFD&& other) noexcept {
        std::swap(mFD, other.mFD);
        return *this;
    }
    ~UniqueFD() { close(); }

    int get() const { return mFD; }
    explicit operator bool() const { return mFD >= 0; }

    /// The descriptor, which the caller must close; this is then empty.
    [[nodiscard]] int detach() { return std::exchange(mFD, -1); }
    /// Closes at once what is held.
    void close();

 private:
    int mFD = -1;
};

}  // namespace Foundation
