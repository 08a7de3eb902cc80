#pragma once

#include <cstdint>
#include <string>

namespace Foundation {

/// The applications that run in the user's session, as `ProcessInfo` asks for them. Main thread.
class RunningApplications {
 public:
    virtual ~RunningApplications() = default;

    /// Changes whenever the list may have changed; never negative. Costs no more than reading a
    /// number.
    virtual std::int32_t getSeed() = 0;
    /// Whether at least one application with the identifier, which is in lower case, runs. False
    /// if that cannot be told.
    virtual bool isRunning(const std::string& lowerCasedIdentifier) = 0;

    /// The list of the process: what `setCurrent` was given or else that of the session.
    static RunningApplications& current();
    /// Replaces it; null stands for that of the session. What is set must outlive its use.
    static void setCurrent(RunningApplications* applications);

    /// An identifier as lists compare it: its ASCII letters, of which names on the bus consist, in
    /// lower case.
    static std::string lowerCased(std::string identifier);
};

}  // namespace Foundation
