#include "Foundation/DesktopLaunch.h"

namespace Foundation {

std::string DesktopLaunch::identifier(std::string_view file, std::string_view process, int pid) {
    constexpr std::string_view kSuffix = ".desktop";
    if (process != std::to_string(pid)) return "";
    file.remove_prefix(file.rfind('/') + 1);
    if (file.ends_with(kSuffix)) file.remove_suffix(kSuffix.size());
    return std::string(file);
}

}  // namespace Foundation
