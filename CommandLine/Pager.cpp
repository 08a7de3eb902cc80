#include "Pager.h"

#include "Output.h"
#include "Terminal.h"

#include <csignal>
#include <cstdio>
#include <cstdlib>

namespace Commands {

namespace {

constexpr int kNotFound = 127;  ///< what a shell says of a program that is not there

/// Whether the pager has shown the text.
bool showWith(const std::string& pager, const std::string& text) {
    // Less leaves what fits the screen there and ends.
    setenv("LESS", "FRX", 0);
    std::FILE* pipe = popen(pager.c_str(), "w");
    if (!pipe) return false;
    // Who leaves the pager early has seen enough.
    const auto before = std::signal(SIGPIPE, SIG_IGN);
    std::fwrite(text.data(), 1, text.size(), pipe);
    const int status = pclose(pipe);
    std::signal(SIGPIPE, before);
    return !WIFEXITED(status) || WEXITSTATUS(status) != kNotFound;
}

}  // namespace

void Pager::show(const std::string& text) {
    const char* set = std::getenv("PAGER");
    const std::string pager = set ? set : "less 2>/dev/null";
    if (Terminal::isOutput() && !pager.empty() && showWith(pager, text)) return;
    Output::write(text);
}

}  // namespace Commands
