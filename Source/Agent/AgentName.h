#pragma once

namespace Orvane {

/// The agent's name on the user's bus. Whoever owns it is the agent, and the only one to write to
/// the database: it is taken before that is opened. Main thread.
struct AgentName {
    enum class Claim {
        kOurs,
        kTaken,  ///< another process is the agent
        kNoBus,  ///< or one that gives no name: nobody can call, and nobody can tell
    };

    static constexpr double kServeSeconds = 10.0;

    /// Waits for the bus.
    static Claim claim();
    /// Gives the name up and serves what came under it before, for `kServeSeconds` at most. Who
    /// calls later finds nobody, or a new agent. Does nothing without the name.
    static void giveUp();
};

}  // namespace Orvane
