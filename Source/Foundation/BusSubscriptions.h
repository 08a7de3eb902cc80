#pragma once

#include "Foundation/Bus.h"

#include <string>

namespace Foundation {

/// What somebody wants to hear from the bus.
struct Bus::Subscription {
    BusMatch match;
    std::string rule;  ///< what the bus was asked for; empty if it need not be
    SignalHandler signalHandler;
    std::string path;  ///< of an object
    CallHandler callHandler;
    std::string watchedName;  ///< of a watch; empty for all names
    NameHandler nameHandler;
    bool isOver = false;  ///< for deliveries that had begun before
};

}  // namespace Foundation
