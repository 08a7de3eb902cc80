#pragma once

#include <cstdint>
#include <filesystem>

namespace Commands::Places {

/// The folder with all that Orvane keeps for the user: below $XDG_DATA_HOME or ~/.local/share.
std::filesystem::path storage();
/// The database in it.
std::filesystem::path database();
/// The folder of what is the command line's own.
std::filesystem::path own();

/// The bytes of a file, or of all files below a folder; 0 for what is not there.
std::uintmax_t size(const std::filesystem::path& path);

}  // namespace Commands::Places
