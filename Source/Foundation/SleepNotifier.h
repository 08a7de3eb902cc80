#pragma once

#include "Foundation/NotificationNames.h"
#include "Foundation/PowerService.h"
#include "Foundation/Uncopyable.h"

#include <cstdint>
#include <memory>

namespace Orvane {

/// Tells the process by local notifications that the machine is about to sleep and that it woke
/// up. Lives on the run loop of the thread that made it.
class SleepNotifier : Foundation::Uncopyable {
 public:
    static constexpr const Foundation::NotificationName& kWillSleepNotification =
        Foundation::NotificationNames::kWillSleep;
    static constexpr const Foundation::NotificationName& kDidWakeNotification =
        Foundation::NotificationNames::kDidWake;

    /// Makes the object of the process, once; it stays until exit. If nobody tells of the
    /// machine's sleep, that is warned of and nothing is ever told.
    static void start();

    /// An object of the caller's own, over another service. Null stands for a service that cannot
    /// be reached, and leaves the object idle.
    explicit SleepNotifier(std::unique_ptr<Foundation::PowerService> powerPort);

    virtual ~SleepNotifier();
    /// The machine is going to sleep once this returns.
    virtual void willSleep();
    virtual void didWake();

    /// Serves an event of the power service, of whatever message, and acknowledges it afterwards,
    /// also if the service of it fails.
    void _handleNotification(std::uint32_t message, std::intptr_t argument);

 private:
    std::unique_ptr<Foundation::PowerService> mPowerPort;  ///< null when not connected
    std::unique_ptr<Foundation::PowerService::Source> mRunLoopSource;
};

}  // namespace Orvane
