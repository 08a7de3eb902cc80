#pragma once

#include "Foundation/Bus.h"
#include "Foundation/BusMessage.h"
#include "Foundation/Uncopyable.h"

#include <cstdint>
#include <functional>
#include <set>
#include <string>

namespace Orvane::RPC {

/// Where the agent is on the user's bus.
inline constexpr const char* kServiceName = "com.tarnwick.orvane.ipc";
inline constexpr const char* kObjectPath = "/com/tarnwick/orvane/ipc";
inline constexpr const char* kInterface = "com.tarnwick.orvane.ipc";
/// The annotation of a method with its number.
inline constexpr const char* kNumberAnnotation = "com.tarnwick.orvane.ipc.RoutineNumber";

/// The client's end of the transport: where the agent is, and calls to it.
///
/// A *port* is a number for one agent, above 0: for the one that runs, or for the one that the bus
/// will start for the first request. When that has gone, its port is invalid, which the next
/// request finds out without starting another one. Statuses are those of `MachError` or 0.
///
/// Requests go to the agent's name, not to its connection: an agent that gives up its name to quit
/// answers what has reached it, and what comes after that has certainly not been delivered.
///
/// The run-loop thread, which is the one of `Bus::user()`.
class AgentService : Foundation::Uncopyable {
 public:
    using BusMessage = Foundation::BusMessage;
    /// Told, in a turn of the loop, when an agent that there was a port for is gone.
    using DeathHandler = std::function<void(std::uint32_t port)>;

    /// Never destroyed.
    static AgentService& instance();

    /// Gives the present agent's port: the same as before, if it is the same agent. Does not wait
    /// for one to start. `kUnknownService` if there is none and the bus cannot start one, or there
    /// is no bus.
    std::int32_t lookUp(std::uint32_t& port);
    void setDeathHandler(DeathHandler handler) { mDeathHandler = std::move(handler); }
    /// Whether the end of the agent will be noticed. Not so if the bus refuses to tell.
    bool isWatching() const;

    /// A request without arguments, for `send`.
    BusMessage newRequest(std::uint32_t port, const char* routine);
    /// Sends the request and waits for the reply, at most `gOrvaneIPCTimeoutMS`.
    ///
    /// `kInvalidDestination` if the port's agent is gone or the port is not valid any more: the
    /// request has not been delivered. With any other status than 0 it may have been.
    std::int32_t send(std::uint32_t port, BusMessage& request, BusMessage& reply);

    /// Forgets the agent, for tests.
    void _forget();

 private:
    AgentService() = default;

    void watch();
    void ownerChanged(const std::string& oldOwner, const std::string& newOwner);
    void setOwner(const std::string& owner);
    std::int32_t statusOf(const BusMessage& reply, bool mayStart) const;

    Foundation::BusSubscriptionPtr mWatch;
    DeathHandler mDeathHandler;
    std::uint32_t mPort = 0;      ///< the last that was given out and is not invalid
    std::uint32_t mLastPort = 0;  ///< that was ever given out
    std::string mOwner;           ///< of the port; empty until it is started
    std::set<std::string> mLeft;  ///< earlier owners whose end the bus has yet to tell
};

}  // namespace Orvane::RPC

/// How long a call may take, in milliseconds: the sending of the request, and the wait for the
/// reply. For all calls of the process.
extern std::int32_t gOrvaneIPCTimeoutMS;
