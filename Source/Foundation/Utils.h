#pragma once

#include <cstddef>
#include <cstdint>

namespace Compatibility {

struct Utils {
    /// Copies an environment variable, cut to fit `size` bytes with its final zero. False, and no
    /// change, if it is not set.
    static bool copyenv(char* buffer, std::size_t size, const char* name);
    /// The number at the start of `text`, decimal or hexadecimal; 0 if there is none or `text` is
    /// null. A number that does not fit becomes the nearest one that does.
    static int str2int(const char* text, bool hex);
    static std::int64_t str2longlong(const char* text);
    /// Writes up to `count` frames of the call stack to standard error, after skipping `skip`, of
    /// which the caller's own is the first; only if the switch `OVPrintStack` is on.
    [[gnu::noinline]] static void printStack(int skip, int count);
};

}  // namespace Compatibility
