#include "Foundation/SleepNotifier.h"

#include "Foundation/Guard.h"
#include "Foundation/LogindPowerService.h"
#include "Foundation/NotificationCenter.h"

#include <utility>

namespace Orvane {

using Foundation::gLog;
using Foundation::gWarn;
using Foundation::NotificationCenter;
using Foundation::PowerService;

void SleepNotifier::start() {
    // Never destroyed: it serves until the very end of the process.
    [[maybe_unused]] static const auto* const sInstance =
        new SleepNotifier(Foundation::LogindPowerService::open());
}

SleepNotifier::SleepNotifier(std::unique_ptr<PowerService> powerPort)
    : mPowerPort(std::move(powerPort)) {
    if (!mPowerPort) {
        gWarn.log("SleepNotifier couldn't start: PFRegisterForSystemPower failed.");
        return;
    }
    mRunLoopSource =
        mPowerPort->addRunLoopSource([this](std::uint32_t message, std::intptr_t argument) {
            _handleNotification(message, argument);
        });
    gLog.log("SleepNotifier now listening");
}

SleepNotifier::~SleepNotifier() = default;

void SleepNotifier::willSleep() {
    gLog.log("SleepNotifier: System going to sleep!");
    NotificationCenter::getLocal()->post(kWillSleepNotification, this, nullptr);
}

void SleepNotifier::didWake() {
    gLog.log("SleepNotifier: System woke up!");
    NotificationCenter::getLocal()->post(kDidWakeNotification, this, nullptr);
}

void SleepNotifier::_handleNotification(std::uint32_t message, std::intptr_t argument) {
    Foundation::callGuarded(
        "void Orvane::SleepNotifier::_handleNotification(std::uint32_t, std::intptr_t)", [&] {
            if (message == PowerService::kSystemWillSleep) willSleep();
            if (message == PowerService::kSystemHasPoweredOn) didWake();
        });
    // Otherwise the machine would wait for its time-out.
    if (mPowerPort) mPowerPort->acknowledge(argument);
}

}  // namespace Orvane
