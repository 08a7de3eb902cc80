#pragma once

#include "EndToEnd/World.h"
#include "Support/BackgroundProcess.h"

#include <sys/types.h>

#include <memory>
#include <optional>
#include <string>
#include <vector>

/// What an agent has said.
struct AgentEvent {
    enum class Kind { Started, EndedRefresh, Rested, Gone };

    Kind kind;
    double time;
    std::string url = {};  ///< of the feed whose refresh has ended
};

/// Lets time pass, and is the service manager of the agents of a life: starts the one that wants to
/// be started again when its time has come. Another one may have been started by the bus. What goes
/// wrong, as an agent that says nothing for a minute of the machine's time, is an exception.
class AgentKeeper {
 public:
    /// Agents by hand write their log to this file.
    AgentKeeper(World& world, std::string log);
    ~AgentKeeper();
    AgentKeeper(const AgentKeeper&) = delete;
    AgentKeeper& operator=(const AgentKeeper&) = delete;

    /// Lets time pass up to a date. Appends what happened.
    void advanceTo(double date, std::vector<AgentEvent>& events);
    /// The machine sleeps up to a date, and wakes: no time passes for anybody in between.
    void sleepTo(double date, std::vector<AgentEvent>& events);
    /// Tells the agent that there is a network again. REQUIRES: there is an agent.
    void announceNetwork() { World::send(mAgent.get(), "network"); }
    /// Kills the agent, if there is one.
    void killAgent(std::vector<AgentEvent>& events);
    /// Whether there is one now.
    bool hasAgent();
    /// How often one was started.
    int getStarts() const { return mStarts; }

 private:
    static constexpr double kPatience = 60;  ///< seconds of the machine's time

    void meet();
    void await();
    void lead(double date, std::vector<AgentEvent>& events);
    bool take(const std::string& message, std::vector<AgentEvent>& events);
    void startAgent();
    void buryAgent(std::vector<AgentEvent>& events);

    World& mWorld;
    const std::string mLog;
    const Foundation::UniqueFD mListener;
    Foundation::UniqueFD mAgent;  ///< none without an agent
    pid_t mPID = 0;
    std::optional<Support::BackgroundProcess> mByHand;
    std::optional<double> mNextStart;
    int mStarts = 0;
};
