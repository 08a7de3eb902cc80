#pragma once

#include "Agent/ServerSocket.h"
#include "Foundation/Uncopyable.h"

namespace Orvane {

class LaunchListener;

/// Stands in for the renderer while there is none: whoever connects to its socket is told so by the
/// connection's end. A connection that nobody took would wait on, and the service manager would
/// start the agent for it whenever that has quit. On the run loop's thread.
class AbsentRenderer : public ServerSocket, Foundation::Uncopyable {
 public:
    static constexpr const char* kSocketName = "Render";
    /// So many connections can wait at a socket.
    static constexpr int kMostWaiting = 4096;

    /// Takes what comes to the sockets that the service manager has listened on, if there are any.
    /// This must outlive the listener's use. Does nothing where there are none.
    void startServer(LaunchListener& listener);
    /// The same for what waits now, without a turn of the loop: for a process that is about to end.
    static void turnAwayWaiting(const LaunchListener& listener);

    void accept(int connection) override;
};

}  // namespace Orvane
