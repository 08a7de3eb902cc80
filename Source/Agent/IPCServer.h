#pragma once

#include "Foundation/Bus.h"
#include "Foundation/NotificationNames.h"
#include "Foundation/RunLoopSource.h"

#include <deque>
#include <string>

namespace Orvane {

/// The agent's end of the calls: takes requests from the bus, has the routines run one by one, in
/// the default mode of the main run loop, and answers. One per process, never destroyed.
///
/// Where another process takes the name over, which can be if the bus was away, the run of the main
/// loop ends: there are never two agents.
///
/// A request of the wrong form is answered with an error of the bus; all others with the status of
/// their routine, see `OVMIGRoutineWrapper`.
class IPCServer : Foundation::RunLoopSource {
 public:
    using BusMessage = Foundation::BusMessage;

    /// Posted in the local centre, with the empty string, for every request that names a routine.
    static constexpr const Foundation::NotificationName& kCallHandledNotification =
        Foundation::NotificationNames::kCallHandled;

    /// Serves under the agent's name, and takes that if the process does not own it yet. False,
    /// with a warning, if that cannot be. Without a bus it serves all the same once there is one.
    static bool startServer();
    /// The unique name, on the bus, of who called the routine that runs; empty outside of one.
    static std::string getCaller();

    /// Sends a reply. One that could not be put together is dropped, and the standard error told.
    static void _send(const BusMessage& request, BusMessage& reply);

 private:
    IPCServer() = default;

    static IPCServer& instance();
    static bool registerName(bool isLogged);
    void listen();
    static void noteOwner(const std::string& owner);

    Interest interest() noexcept override;
    void ready(short events) override;

    void serve(BusMessage& request);
    void callRoutine(BusMessage& request);

    Foundation::BusSubscriptionPtr mObject;
    Foundation::BusSubscriptionPtr mNameWatch;
    std::deque<BusMessage> mRequests;  ///< in the order in which they came
    std::string mCaller;
};

/// What every routine begins with: notes that somebody has called.
void OVReceivedRPC(int number, const char* name);

}  // namespace Orvane
