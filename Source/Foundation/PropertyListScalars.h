#pragma once

#include "Foundation/Date.h"

#include <cstdint>
#include <string>
#include <string_view>

namespace Foundation {

/// The texts of single values in property lists. The readers allow white space around them and
/// throw `PropertyListError` for what they cannot read.
struct PropertyListScalars {
    /// Without blanks, tabs and line ends at both ends.
    static std::string_view trim(std::string_view text);

    /// A decimal number, or a hexadecimal one with "0x", of 64 bits with a sign.
    static std::int64_t readInteger(std::string_view text);
    /// A decimal number, with or without an exponent, "nan", "inf" or "infinity".
    static double readReal(std::string_view text);
    /// "2005-10-21T00:12:34Z"
    static DateReturner readDate(std::string_view text);

    /// The shortest text that reads back as the same number.
    static std::string writeReal(double value);
    static std::string writeDate(const Date& date);
};

}  // namespace Foundation
