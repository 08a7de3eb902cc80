#include "Support/ProcessMemory.h"

#include <fstream>
#include <string>

namespace Support {

namespace {

/// A line of the process's status that is in KB.
[[maybe_unused]] std::size_t lineOf(const std::string& name) {
    std::ifstream status("/proc/self/status");
    for (std::string word; status >> word;) {
        std::size_t kilobytes = 0;
        if (word == name && status >> kilobytes) return kilobytes * 1024;
    }
    return 0;
}

}  // namespace

#ifdef __SANITIZE_ADDRESS__
std::size_t ProcessMemory::now() {
    return 0;
}

std::size_t ProcessMemory::peak() {
    return 0;
}
#else
std::size_t ProcessMemory::now() {
    return lineOf("VmRSS:");
}

std::size_t ProcessMemory::peak() {
    return lineOf("VmHWM:");
}
#endif

void ProcessMemory::forgetPeak() {
    std::ofstream("/proc/self/clear_refs") << "5";
}

}  // namespace Support
