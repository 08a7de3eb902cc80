#include "Terminal.h"

#include <sys/ioctl.h>
#include <unistd.h>

#include <cstdlib>
#include <string_view>

namespace Commands {

namespace {

constexpr std::size_t kDefaultWidth = 80;

}  // namespace

bool Terminal::isOutput() {
    return isatty(STDOUT_FILENO) == 1;
}

bool Terminal::isError() {
    return isatty(STDERR_FILENO) == 1;
}

bool Terminal::hasColours() {
    // https://no-color.org: any value counts but the empty one.
    const char* off = std::getenv("NO_COLOR");
    if (off && off[0]) return false;
    const char* kind = std::getenv("TERM");
    return isOutput() && kind && kind[0] && std::string_view(kind) != "dumb";
}

std::size_t Terminal::width() {
    if (const char* set = std::getenv("COLUMNS")) {
        const long columns = std::strtol(set, nullptr, 10);
        if (columns > 0) return static_cast<std::size_t>(columns);
    }
    winsize size{};
    if (ioctl(STDOUT_FILENO, TIOCGWINSZ, &size) == 0 && size.ws_col > 0) return size.ws_col;
    return kDefaultWidth;
}

}  // namespace Commands
