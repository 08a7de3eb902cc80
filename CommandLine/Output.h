#pragma once

#include <string_view>

namespace Commands::Output {

/// Writes to standard output, at once. Throws `std::system_error` if that fails, as it does on a
/// full disk.
void write(std::string_view text);

}  // namespace Commands::Output
