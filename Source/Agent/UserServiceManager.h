#pragma once

#include "Agent/ServiceManager.h"

#include <string>

namespace Orvane {

/// The service manager of the user's session: systemd's user manager, or a message bus that starts
/// its services itself. The former knows the agent as a unit and can start it by a timer; the
/// latter starts it for a call alone.
class UserServiceManager : public ServiceManager {
 public:
    static constexpr double kTimeoutSeconds = 5.0;  ///< for each answer of the manager
    static constexpr int kTimerTries = 20;
    static constexpr double kTimerRetrySeconds = 0.05;

    bool isManaged() override;
    Reply checkIn() override;
    /// EOPNOTSUPP unless the process is a unit. The time that the machine sleeps counts; it is not
    /// woken up.
    int setStartInterval(std::int64_t seconds) override;

 private:
    static bool isUnit();
    static bool hasInheritedSockets();
    static bool wasStartedByBus();
    static std::string getUnitStem();
};

}  // namespace Orvane
