#include "Progress.h"

#include "Terminal.h"

#include <algorithm>
#include <cstdio>

namespace Commands {

namespace {

constexpr std::size_t kWidest = 40;
constexpr const char* kClearLine = "\r\033[K";

}  // namespace

Progress::Progress() : mIsShown(Terminal::isError()) {}

Progress::~Progress() {
    if (mIsShown) std::fputs(kClearLine, stderr);
}

void Progress::show(std::size_t done, std::size_t all) const {
    if (!mIsShown) return;
    std::fputs((kClearLine + bar(done, all, kWidest)).c_str(), stderr);
    std::fflush(stderr);
}

std::string Progress::bar(std::size_t done, std::size_t all, std::size_t columns) {
    const std::size_t full = all == 0 ? columns : std::min(done, all) * columns / all;
    std::string filled(full, '=');
    if (full > 0 && full < columns) filled.back() = '>';
    return '[' + filled + std::string(columns - full, ' ') + "] " + std::to_string(done) + '/' +
           std::to_string(all);
}

}  // namespace Commands
