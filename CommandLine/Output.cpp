#include "Output.h"

#include <cerrno>
#include <cstdio>
#include <system_error>

namespace Commands {

void Output::write(std::string_view text) {
    const bool isWritten = std::fwrite(text.data(), 1, text.size(), stdout) == text.size();
    if (isWritten && std::fflush(stdout) == 0) return;
    throw std::system_error(errno, std::generic_category(), "standard output");
}

}  // namespace Commands
