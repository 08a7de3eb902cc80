#pragma once

namespace Foundation {

/// How a number of bytes is shown to people. A unit is 1024 of the one below.
struct ByteSize {
    /// What the format of the size is called in the table "Localizable".
    const char* key;
    /// The number for that format, in its unit.
    double number;

    /// Of negative numbers the sign is left out.
    static ByteSize of(long long bytes);
};

}  // namespace Foundation
