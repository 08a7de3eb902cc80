#pragma once

#include "Listing.h"

#include <string>

namespace Commands::RowFormat {

/// A line for each row by a format: "{key}" stands for the value of a column, "\n", "\t" and "\\"
/// for a line end, a tab and a backslash, "{{" for a brace. Values are as in a pipe. Throws
/// `Failure` with `ExitStatus::Usage` for a key that no column has.
std::string expand(const std::string& format, const Listing& listing);

}  // namespace Commands::RowFormat
