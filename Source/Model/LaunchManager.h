#pragma once

#include "Foundation/URL.h"

namespace Orvane {

/// The description that made an older version's agent be started: it would start that again.
struct LaunchManager {
    static constexpr const char* kTool = "/bin/svcctl";

    /// Has `tool` take the job out of service and deletes its description; waits for both. Does
    /// nothing if there is none. That the tool fails draws a warning and ends nothing.
    static void removeJob(Foundation::URL* description, const char* tool = kTool);
};

}  // namespace Orvane
