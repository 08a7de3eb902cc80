#include "Places.h"

#include <cstdlib>
#include <string>
#include <system_error>

namespace Commands {

namespace fs = std::filesystem;

namespace {

// XDG Base Directory Specification: what is not absolute is ignored.
fs::path dataHome() {
    const char* set = std::getenv("XDG_DATA_HOME");
    if (set && set[0] == '/') return set;
    const char* home = std::getenv("HOME");
    return fs::path(home ? home : "/") / ".local/share";
}

}  // namespace

fs::path Places::storage() {
    return dataHome() / "Orvane";
}

fs::path Places::database() {
    return storage() / "Database/Database.sqlite3";
}

fs::path Places::own() {
    return storage() / "CommandLine";
}

std::uintmax_t Places::size(const fs::path& path) {
    std::error_code error;
    if (!fs::is_directory(path, error)) {
        const std::uintmax_t bytes = fs::file_size(path, error);
        return error ? 0 : bytes;
    }
    std::uintmax_t sum = 0;
    // Files come and go while this counts.
    for (fs::recursive_directory_iterator at(path, error), end; !error && at != end;
         at.increment(error)) {
        std::error_code gone;
        const std::uintmax_t bytes = at->is_regular_file(gone) ? at->file_size(gone) : 0;
        if (!gone) sum += bytes;
    }
    return sum;
}

}  // namespace Commands
