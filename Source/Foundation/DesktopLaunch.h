#pragma once

#include <string>
#include <string_view>

namespace Foundation {

/// What a desktop tells the processes that it starts from desktop files, in two variables of their
/// environment (GIO's "GDesktopAppInfo" and the desktops' shells set them).
struct DesktopLaunch {
    static constexpr const char* kFileVariable = "GIO_LAUNCHED_DESKTOP_FILE";
    static constexpr const char* kProcessVariable = "GIO_LAUNCHED_DESKTOP_FILE_PID";

    /// The identifier of the application whose desktop file started the process `pid`: the file's
    /// name without ".desktop". Empty if the values say otherwise: the variables are inherited, so
    /// a process number that is not `pid` tells of an ancestor.
    static std::string identifier(std::string_view file, std::string_view process, int pid);
};

}  // namespace Foundation
