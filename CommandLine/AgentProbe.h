#pragma once

namespace Commands::AgentProbe {

enum class State {
    Runs,
    Stopped,  ///< it is started when something is asked of it
    NoBus,    ///< there is no message bus, on which it could be asked anything
};

/// Looks whether the agent runs, without starting it.
State look();

}  // namespace Commands::AgentProbe
