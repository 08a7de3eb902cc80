#pragma once

namespace Commands::AgentProbe {

/// The agent's name on the message bus.
inline constexpr const char* kName = "com.tarnwick.orvane.ipc";

enum class State {
    Runs,
    Stopped,  ///< it is started when something is asked of it
    NoBus,    ///< there is no message bus, on which it could be asked anything
};

/// Looks whether the agent runs, without starting it.
State look();

}  // namespace Commands::AgentProbe
