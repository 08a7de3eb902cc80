#include "Foundation/InstalledTree.h"

#include <dlfcn.h>

#include <filesystem>
#include <system_error>

namespace Foundation {

namespace {

namespace fs = std::filesystem;

/// In every library or program that holds this code; its address tells which.
const char sHere = 0;

/// The directory of the file that holds this code, free of links; empty if nobody knows it.
fs::path directoryOfLibrary() {
    Dl_info info{};
    if (dladdr(&sHere, &info) == 0 || !info.dli_fname) return {};
    std::error_code error;
    return fs::canonical(info.dli_fname, error).parent_path();
}

}  // namespace

std::string InstalledTree::findDirectory(const std::string& fromLibrary,
                                         const std::string& builtFor) {
    const fs::path library = directoryOfLibrary();
    if (library.empty()) return builtFor;
    const fs::path beside = (library / fromLibrary).lexically_normal();
    std::error_code error;
    return fs::is_directory(beside, error) ? beside.string() : builtFor;
}

}  // namespace Foundation
