#include "Foundation/RunningApplications.h"

#include "Foundation/RunningProcesses.h"
#include "Foundation/SessionApplications.h"

#include <glib.h>

#include <algorithm>

namespace Foundation {

namespace {

RunningApplications* sCurrent = nullptr;

RunningApplications& ofSession() {
    static auto* const sOfSession =
        new SessionApplications(Bus::user(), [] { return RunningProcesses::getApplications(); });
    return *sOfSession;
}

}  // namespace

RunningApplications& RunningApplications::current() {
    return sCurrent ? *sCurrent : ofSession();
}

void RunningApplications::setCurrent(RunningApplications* applications) {
    sCurrent = applications;
}

std::string RunningApplications::lowerCased(std::string identifier) {
    std::transform(identifier.begin(), identifier.end(), identifier.begin(), g_ascii_tolower);
    return identifier;
}

}  // namespace Foundation
