#pragma once

#include "Support/EnvVar.h"
#include "Support/TempDir.h"

#include <sys/types.h>

#include <optional>
#include <string>

namespace Support {

/// A message bus of the test's own, which is the user's bus while this lives. The process's
/// connection to the one before is closed when it starts and when it ends.
class PrivateBus {
 public:
    PrivateBus();
    ~PrivateBus();
    PrivateBus(const PrivateBus&) = delete;
    PrivateBus& operator=(const PrivateBus&) = delete;

    const std::string& getAddress() const { return mAddress; }
    /// Stops it from serving anybody, and lets it go on.
    void pause();
    void resume();
    /// Ends it at once, as a crash would.
    void die();
    /// Starts it again at the same address. `limits` are elements of its configuration (dbus-daemon
    /// manual, "limit"), without which it has those of a session.
    void start(const std::string& limits = {});

 private:
    TempDir mDirectory;
    std::string mAddress;
    std::optional<EnvVar> mVariable;
    pid_t mPID = -1;
};

}  // namespace Support
