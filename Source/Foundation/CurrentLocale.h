#pragma once

#include <string>

namespace Foundation {

/// The locale in which dates and times are written, as ICU names it: that of the process's
/// `setlocale` or, where the program has not set one, that of the environment (LC_ALL, LC_TIME,
/// LANG). The C locale is "en_US_POSIX".
std::string currentTimeLocale();
/// The same for numbers, by LC_NUMERIC.
std::string currentNumberLocale();

/// The sign between a number's whole and its fraction in the locale of numbers.
std::string currentDecimalSign();

}  // namespace Foundation
