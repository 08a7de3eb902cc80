#pragma once

#include <string>

namespace Commands::InputFile {

/// All of a file; "-" is standard input. Throws `std::system_error`, whose text names the file and
/// says why, if it cannot be read.
std::string read(const std::string& name);

}  // namespace Commands::InputFile
