#include "AgentProbe.h"

#include "MessageBus.h"

namespace Commands {

AgentProbe::State AgentProbe::look() {
    const MessageBus bus;
    if (!bus.isThere()) return State::NoBus;
    return bus.hasOwner(kName) ? State::Runs : State::Stopped;
}

}  // namespace Commands
