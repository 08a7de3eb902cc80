#pragma once

#include "Foundation/Bus.h"
#include "Foundation/PowerService.h"
#include "Foundation/UniqueFD.h"

namespace Foundation {

/// The power events of logind (org.freedesktop.login1(5)), from the system's bus.
///
/// logind announces a sleep and waits while somebody holds an inhibitor of the kind "delay", though
/// not longer than the few seconds that it is set to. So one is held all the time that the machine
/// is awake; the acknowledgement of a sleep gives it up. Where logind refuses it the events come
/// all the same, and the sleep does not wait.
class LogindPowerService : public PowerService, Uncopyable {
 public:
    /// Null if there is no system bus. logind itself may come later.
    static std::unique_ptr<PowerService> open();

    std::unique_ptr<Source> addRunLoopSource(Handler handler) override;
    void acknowledge(std::intptr_t argument) override;

 private:
    class LogindSource;

    explicit LogindPowerService(Bus& bus) : mBus(bus) {}

    void takeInhibitor();

    Bus& mBus;
    UniqueFD mInhibitor;  ///< none while asleep, or where it was refused
};

}  // namespace Foundation
