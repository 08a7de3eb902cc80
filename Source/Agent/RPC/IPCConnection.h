#pragma once

#include "Foundation/NotificationNames.h"
#include "Foundation/Uncopyable.h"

#include <cstdint>

namespace Orvane {

/// A client's connection with the agent: finds it, starts it by calling it, tells the process when
/// it dies, and makes exceptions of statuses. Knows no row: `IPCClient` does.
///
/// The main thread of the application. It has to turn its run loop to hear of a death; without
/// that, the next call finds out.
class IPCConnection : Foundation::Uncopyable {
 public:
    /// Posted in the local centre, without an object, when an agent is gone: it may have crashed,
    /// or have had nothing to do for a while.
    static constexpr const Foundation::NotificationName& kAgentDiedNotification =
        Foundation::NotificationNames::kAgentDied;

    /// Sees to it that the end of the agent is posted. Whether there is one, or can be.
    bool listenForAgentDeath();
    /// Whether a request that got this status is to be sent again, to the agent that is there now.
    /// Throws for a status that is neither that nor 0, as `check` does.
    bool retry(std::int32_t status);
    /// Throws `NetException` for a status that is not 0: the agent's error or, for a failure of the
    /// transport, {1002, 202} if there is no agent, {1002, 203} if the call got lost.
    void check(std::int32_t status);
    /// Finds the agent. Throws as `check` does.
    void lookupServerPort();

    /// The agent's port; 0 while it is not known.
    std::uint32_t getServerPort() const { return mServerPort; }

 protected:
    /// Looks the agent up. A failure is reported.
    IPCConnection();
    ~IPCConnection() = default;

    /// Calls a routine of the agent, which one that has gone meanwhile does not get. The results,
    /// the last of the arguments, are filled in. Throws as `check` does.
    template <class Routine, class... Parameters>
    void call(const Routine& routine, Parameters&&... parameters) {
        while (retry(routine(mServerPort, parameters...))) {
        }
    }

 private:
    void _serverPortDied(std::uint32_t port);

    std::uint32_t mServerPort = 0;
    bool mBusy = false;  ///< cleared by every call that succeeds, for whoever looks at a dump
    bool mHasDeathSource = false;
};

}  // namespace Orvane
